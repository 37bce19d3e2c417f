/* projects.cpp: the settings of the project that each document belongs to. */

#include "server/projects.h"

#include "server/uris.h"

#include <filesystem>
#include <utility>

namespace lsp {

const check::warning_set &projects::of_file(const std::string &path) {
    auto [at, is_new] = by_file.try_emplace(path);
    if (!is_new)
        return at->second;
    config::reading read = path.empty() ? config::reading() : only ? config::load(path) : config::load_found(path);
    if (!path.empty())
        problems[std::filesystem::weakly_canonical(path).string()] = read.problems;
    at->second = (read.problems.empty() ? read.values : config::settings()).warnings();
    return at->second;
}

const check::warning_set &projects::wanted_in(const std::string &uri) {
    if (only)
        return of_file(*only);
    std::optional<std::string> path = path_of(uri);
    if (!path)
        return of_file({});
    auto [at, is_new] = by_directory.try_emplace(path->substr(0, path->rfind('/') + 1));
    if (is_new)
        at->second = config::find(*path);
    return of_file(at->second);
}

std::map<std::string, std::vector<config::problem>> projects::take_problems() {
    return std::exchange(problems, {});
}

} // namespace lsp
