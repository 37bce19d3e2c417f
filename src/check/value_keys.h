/* value_keys.h: the values of a source as keys that compare as the values do, and sets of ranges of them. */
#ifndef CDGEN_CHECK_VALUE_KEYS_H
#define CDGEN_CHECK_VALUE_KEYS_H

#include "vx.h"

#include <compare>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <tuple>
#include <vector>

namespace check {

/* A value as it is stored. Numbers compare by their value, texts and bytes as strings of bytes do. Only keys of one
 * type can be compared. */
struct value_key {
    bool operator==(const value_key &) const = default;
    std::strong_ordering operator<=>(const value_key &other) const {
        return std::tie(number, text) <=> std::tie(other.number, other.text);
    }

    std::int64_t number = 0; /* ascends with the value */
    std::string text;        /* empty for numbers */
};

/* The key of a text that the compiler has accepted as a value of a type, or of an element of an array type. No value
 * for NaN, which is neither above nor below other values, for a Binary of which bytes are lost, and for types without
 * texts. */
std::optional<value_key> key_of(vx_data_type_t type, std::string_view text);

/* The key of a type's default value: 0 or empty. */
std::optional<value_key> default_key(vx_data_type_t type);

/* Ranges that do not overlap; those that would are united. Each takes the line that it was given in. There may be very
 * many, so they are kept in chunks, without a node for each. */
class key_ranges {
public:
    struct range {
        value_key low, high;
        int line = 0;
    };

    /* Returns a range given earlier that has a value in common with this one; its line is 0 if none has. Of united
     * ranges the first one's line is kept. A range from a higher to a lower value has no values. */
    range add(range given);
    bool has(const value_key &key) const;
    bool empty() const {
        return !single && chunks.empty();
    }
    void clear();

private:
    /* A number, or for texts the position in `texts`, from 1, of a key's text; 0 is the empty text. */
    using packed = std::int64_t;
    struct entry {
        packed low, high;
        int line;
    };
    using chunk = std::vector<entry>; /* never empty */
    struct key_view {
        std::strong_ordering operator<=>(const key_view &other) const {
            return std::tie(number, text) <=> std::tie(other.number, other.text);
        }

        std::int64_t number;
        std::string_view text;
    };
    struct position {
        size_t chunk, index;
    };

    range add_to_chunks(const range &given);
    packed pack(const value_key &key);
    key_view view_of(packed key) const;
    static key_view view_of(const value_key &key) {
        return {key.number, key.text};
    }
    value_key unpack(packed key) const;
    position first_above(const key_view &key) const;
    void insert(position at, const entry &added);
    void erase(position at);

    static constexpr size_t CHUNK_MAX = 512;

    std::optional<range> single; /* the only range: most stanzas have one, which needs no memory of its own */
    std::vector<chunk> chunks;   /* all ranges, ascending */
    std::string texts;           /* each after the two bytes of its length */
};

} // namespace check

#endif
