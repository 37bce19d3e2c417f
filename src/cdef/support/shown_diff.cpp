/* shown_diff.cpp: what a subcommand would change in a source, as a diff. */

#include "cdef/support/shown_diff.h"

#include "text/shown.h"
#include "text/unified_diff.h"

#include <cstddef>
#include <unistd.h>

namespace cdef {

namespace {

std::string for_output(const std::string &diff) {
    if (isatty(STDOUT_FILENO) == 0)
        return diff;
    std::string shown;
    for (std::size_t begin = 0; begin < diff.size();) {
        std::size_t end = diff.find('\n', begin);
        shown += text::masked(std::string_view(diff).substr(begin, end - begin)) + "\n";
        begin = end + 1;
    }
    return shown;
}

} // namespace

std::string shown_diff(const std::string &source, std::string_view before, std::string_view after) {
    std::string name = source == "-" ? "stdin" : source;
    bool absolute = name.starts_with('/');
    return for_output(text::unified_diff((absolute ? "" : "a/") + name, (absolute ? "" : "b/") + name, before, after));
}

} // namespace cdef
