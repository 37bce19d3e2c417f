/* files.cpp: the files that the language server reads. */

#include "cdef/lsp/files.h"

#include "cdef/support/failure.h"
#include "cdef/support/text_of_file.h"
#include "report/places.h"

#include <algorithm>
#include <filesystem>
#include <system_error>

namespace cdef {

namespace {

constexpr std::uintmax_t FILE_MAX = 64UL * 1024 * 1024; /* bytes */

} // namespace

std::optional<std::string> bytes_of_file(const std::string &path) {
    std::error_code failed;
    if (!std::filesystem::is_regular_file(path, failed) || std::filesystem::file_size(path, failed) > FILE_MAX ||
        failed)
        return std::nullopt;
    try {
        return text_of_file(path);
    } catch (const failure &) {
        return std::nullopt;
    }
}

lsp::source_list sources_below(const std::string &folder, const search_limits &limits) {
    using std::filesystem::recursive_directory_iterator;
    lsp::source_list found;
    std::error_code failed;
    recursive_directory_iterator end;
    recursive_directory_iterator at(folder, std::filesystem::directory_options::skip_permission_denied, failed);
    for (std::size_t seen = 0; !failed && at != end; ++seen) {
        found.is_complete = seen < limits.entries && found.paths.size() < limits.sources;
        if (!found.is_complete)
            break;
        std::error_code unknown;
        if (at->path().filename().native().starts_with('.'))
            at.disable_recursion_pending();
        else if (at->path().extension() == ".cdefsrc" && at->is_regular_file(unknown))
            found.paths.push_back(at->path().string());
        at.increment(failed);
    }
    std::sort(found.paths.begin(), found.paths.end());
    return found;
}

std::string explanations_page() {
    std::error_code failed;
    std::filesystem::path program = std::filesystem::read_symlink("/proc/self/exe", failed);
    std::filesystem::path page = (program.parent_path() / CDGEN_DOCUMENTS / "docs/messages.md").lexically_normal();
    return !failed && std::filesystem::exists(page, failed) ? report::uri_of(page.string()) : std::string();
}

} // namespace cdef
