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

/* True if there may be a project file of this name. What the system refuses to tell is found out when the file is read;
 * but a directory that this user may not search counts as one without a project file. */
bool may_be_file(const fs::path &candidate) {
    std::error_code error;
    fs::file_status named = fs::symlink_status(candidate, error);
    if (named.type() == fs::file_type::none)
        return error != std::errc::permission_denied;
    return fs::exists(named) && !fs::is_directory(candidate, error);
}

} // namespace

std::string find(const std::string &source) {
    for (fs::path at = directory_of(source); !at.empty(); at = at.parent_path()) {
        fs::path candidate = at / FILE_NAME;
        if (may_be_file(candidate))
            return seen_from_here(candidate);
        if (at == at.parent_path())
            break;
    }
    return "";
}

} // namespace config
