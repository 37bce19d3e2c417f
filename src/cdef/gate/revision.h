/* revision.h: the files at a revision of a git repository. */
#ifndef CDGEN_CDEF_GATE_REVISION_H
#define CDGEN_CDEF_GATE_REVISION_H

#include <optional>
#include <string>
#include <vector>

namespace cdef::gate_command {

/* The files at a revision of the repository that contains a directory. All functions throw failure
 * for a file that exists but that git cannot read. */
class revision {
public:
    /* about: what the revision is needed for, which a failure names. HEAD has no files before the first commit. Throws
     * failure if there is no such repository or revision. */
    revision(std::string name, std::string directory, const std::string &about);

    /* False for HEAD before the first commit. */
    bool has_commit() const {
        return !tree.empty();
    }
    /* The top of the repository, as a path through the directory. */
    std::string top() const;

    struct entry {
        bool is_directory;
        std::string id; /* of the object that git keeps */
    };

    /* A path begins at the top of the repository, or with ./ or ../ at the directory. A symbolic link is followed.
     * Nothing if there is none. */
    std::optional<entry> find(const std::string &path) const;
    std::string contents_of(const entry &file, const std::string &path) const;
    std::vector<std::string> names_in(const entry &directory, const std::string &path) const;
    /* The files in the directory and below it, with their paths from there. */
    std::vector<std::string> names_below() const;

private:
    [[noreturn]] void fail(const std::string &path, const std::string &why) const;
    /* "MODE TYPE ID" of a path from the top; empty if there is none. */
    std::string listed(const std::string &place, const std::string &path) const;
    /* The path without the last symbolic link in it; nothing if there is no link. */
    std::optional<std::string> with_link_followed(const std::string &place, const std::string &path) const;
    std::string required(const std::optional<std::string> &output, const std::string &path) const;

    std::string name;
    std::string directory;
    std::string prefix; /* the directory's path from the top, with a slash; empty: it is the top */
    std::string tree;   /* the id of the top; empty: there is no commit */
};

} // namespace cdef::gate_command

#endif
