/* separate.cpp: that a build does not write to its own sources, nor twice to one file. */

#include "cdef/build/separate.h"

#include "cdef/support/failure.h"
#include "cdef/support/replacement.h"

#include <filesystem>
#include <map>
#include <set>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

namespace cdef::build_command {

namespace {

namespace fs = std::filesystem;

constexpr const char *STANDARD_STREAM = "-";

/* A file's name in its directory, whichever way leads to that. The file need not exist. */
std::string place_of(const std::string &path) {
    fs::path name = fs::path(path);
    fs::path parent = name.has_parent_path() ? name.parent_path() : fs::path(".");
    std::error_code error;
    fs::path directory = fs::weakly_canonical(parent, error);
    return ((error ? parent : directory) / name.filename()).string();
}

using inode = std::pair<dev_t, ino_t>;

std::optional<inode> inode_of(const std::string &path) {
    struct stat st = {};
    int found = stat(path.c_str(), &st);
    return found == 0 ? std::optional(inode(st.st_dev, st.st_ino)) : std::nullopt;
}

std::optional<inode> inode_of_source(const std::string &path) {
    struct stat st = {};
    if (path != STANDARD_STREAM)
        return inode_of(path);
    return fstat(STDIN_FILENO, &st) == 0 ? std::optional(inode(st.st_dev, st.st_ino)) : std::nullopt;
}

/* The files that a build reads. One of them may have several names, because of links. */
class inputs {
public:
    explicit inputs(const std::vector<build::unit> &units) {
        for (const build::unit &each : units) {
            if (auto found = inode_of_source(each.source))
                sources.emplace(*found, each.source);
            if (auto found = each.project_file.empty() ? std::nullopt : inode_of(each.project_file))
                project_files.emplace(*found, each.project_file);
        }
    }

    /* source: from which the file would be built; empty if it is not built. */
    void require_none(const std::string &written, const std::string &source) const {
        std::optional<inode> found = inode_of(written);
        if (!found)
            return;
        std::string refused = written + ": cannot write: it is ";
        if (!source.empty() && inode_of_source(source) == found)
            throw failure(refused + "the source");
        if (auto known = sources.find(*found); known != sources.end())
            throw failure(refused + "the source " + known->second);
        if (auto known = project_files.find(*found); known != project_files.end())
            throw failure(refused + "the project file " + known->second);
    }

private:
    std::map<inode, std::string> sources;
    std::map<inode, std::string> project_files;
};

} // namespace

std::vector<std::string> without_repetitions(const std::vector<std::string> &sources) {
    std::set<std::string> known;
    std::vector<std::string> all;
    for (const std::string &each : sources)
        if (each == STANDARD_STREAM || known.insert(place_of(each)).second)
            all.push_back(each);
    return all;
}

/* Databases are compared by their names, because files with several names become separate when one is replaced. */
void require_separate_files(const std::vector<build::unit> &units, const std::optional<std::string> &depfile) {
    inputs read(units);
    std::map<std::string, const std::string *> makers;
    std::vector<std::string> written;
    for (const build::unit &each : units)
        for (const build::output &made : each.outputs) {
            if (made.path == STANDARD_STREAM)
                continue;
            read.require_none(made.path, each.source);
            auto [at, is_new] = makers.emplace(place_of(target_of(made.path)), &each.source);
            if (!is_new)
                throw failure(made.path + ": it would be built from " + *at->second + " and from " + each.source);
            written.push_back(made.path);
        }
    if (depfile) {
        read.require_none(*depfile, "");
        if (!makers.emplace(place_of(target_of(*depfile)), nullptr).second)
            throw failure(*depfile + ": cannot write dependencies: it is a database");
        written.push_back(*depfile);
    }
    for (const std::string &path : written) {
        std::string temporary = temporary_of(target_of(path));
        read.require_none(temporary, "");
        if (makers.contains(place_of(temporary)))
            throw failure(temporary.append(": cannot write: it is the temporary file of ").append(path));
    }
}

} // namespace cdef::build_command
