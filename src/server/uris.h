/* uris.h: files as URIs. Pure functions of texts. */
#ifndef CDGEN_SERVER_URIS_H
#define CDGEN_SERVER_URIS_H

#include <optional>
#include <string>
#include <string_view>

namespace lsp {

/* The path of a URI such as file:///a/b%20c; nothing for other schemes, for other hosts, and for paths that cannot
 * exist. */
std::optional<std::string> path_of(std::string_view uri);

/* A document's key, which does not depend on how its URI is escaped: its path or, for other schemes, its URI. */
std::string key_of(const std::string &uri);

} // namespace lsp

#endif
