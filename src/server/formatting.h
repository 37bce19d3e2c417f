/* formatting.h: formats documents, and ranges of them. */
#ifndef CDGEN_SERVER_FORMATTING_H
#define CDGEN_SERVER_FORMATTING_H

#include "server/session.h"

namespace lsp {

/* The edits. Throws request_error for a document with errors, which is left alone. */
json format_document(session &now, const json &params);
json format_range(session &now, const json &params);

} // namespace lsp

#endif
