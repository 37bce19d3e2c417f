/* navigation.h: where a name is defined and used. */
#ifndef CDGEN_SERVER_NAVIGATION_H
#define CDGEN_SERVER_NAVIGATION_H

#include "server/session.h"

namespace lsp {

json definition(session &now, const json &params);
json references(session &now, const json &params);
json highlights(session &now, const json &params);

} // namespace lsp

#endif
