/* output.cpp: standard output. */

#include "cdef/support/output.h"

#include "cdef/support/failure.h"

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <unistd.h>

namespace cdef {

void print(std::string_view text) {
    if (std::fwrite(text.data(), 1, text.size(), stdout) != text.size() || std::fflush(stdout) != 0)
        throw failure(std::string("standard output: ") + std::strerror(errno));
}

bool wants_colour(std::string_view when, int descriptor) {
    if (when != "auto")
        return when == "always";
    const char *no_colour = std::getenv("NO_COLOR");
    const char *terminal = std::getenv("TERM");
    bool unwanted = no_colour != nullptr && *no_colour != '\0';
    bool is_dumb = terminal != nullptr && std::string_view(terminal) == "dumb";
    return !unwanted && !is_dumb && isatty(descriptor) != 0;
}

} // namespace cdef
