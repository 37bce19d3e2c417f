/* examples.h: for each code of a check, a source for which it is reported. */
#ifndef CDGEN_CHECK_EXAMPLES_H
#define CDGEN_CHECK_EXAMPLES_H

#include <string>
#include <string_view>

namespace check {

/* Lines that make a whole source of an example. */
struct frame {
    const char *before;
    const char *shown_before; /* the text shown in place of these lines */
    const char *after;
};

/* The lines that matter, and the same lines without the mistake. */
struct example {
    const char *code;
    const frame *within;
    const char *lines;
    const char *cured; /* null: it takes more than these lines */
};

/* Null for a code that no source causes, or only one of many megabytes. */
const example *example_of(std::string_view code);

/* The whole source with the mistake, or with other lines in their place. */
std::string source_with(const frame &within, std::string_view lines);

/* What is shown of it. */
std::string shown_with(const frame &within, std::string_view lines);

} // namespace check

#endif
