/* synchronisation.h: keeps documents and their findings in step with the editor. */
#ifndef CDGEN_SERVER_SYNCHRONISATION_H
#define CDGEN_SERVER_SYNCHRONISATION_H

#include "server/session.h"

namespace lsp {

void did_open(session &now, const json &params);
void did_change(session &now, const json &params);
void did_close(session &now, const json &params);

/* Sends the findings of one changed document; there must be one. A client that requests findings itself gets none. */
void publish_next(session &now);

} // namespace lsp

#endif
