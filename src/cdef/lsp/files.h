/* files.h: the files that the language server reads. */
#ifndef CDGEN_CDEF_LSP_FILES_H
#define CDGEN_CDEF_LSP_FILES_H

#include "server/session.h"

#include <cstddef>
#include <optional>
#include <string>

namespace cdef {

/* The bytes of a file; nothing if it cannot be read, is not a regular file, or has more than 64 MiB. */
std::optional<std::string> bytes_of_file(const std::string &path);

/* Where a search ends early, in a folder with very many files, such as the root of a file system. */
struct search_limits {
    std::size_t entries = 500'000; /* files and folders that are looked at: about a second */
    std::size_t sources = 20'000;
};

/* The sources in a folder and in the folders below it. Links to folders are not followed, and hidden files and folders
 * are left out. */
lsp::source_list sources_below(const std::string &folder, const search_limits &limits = {});

/* URI of the installed page that explains the codes; empty if it is not installed. */
std::string explanations_page();

} // namespace cdef

#endif
