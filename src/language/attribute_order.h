/* attribute_order.h: guesses which attribute a line gives. Stanzas of a kind mostly give theirs in the same order, so a
 * line is first compared with the attribute that came next last time. */
#ifndef CDGEN_LANGUAGE_ATTRIBUTE_ORDER_H
#define CDGEN_LANGUAGE_ATTRIBUTE_ORDER_H

#include "language/catalogue.h"

#include <array>
#include <cstring>

namespace language {

/* Whether both begin with the same word, and end with one, after n bytes. The two words may overlap. */
template <class Word> bool same_ends(const char *a, const char *b, std::size_t n) {
    auto differ = [a, b](std::size_t at) {
        Word left = 0;
        Word right = 0;
        std::memcpy(&left, a + at, sizeof left);
        std::memcpy(&right, b + at, sizeof right);
        return left ^ right;
    };
    return (differ(0) | differ(n - sizeof(Word))) == 0;
}

/* What memcmp says of n bytes; names are too short for a call. */
inline bool same_bytes(const char *a, const char *b, std::size_t n) {
    for (constexpr std::size_t STEP = sizeof(std::uint64_t); n > 2 * STEP; a += STEP, b += STEP, n -= STEP)
        if (!same_ends<std::uint64_t>(a, b, STEP))
            return false;
    if (n >= sizeof(std::uint64_t))
        return same_ends<std::uint64_t>(a, b, n);
    if (n >= sizeof(std::uint32_t))
        return same_ends<std::uint32_t>(a, b, n);
    if (n >= sizeof(std::uint16_t))
        return same_ends<std::uint16_t>(a, b, n);
    return n == 0 || *a == *b;
}

/* The order in which the stanzas of one kind have given their attributes. */
class attribute_order {
public:
    /* A stanza begins. */
    void restart() {
        latest = BEGINNING;
    }

    /* The attribute that came next last time, if the line begins with its name and an equals sign: then it is the
     * stanza's latest one. Null if not. */
    const table_attrs *expected(const srtable_ctrl &kind, std::string_view line) {
        std::uint8_t position = next[latest];
        const table_attrs &attr = kind.sc_attrs[position];
        std::size_t length = attr.ta_length;
        if (line.size() <= length || line[length] != '=' || !same_bytes(line.data(), attr.ta_name, length))
            return nullptr;
        latest = position;
        return &attr;
    }

    /* The attribute that the line had if it was not the expected one. */
    void took(const srtable_ctrl &kind, const table_attrs &attr) {
        next[latest] = static_cast<std::uint8_t>(&attr - kind.sc_attrs.data());
        latest = next[latest];
    }

private:
    static constexpr std::uint8_t BEGINNING = name_index::MOST_NAMES;

    std::array<std::uint8_t, BEGINNING + 1> next = {}; /* by attribute, and at the beginning: positions in sc_attrs */
    std::uint8_t latest = BEGINNING;
};

} // namespace language

#endif
