/* first_lines.h: texts, each with the line that gave it first. There may be very many. */
#ifndef CDGEN_CHECK_FIRST_LINES_H
#define CDGEN_CHECK_FIRST_LINES_H

#include <cstddef>
#include <functional>
#include <limits>
#include <string>
#include <string_view>
#include <vector>

namespace check {

class first_lines {
public:
    /* The line for a text, which the caller may set; 0 if the text is new. */
    int &line_of(std::string_view text) {
        return line_of(text, tag_of(text));
    }
    bool has(std::string_view text) const {
        return find(text) != 0;
    }
    /* The line of a text; 0 if it is not known. */
    int find(std::string_view text) const {
        return find(text, tag_of(text));
    }
    /* All texts, in the order in which they came; valid until the next one is added. */
    std::vector<std::string_view> all() const;
    void clear();

private:
    static constexpr size_t FEWEST_SLOTS = 64;

    struct entry {
        size_t begin; /* in texts; it ends where the next one begins */
        int line;
    };
    struct slot {
        unsigned tag;      /* a hash: gives the place of the slot, and shows without a comparison that most other texts
                            * differ */
        unsigned position; /* in entries, from 1; 0 is free */
    };

    /* The highest 32 bits of the hash; on a 32-bit machine, all of it. */
    static unsigned tag_of(std::string_view text) {
        constexpr int LOWER = std::numeric_limits<size_t>::digits - std::numeric_limits<unsigned>::digits;
        return static_cast<unsigned>(std::hash<std::string_view>()(text) >> LOWER);
    }
    int &line_of(std::string_view text, unsigned tag);
    int find(std::string_view text, unsigned tag) const;
    size_t slot_of(std::string_view text, unsigned tag) const;
    void grow();
    std::string_view text_of(size_t position) const {
        size_t end = position < entries.size() ? entries[position].begin : texts.size();
        return std::string_view(texts).substr(0, end).substr(entries[position - 1].begin);
    }

    std::string texts;
    std::vector<entry> entries;
    std::vector<slot> slots;
};

} // namespace check

#endif
