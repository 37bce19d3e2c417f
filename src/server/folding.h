/* folding.h: which lines of a document can be folded into one. */
#ifndef CDGEN_SERVER_FOLDING_H
#define CDGEN_SERVER_FOLDING_H

#include "server/session.h"

namespace lsp {

json folding_ranges(session &now, const json &params);

} // namespace lsp

#endif
