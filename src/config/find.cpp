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

} // namespace

std::string find(const std::string &source) {
    std::error_code error;
    for (fs::path at = directory_of(source); !at.empty(); at = at.parent_path()) {
        if (fs::path candidate = at / FILE_NAME; fs::is_regular_file(candidate, error))
            return fs::proximate(candidate, error).string();
        if (at == at.parent_path())
            break;
    }
    return "";
}

} // namespace config
