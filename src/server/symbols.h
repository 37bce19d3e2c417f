/* symbols.h: the outline of a document. */
#ifndef CDGEN_SERVER_SYMBOLS_H
#define CDGEN_SERVER_SYMBOLS_H

#include "server/session.h"

namespace lsp {

json document_symbols(session &now, const json &params);

/* The names in a document that contain a text, in upper or lower case, with their places. units: of these places */
json symbols_called(document &in, std::string_view query, encoding units);

} // namespace lsp

#endif
