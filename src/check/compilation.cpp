/* compilation.cpp: the compiler as a check drives it. */

#include "check/compilation.h"

#include "language/catalogue_rows.h"
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
    return (required_seen(kind) & language::bit_of("ElementIndex")) != 0;
}

} // namespace check
