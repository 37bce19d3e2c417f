/* actions.h: changes that an editor offers at a place: corrections of findings, missing lines, free numbers, quotes. */
#ifndef CDGEN_SERVER_ACTIONS_H
#define CDGEN_SERVER_ACTIONS_H

#include "server/session.h"

namespace lsp {

json code_actions(session &now, const json &params);

} // namespace lsp

#endif
