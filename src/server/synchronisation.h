/* synchronisation.h: documents follow the editor, and their findings follow the documents. */
#ifndef CDGEN_SERVER_SYNCHRONISATION_H
#define CDGEN_SERVER_SYNCHRONISATION_H

#include "server/session.h"

namespace lsp {

void did_open(session &now, const json &params);
void did_change(session &now, const json &params);
void did_close(session &now, const json &params);

/* Sends the findings of one document that has changed; there must be one. A client that asks for them gets none. */
void publish_next(session &now);

} // namespace lsp

#endif
