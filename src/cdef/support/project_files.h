/* project_files.h: the project file (cdef.toml) that each source belongs to, and the options that choose another one.
 */
#ifndef CDGEN_CDEF_PROJECT_FILES_H
#define CDGEN_CDEF_PROJECT_FILES_H

#include "cdef/support/command.h"
#include "config/config.h"

#include <map>
#include <optional>
#include <string>

namespace cdef {

struct project_options {
    bool none = false;               /* no project file is read */
    std::optional<std::string> file; /* this one is read for all sources */
};

/* Adds --config and --no-config. The options must outlive the command. */
void add_project_options(command &to, project_options &options);

/* Reads each project file once. */
class project_files {
public:
    explicit project_files(const project_options &wanted) : options(wanted) {}

    /* The settings for a source. They are valid as long as this object. If the project file has errors, reports all but
     * the last one on standard error, and throws failure with that. */
    const config::settings &of(const std::string &source);

private:
    const std::string &path_for(const std::string &source);
    const config::settings &load(const std::string &path);

    project_options options;
    std::map<std::string, std::string> paths;                    /* by the directory of sources; empty: no file */
    std::map<std::string, config::settings> loaded = {{"", {}}}; /* by path */
};

} // namespace cdef

#endif
