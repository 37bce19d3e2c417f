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
    /* The warnings that are wanted in a document: those of its project file; all if there is none, if it has errors, or
     * if the document is not a file. */
    const check::warning_set &wanted_in(const std::string &uri);

    /* Everything is read anew when it is asked for. */
    void forget() {
        by_directory.clear();
        by_file.clear();
    }

    /* What is wrong with the project files that have been read since this was last asked: by file. A file without
     * errors has an empty list. */
    std::map<std::string, std::vector<config::problem>> take_problems();

    /* Read in place of all project files; empty: none at all is read. */
    std::optional<std::string> only;

private:
    const check::warning_set &of_file(const std::string &path);

    std::map<std::string, std::string> by_directory; /* the project file for sources in a directory; empty: none */
    std::map<std::string, check::warning_set> by_file;
    std::map<std::string, std::vector<config::problem>> problems;
};

} // namespace lsp

#endif
