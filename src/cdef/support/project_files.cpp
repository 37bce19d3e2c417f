/* project_files.cpp: the project file (cdef.toml) that each source belongs to. */

#include "cdef/support/project_files.h"

#include "cdef/support/failure.h"

#include <filesystem>
#include <utility>

namespace cdef {

void add_project_options(command &to, project_options &options) {
    option file = to.add("--config", options.file, "Read FILE instead of the nearest cdef.toml").called("FILE");
    to.add_flag("--no-config", options.none, "Read no cdef.toml").excludes(file);
}

const std::string &project_files::path_for(const std::string &source) {
    if (options.none)
        return paths[""];
    if (options.file && options.file->empty())
        throw failure("--config: expected a file");
    if (options.file)
        return *options.file;
    std::string directory = std::filesystem::path(source).parent_path().string() + "/";
    auto [at, is_new] = paths.emplace(directory, "");
    if (is_new)
        at->second = config::find(source);
    return at->second;
}

const config::settings &project_files::load(const std::string &path) {
    config::reading read = options.file ? config::load(path) : config::load_found(path);
    for (size_t i = 0; i + 1 < read.problems.size(); ++i)
        print_error(config::as_text(path, read.problems[i]));
    if (!read.problems.empty())
        throw failure(config::as_text(path, read.problems.back()));
    return loaded.emplace(path, std::move(read.values)).first->second;
}

const config::settings &project_files::of(const std::string &source) {
    const std::string &path = path_for(source);
    auto known = loaded.find(path);
    return known != loaded.end() ? known->second : load(path);
}

} // namespace cdef
