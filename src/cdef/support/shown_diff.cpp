/* shown_diff.cpp: what a subcommand would change in a source, as a diff. */

#include "cdef/support/shown_diff.h"

#include "cdef/support/output.h"
#include "text/shown.h"
#include "text/unified_diff.h"

#include <unistd.h>

namespace cdef {

namespace {

void print_masked(std::string_view piece) {
    std::string shown;
    while (!piece.empty()) {
        std::string_view line = piece.substr(0, piece.find('\n'));
        piece.remove_prefix(line.size());
        shown += text::masked(line);
        if (!piece.empty()) {
            shown += '\n';
            piece.remove_prefix(1);
        }
    }
    print(shown);
}

/* A name as patch(1) reads it: in quotes, if there are line breaks or tabs in it. */
std::string patch_name(const std::string &name) {
    return name.find_first_of("\n\r\t") == name.npos ? name : text::quoted(name);
}

} // namespace

void show_diff(const std::string &source, std::string_view before, std::string_view after) {
    std::string name = source == "-" ? "stdin" : source;
    bool absolute = name.starts_with('/');
    std::string old_name = patch_name((absolute ? "" : "a/") + name);
    std::string new_name = patch_name((absolute ? "" : "b/") + name);
    text::unified_diff(old_name, new_name, before, after, isatty(STDOUT_FILENO) == 0 ? print : print_masked);
}

} // namespace cdef
