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

bool wants_colour() {
    const char *no_colour = std::getenv("NO_COLOR");
    return (no_colour == nullptr || *no_colour == '\0') && isatty(STDOUT_FILENO) != 0;
}

} // namespace cdef
