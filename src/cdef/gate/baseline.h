/* baseline.h: where the older versions of classes come from: a file, a directory, or a revision in git. */
#ifndef CDGEN_CDEF_GATE_BASELINE_H
#define CDGEN_CDEF_GATE_BASELINE_H

#include <cstddef>
#include <optional>
#include <set>
#include <string>
#include <vector>

namespace cdef::gate_command {

/* A file that is an older version: a source or a database. */
struct older_version {
    std::string name; /* for messages */
    std::vector<std::byte> bytes;
};

/* A file that the older version of a directory has. */
struct older_file {
    std::string name;      /* for messages */
    std::string path;      /* for findings: where the file is or, if it is in a revision, where it would be now */
    std::string key;       /* see keys_of */
    std::string directory; /* that the older version is of */
};

class baseline {
public:
    /* wanted: "git:REVISION", "git:REVISION:PATH", or the name of a file or a directory. Throws failure if there is
     * none. */
    explicit baseline(std::string wanted);

    /* True if there is one older version for this class and all others that are compared with this. Throws failure. */
    bool is_one_file(const std::string &path) const;
    /* True if all older versions are in one directory, unless it is a file at a revision. */
    bool is_one_directory() const {
        return kind == kinds::DIRECTORY || kind == kinds::REVISION_PATH;
    }
    /* True if the older version of a class is found by the name of its file. */
    bool goes_by_file_names() const {
        return kind != kinds::FILE;
    }
    /* The older version of a source or a database; nothing if there is none. Throws failure. */
    std::optional<older_version> version_of(const std::string &path) const;

    /* The sources and databases in the older version of a directory, except hidden ones. sources: those that are in the
     * directory now, which say where relative paths lead. Throws failure. */
    std::vector<older_file> files_for(const std::string &directory, const std::vector<std::string> &sources) const;
    /* The older version of a class is a file with one of these keys. */
    std::set<std::string> keys_of(const std::string &path) const;
    /* The sources and databases that the older version of a class may be if it had another name: those anywhere in the
     * repository, or in the directory of older versions, that the class's repository or directory no longer has. Throws
     * failure. */
    std::vector<older_file> files_gone_from(const std::string &path) const;
    /* Throws failure. */
    older_version read(const older_file &file) const;

private:
    enum class kinds { FILE, DIRECTORY, REVISION, REVISION_PATH };

    std::optional<older_version> in_directory(const std::string &path) const;
    std::optional<older_version> in_revision(const std::string &path) const;
    std::string path_at_revision(const older_file &file) const;
    std::set<std::string> keys_beside(const std::string &path) const;
    std::vector<std::string> names_for(const std::string &directory) const;
    older_file older_file_of(const std::string &name, const std::string &directory) const;
    /* A path at the revision, as messages name it. */
    std::string name_in_revision(const std::string &path) const;
    /* The path at the revision, ready for a name in it. */
    std::string within_place() const {
        return place.empty() || place.ends_with('/') ? place : place + "/";
    }
    /* True if the path at the revision begins at the directory of each class. */
    bool is_relative() const {
        return kind == kinds::REVISION_PATH &&
               (place == "." || place == ".." || place.starts_with("./") || place.starts_with("../"));
    }

    kinds kind;
    std::string place;         /* the file, the directory, or the path at the revision */
    std::string revision_name; /* empty: none */
};

} // namespace cdef::gate_command

#endif
