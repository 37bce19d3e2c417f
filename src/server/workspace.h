/* workspace.h: the sources in the client's folders: all are checked, and compared as classes that are built together.
 */
#ifndef CDGEN_SERVER_WORKSPACE_H
#define CDGEN_SERVER_WORKSPACE_H

#include "build/across.h"
#include "check/check.h"

#include <cstddef>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <vector>

namespace lsp {

struct session;

/* A source in a folder. */
struct workspace_file {
    std::vector<check::finding> own;         /* of the file; not used while the document is open */
    std::vector<check::finding> across;      /* conflicts with other classes */
    std::optional<build::class_facts> facts; /* none: it has errors, or has not been checked yet */
    std::string target;                      /* the path without symbolic links; empty: not checked yet */
};

class workspace {
public:
    /* By path. */
    const std::map<std::string, workspace_file> &files() const {
        return known;
    }
    bool holds(const std::string &path) const {
        return known.contains(path);
    }
    /* A source's conflicts with other classes; none if it is outside the folders. */
    std::vector<check::finding> across(const std::string &path) const {
        auto found = known.find(path);
        return found == known.end() ? std::vector<check::finding>() : found->second.across;
    }

    /* The sources of a new folder are checked step by step. */
    void add_folder(session &now, const std::string &path);
    void remove_folder(session &now, const std::string &path);
    /* Call this when a source in a folder has changed, in the editor or on the disk, or was created or removed. */
    void look_at(const std::string &path) {
        waiting.insert(path);
    }
    void look_at_all();
    /* Hidden files, and those in hidden directories of a folder, are not. */
    bool is_in_folder(const std::string &path) const;

    bool has_work() const {
        return !waiting.empty() || uncompared;
    }
    /* Checks one source or, when all are checked, compares them. */
    void step(session &now);

    /* Ends the first check early, as the user wishes. */
    void stop_scan(session &now);

    /* The client has answered a request. Progress is only reported after it has agreed to show it. */
    void take_answer(session &now, const std::string &id, bool agreed);

private:
    void check(session &now, const std::string &path);
    void compare(session &now);
    void ask_for_progress(session &now);
    void report_progress(session &now);

    std::set<std::string> folders; /* each with a slash at its end */
    std::map<std::string, workspace_file> known;
    std::set<std::string> waiting; /* sources that have to be checked */
    bool uncompared = false;       /* facts have changed since the classes were compared */
    std::string progress_request;  /* asks whether the client shows progress; empty: answered, or not asked */
    bool in_progress = false;      /* true: the client shows the progress of the first check */
    std::size_t scan_size = 0;     /* number of sources in the first check */
};

} // namespace lsp

#endif
