/* tokens.h: what each part of a document is, for colours. */
#ifndef CDGEN_SERVER_TOKENS_H
#define CDGEN_SERVER_TOKENS_H

#include "server/session.h"

namespace lsp {

/* The names of types and modifiers, to which the numbers in tokens refer. */
json token_legend();

json semantic_tokens(session &now, const json &params);
json semantic_tokens_in_range(session &now, const json &params);

} // namespace lsp

#endif
