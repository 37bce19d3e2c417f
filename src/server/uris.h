/* uris.h: files as URIs. Pure functions of texts. */
#ifndef CDGEN_SERVER_URIS_H
#define CDGEN_SERVER_URIS_H

#include <optional>
#include <string>
#include <string_view>

namespace lsp {

/* The path of a URI such as file:///a/b%20c; nothing for other schemes, other hosts, and what cannot be a path. */
std::optional<std::string> path_of(std::string_view uri);

/* The same document has the same key, however its URI is escaped: the path; for other schemes the URI. */
std::string key_of(const std::string &uri);

} // namespace lsp

#endif
