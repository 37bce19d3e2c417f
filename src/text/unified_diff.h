/* unified_diff.h: what changed in a text, as patch(1) reads it. */
#ifndef CDGEN_TEXT_UNIFIED_DIFF_H
#define CDGEN_TEXT_UNIFIED_DIFF_H

#include <string>
#include <string_view>

namespace text {

/* Returns an empty text if nothing changed. Takes time proportional to the number of lines. After large changes it may
 * show more lines than necessary. */
std::string unified_diff(std::string_view old_name, std::string_view new_name, std::string_view before,
                         std::string_view after);

} // namespace text

#endif
