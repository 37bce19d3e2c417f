/* symbols.h: the outline of a document. */
#ifndef CDGEN_SERVER_SYMBOLS_H
#define CDGEN_SERVER_SYMBOLS_H

#include "server/session.h"

namespace lsp {

json document_symbols(session &now, const json &params);

/* Names of a document that contain a text in any case, with their places. units: of the places */
json symbols_called(document &in, std::string_view query, encoding units);

} // namespace lsp

#endif
