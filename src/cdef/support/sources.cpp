/* sources.cpp: finds the sources that operands name. */

#include "cdef/support/sources.h"

#include "cdef/support/failure.h"

#include <algorithm>
#include <filesystem>
#include <string_view>

namespace cdef {

namespace {

namespace fs = std::filesystem;

constexpr std::string_view SUFFIX = ".cdefsrc";

/* A link that leads nowhere or to itself counts as a source, so that it is reported as one that cannot be read. */
bool may_be_source(const fs::directory_entry &entry) {
    std::error_code error;
    return entry.is_regular_file(error) || (entry.is_symlink(error) && !entry.exists(error));
}

std::vector<std::string> sources_below(const std::string &directory) {
    std::vector<std::string> found;
    for (auto at = fs::recursive_directory_iterator(directory); at != fs::recursive_directory_iterator(); ++at) {
        std::string name = at->path().filename().string();
        if (name.starts_with('.'))
            at.disable_recursion_pending();
        else if (name.ends_with(SUFFIX) && may_be_source(*at))
            found.push_back(at->path().string());
    }
    std::sort(found.begin(), found.end());
    if (found.empty())
        throw failure(directory + ": no sources in it (*.cdefsrc)");
    return found;
}

} // namespace

std::vector<std::string> sources_of(const std::vector<std::string> &operands) {
    std::vector<std::string> all;
    for (const std::string &operand : operands) {
        std::error_code error;
        if (operand == "-" || !fs::is_directory(operand, error)) {
            all.push_back(operand);
            continue;
        }
        try {
            std::vector<std::string> below = sources_below(operand);
            all.insert(all.end(), below.begin(), below.end());
        } catch (const fs::filesystem_error &e) {
            throw failure((e.path1().empty() ? operand : e.path1().string()) + ": " + e.code().message());
        }
    }
    return all;
}

} // namespace cdef
