/* completion.h: what may be written at a place: stanzas, attributes and values, each with what it means. */
#ifndef CDGEN_SERVER_COMPLETION_H
#define CDGEN_SERVER_COMPLETION_H

#include "server/session.h"

namespace lsp {

json completion(session &now, const json &params);

} // namespace lsp

#endif
