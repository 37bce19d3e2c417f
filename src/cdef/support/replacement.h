/* replacement.h: puts new contents in the place of a file. They are written to a temporary file beside it, which is
 * then renamed over it: programs that open the file see either the old or the new contents, and programs that have
 * mapped it keep the old ones. If anything fails, the file does not change. */
#ifndef CDGEN_CDEF_REPLACEMENT_H
#define CDGEN_CDEF_REPLACEMENT_H

#include <optional>
#include <string>
#include <string_view>

namespace cdef {

/* The file that a path leads to through symbolic links; it need not exist. Throws failure if there are too many links.
 */
std::string target_of(const std::string &path);

/* The temporary file for a target: .NAME.cdef-new in its directory; a name that would become too long is cut, and has a
 * hash at its end. */
std::string temporary_of(const std::string &target);

/* Removes the temporary file that a killed program has left for a target, but not one that is in use. */
void remove_remains(const std::string &target);

/* Waits until a file and its name are on the disk. A directory is a file, too. Throws failure, which names the path. */
void sync_file(const std::string &path);

struct replacement_options {
    bool sync = false; /* contents and name are on the disk before the function returns */
    /* What a program has read from the file and changed. If the file has other contents by now, or may not be written
     * to, it is not replaced. */
    std::optional<std::string_view> before = {};
    bool must_be_new = false; /* if there is a file by now, it is not replaced */
};

/* Replaces the file that a path leads to, or makes it. It keeps its mode and, if this user may give files away, its
 * owner. If two programs replace the file at once, the second waits for the first. Throws failure, which names the
 * path. */
void replace_file(const std::string &path, std::string_view contents, const replacement_options &options = {});

} // namespace cdef

#endif
