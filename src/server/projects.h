/* projects.h: the settings of the project that each document belongs to. */
#ifndef CDGEN_SERVER_PROJECTS_H
#define CDGEN_SERVER_PROJECTS_H

#include "config/config.h"

#include <functional>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace lsp {

/* Reads each project file once, until it is forgotten. */
class projects {
public:
    /* The warnings that a document's project file turns on. All are on if there is no project file, if it has errors,
     * or if the document is not a file. */
    const check::warning_set &wanted_in(const std::string &uri);

    /* Discards everything, so that it is read again when it is needed. */
    void forget() {
        by_directory.clear();
        by_file.clear();
    }

    /* The problems of the project files that have been read since the last call, by file. A file without problems has
     * an empty list. */
    std::map<std::string, std::vector<config::problem>> take_problems();

    /* Read instead of all project files; empty: none is read. */
    std::optional<std::string> only;

private:
    const check::warning_set &of_file(const std::string &path);

    std::map<std::string, std::string> by_directory; /* the project file for sources in a directory; empty: none */
    std::map<std::string, check::warning_set> by_file;
    std::map<std::string, std::vector<config::problem>> problems;
};

} // namespace lsp

#endif
