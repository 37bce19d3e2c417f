/* shown_diff.cpp: what a subcommand would change in a source, as a diff. */

#include "cdef/support/shown_diff.h"

#include "text/shown.h"
#include "text/unified_diff.h"

#include <cstddef>
#include <unistd.h>

namespace cdef {

namespace {

std::string for_output(std::string diff) {
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

/* A name as patch(1) reads it: in quotes, if there are line breaks or tabs in it. */
std::string patch_name(const std::string &name) {
    return name.find_first_of("\n\r\t") == name.npos ? name : text::quoted(name);
}

} // namespace

std::string shown_diff(const std::string &source, std::string_view before, std::string_view after) {
    std::string name = source == "-" ? "stdin" : source;
    bool absolute = name.starts_with('/');
    std::string old_name = patch_name((absolute ? "" : "a/") + name);
    std::string new_name = patch_name((absolute ? "" : "b/") + name);
    return for_output(text::unified_diff(old_name, new_name, before, after));
}

} // namespace cdef
