/* pulling.h: answers clients that request findings. */
#ifndef CDGEN_SERVER_PULLING_H
#define CDGEN_SERVER_PULLING_H

#include "server/session.h"

namespace lsp {

/* The findings of one document, open or not. */
json document_diagnostic(session &now, const json &params);
/* The findings of all sources in the folders; all are checked first. */
json workspace_diagnostic(session &now, const json &params);

} // namespace lsp

#endif
