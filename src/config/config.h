/* config.h: the project file cdef.toml, which says how sources are checked and built. docs/config.md is about it. Bytes
 * in, settings and positioned errors out. */
#ifndef CDGEN_CONFIG_CONFIG_H
#define CDGEN_CONFIG_CONFIG_H

#include "check/check.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace config {

/* What a project file says; what it leaves out is empty. */
struct settings {
    /* The project file, as messages name it; empty if there is none. */
    std::string path = {};

    /* Names or codes of warnings, or "all". Each is known. */
    std::vector<std::string> warnings_on = {};
    std::vector<std::string> warnings_off = {};
    bool warnings_count = false; /* as errors do */

    /* Where databases go. Like the following paths, it is a name that can be opened: it begins with the directory of
     * the project file as `path` has it. */
    std::string directory = {};
    std::string byte_order = {}; /* "native", "little", "big" or "both" */

    std::string level = {};    /* "readers", "clients" or "stored" */
    std::string baseline = {}; /* a file, a directory, or "git:REVISION[:PATH]" */
    std::string ids = {};      /* the file of numbers ever used */

    /* All warnings except those that are off. A warning that is both in `on` and in `off` is on. */
    check::warning_set warnings() const;
};

/* An error in a project file, or of the system when it was read. */
struct problem {
    int line = 0;   /* from 1; 0: the file as a whole */
    int column = 0; /* in characters, from 1 */
    std::string text;
};

struct reading {
    settings values;
    std::vector<problem> problems; /* by place; if there are any, the settings are not to be used */
};

struct key_name {
    std::string_view table;
    std::string_view key;
};

/* All keys that a project file may have. */
std::vector<key_name> known_keys();

constexpr std::string_view FILE_NAME = "cdef.toml";

/* A longer file is an error. */
constexpr std::size_t MOST_BYTES = 16384;

/* Reads a project file that is in memory. path: of the file, for settings that are paths. Never throws, except for lack
 * of memory. */
reading parse(std::string_view bytes, const std::string &path);

/* The same with a file. */
reading load(const std::string &path);

/* The project file for a source: the next one of that name in the source's directory or above it, seen from the working
 * directory. It is no directory, but may be of any other kind. Symbolic links to directories are followed first. The
 * source need not exist. "-" is looked for from the working directory. Empty if there is none. */
std::string find(const std::string &source);

/* Reads a file that find() has found. One that is not a regular file is an error. */
reading load_found(const std::string &path);

/* "PATH:LINE:COLUMN: text" */
std::string as_text(const std::string &path, const problem &what);

} // namespace config

#endif
