/* find.cpp: which project file a source belongs to. */

#include "config/config.h"

#include <filesystem>
#include <system_error>

namespace config {

namespace {

namespace fs = std::filesystem;

fs::path directory_of(const std::string &source) {
    std::error_code error;
    fs::path named = source == "-" ? fs::path() : fs::path(source).parent_path();
    fs::path resolved = fs::weakly_canonical(named.empty() ? fs::path(".") : named, error);
    return error ? fs::path() : resolved;
}

/* The path itself if there is no working directory any more. */
std::string seen_from_here(const fs::path &path) {
    std::error_code error;
    fs::path here = fs::current_path(error);
    fs::path near = error ? path : fs::proximate(path, here, error);
    return (error ? path : near).string();
}

} // namespace

std::string find(const std::string &source) {
    std::error_code error;
    for (fs::path at = directory_of(source); !at.empty(); at = at.parent_path()) {
        fs::path candidate = at / FILE_NAME;
        if (fs::exists(fs::symlink_status(candidate, error)) && !fs::is_directory(candidate, error))
            return seen_from_here(candidate);
        if (at == at.parent_path())
            break;
    }
    return "";
}

} // namespace config
