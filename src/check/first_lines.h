/* first_lines.h: texts, each with the line that gave it first. There may be very many. */
#ifndef CDGEN_CHECK_FIRST_LINES_H
#define CDGEN_CHECK_FIRST_LINES_H

#include "check/packed_texts.h"
#include "text/keyed_hash.h"

#include <cstddef>
#include <cstdint>
#include <limits>
#include <string_view>
#include <vector>

namespace check {

class first_lines {
public:
    explicit first_lines(const text::hash_key &with) : key(with) {}

    /* The line for a text, which is a part of a line of the source. The caller may set it; 0 if the text is new. */
    int &line_of(std::string_view text);
    bool has(std::string_view text) const {
        return find(text) != 0;
    }
    /* The line of a text; 0 if it is not known. */
    int find(std::string_view text) const;
    size_t size() const {
        return lines.size();
    }
    /* All texts, in the order in which they came; valid until the next one is added. */
    std::vector<std::string_view> all() const;
    void clear();

    /* How many slots a search for the text looks at. There must be some text. */
    size_t probes_for(std::string_view text) const;

private:
    static constexpr size_t FEWEST_SLOTS = 64;
    static constexpr size_t MANY_SLOTS = 1 << 16;

    /* What a slot shows of its text, so that most other texts need not be compared; 0 is a free slot. */
    using mark = unsigned char;

    unsigned hash_of(std::string_view text) const {
        return static_cast<unsigned>(text::hash_of(text, key));
    }
    /* The lowest bits of the hash: the highest ones give the slot. */
    static mark mark_of(unsigned hash) {
        return static_cast<mark>(1 + hash % std::numeric_limits<mark>::max());
    }
    /* The slot where the search for a text begins. */
    size_t home_of(unsigned hash) const {
        return static_cast<size_t>((std::uint64_t{hash} * marks.size()) >> std::numeric_limits<unsigned>::digits);
    }
    size_t after(size_t at) const {
        return at + 1 < marks.size() ? at + 1 : 0;
    }
    size_t slot_of(std::string_view text, unsigned hash) const;
    void grow();

    text::hash_key key;
    packed_texts texts;
    std::vector<int> lines; /* of each text */

    /* Slots, of which at most three quarters are taken. */
    std::vector<mark> marks;
    std::vector<unsigned> positions; /* in texts */
};

} // namespace check

#endif
