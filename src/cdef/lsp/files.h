/* files.h: the files that the language server reads. */
#ifndef CDGEN_CDEF_LSP_FILES_H
#define CDGEN_CDEF_LSP_FILES_H

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace cdef {

/* The bytes of a regular file of a reasonable size; nothing if there is none, or if it cannot be read. */
std::optional<std::string> bytes_of_file(const std::string &path);

/* The sources in a folder and in the folders below it, in order. Links to folders are not followed, and hidden folders
 * are left out. The search ends early in a folder with very many files, such as the root of a file system. */
std::vector<std::string> sources_below(const std::string &folder);

/* The page with the explanations of all codes, as a URI: where it is installed beside the program, or empty. */
std::string explanations_page();

} // namespace cdef

#endif
