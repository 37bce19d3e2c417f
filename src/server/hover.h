/* hover.h: the meaning of the name or value at a place, and what it becomes in the database. */
#ifndef CDGEN_SERVER_HOVER_H
#define CDGEN_SERVER_HOVER_H

#include "server/session.h"

namespace lsp {

json hover(session &now, const json &params);

} // namespace lsp

#endif
