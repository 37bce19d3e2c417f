/* pulling.h: answers clients that ask for findings. */
#ifndef CDGEN_SERVER_PULLING_H
#define CDGEN_SERVER_PULLING_H

#include "server/session.h"

namespace lsp {

/* Of one document, open or not. */
json document_diagnostic(session &now, const json &params);
/* Of all sources in the folders, once all have been looked at. */
json workspace_diagnostic(session &now, const json &params);

} // namespace lsp

#endif
