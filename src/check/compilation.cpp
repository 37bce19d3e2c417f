/* compilation.cpp: the compiler as a check drives it. */

#include "check/compilation.h"

#include "language/names.h"

namespace check {

std::string text_of(const fatal_exit &failure) {
    std::string text;
    for (const char *part : words_of(failure))
        text += part;
    return text;
}

language::name_list compilation::missing(int kind) const {
    return language::missing_names(table_of(kind), required_seen(kind));
}

bool compilation::has_index(int kind) const {
    constexpr vx_uint32_t ELEMENT_INDEX_BIT = 0x8; /* in an SD kind's req_mask */
    return (required_seen(kind) & ELEMENT_INDEX_BIT) != 0;
}

} // namespace check
