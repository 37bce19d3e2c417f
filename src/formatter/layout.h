/* layout.h: what each line of a source becomes. */
#ifndef CDGEN_FORMATTER_LAYOUT_H
#define CDGEN_FORMATTER_LAYOUT_H

#include "formatter/lines.h"

#include <cstddef>
#include <span>
#include <string>
#include <vector>

namespace formatter {

/* A line of the source in its new form. */
struct row {
    std::size_t line = 0;  /* its index */
    std::string text = {}; /* without newline */
    bool removed = false;
    bool after_empty = false; /* an empty line is put in front of it */
    bool belongs_up = false;  /* a comment that is aligned with the comment of the line above, and continues it */
};

/* One row for each line, in their order. */
std::vector<row> layout_of(std::span<const line> lines);

} // namespace formatter

#endif
