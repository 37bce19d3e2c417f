/* unified_diff.h: what changed in a text, as patch(1) reads it. */
#ifndef CDGEN_TEXT_UNIFIED_DIFF_H
#define CDGEN_TEXT_UNIFIED_DIFF_H

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace text {

/* Whole lines of a text, and those that another text has instead. Either may be empty. */
struct line_change {
    std::size_t begin; /* bytes of the first text */
    std::size_t end;
    std::string_view by; /* in the second text */
};

/* In order; there is at least one unchanged line between two of them. The same limits as below. */
std::vector<line_change> changed_lines(std::string_view before, std::string_view after);

/* Returns an empty text if nothing changed. Takes time proportional to the number of lines. After large changes it may
 * show more lines than necessary. */
std::string unified_diff(std::string_view old_name, std::string_view new_name, std::string_view before,
                         std::string_view after);

} // namespace text

#endif
