/* baseline.h: where the older versions of classes come from: a file, a directory, or a revision in git. */
#ifndef CDGEN_CDEF_GATE_BASELINE_H
#define CDGEN_CDEF_GATE_BASELINE_H

#include <cstddef>
#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace cdef::gate_command {

/* A file that is an older version: a source or a database. */
struct older_version {
    std::string name; /* for messages */
    std::vector<std::byte> bytes;
};

class baseline {
public:
    /* wanted: "git:REVISION", "git:REVISION:PATH", or the name of a file or a directory. Throws failure if there is
     * none. */
    explicit baseline(std::string wanted);

    /* Whether there is one older version for all. */
    bool is_one_file() const {
        return kind == kinds::FILE;
    }
    /* The older version of a source or a database; nothing if there is none. Throws failure. */
    std::optional<older_version> version_of(const std::string &path) const;

private:
    enum class kinds { FILE, DIRECTORY, REVISION, REVISION_PATH };

    std::optional<older_version> in_directory(const std::string &path) const;
    std::optional<older_version> in_revision(const std::string &path) const;

    kinds kind;
    std::string place;    /* the file, the directory, or the path at the revision */
    std::string revision; /* empty: none */
};

/* The names, without directory, that an older version of a file may have, the likeliest one first. */
std::vector<std::string> names_for(const std::string &path);

} // namespace cdef::gate_command

#endif
