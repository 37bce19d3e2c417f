/* unified_diff.h: what changed in a text, as patch(1) reads it. */
#ifndef CDGEN_TEXT_UNIFIED_DIFF_H
#define CDGEN_TEXT_UNIFIED_DIFF_H

#include <cstddef>
#include <functional>
#include <string_view>
#include <vector>

namespace text {

/* Whole lines of a text, and those that another text has instead. Either may be empty. */
struct line_change {
    std::size_t begin; /* bytes of the first text */
    std::size_t end;
    std::string_view by; /* in the second text */
};

/* In order; there is at least one unchanged line between two of them. Takes time proportional to the number of lines.
 * After large changes there may be more lines than necessary. */
std::vector<line_change> changed_lines(std::string_view before, std::string_view after);

/* Receives a text in pieces, which may end anywhere between two of the parts that it is made of: a mark, a line. */
using piece_sink = std::function<void(std::string_view)>;

/* Passes on nothing if nothing changed. Shows the changes above. They may be many and large, so only a part of the diff
 * is in memory. */
void unified_diff(std::string_view old_name, std::string_view new_name, std::string_view before, std::string_view after,
                  const piece_sink &to);

} // namespace text

#endif
