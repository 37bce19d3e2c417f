/* kept_lines.h: places of a source, each with the text of its line. There may be very many. */
#ifndef CDGEN_CHECK_KEPT_LINES_H
#define CDGEN_CHECK_KEPT_LINES_H

#include "check/check.h"
#include "check/packed_texts.h"
#include "language/limits.h"

#include <cstddef>
#include <limits>
#include <string_view>
#include <vector>

namespace check {

class kept_lines {
public:
    /* A part of one line. The places in the file are not kept. */
    void add(const place &at, std::string_view source);
    void clear();

    size_t size() const {
        return entries.size();
    }
    place at(size_t position) const {
        const entry &each = entries[position];
        return {each.line, each.column, each.length};
    }
    std::string_view line_of(size_t position) const {
        return texts[position];
    }
    /* The part. */
    std::string_view text_of(size_t position) const {
        return line_of(position).substr(entries[position].column - size_t{1}, entries[position].length);
    }

private:
    using small = unsigned char; /* a line is short */
    static_assert(LINE_MAX_CHARS <= std::numeric_limits<small>::max());

    struct entry {
        int line;
        small column;
        small length;
    };

    packed_texts texts; /* of the lines */
    std::vector<entry> entries;
};

} // namespace check

#endif
