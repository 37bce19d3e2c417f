/* tokens.h: semantic tokens, which editors show in colours. */
#ifndef CDGEN_SERVER_TOKENS_H
#define CDGEN_SERVER_TOKENS_H

#include "server/session.h"

namespace lsp {

/* The names that the numbers in tokens stand for. */
json token_legend();

json semantic_tokens(session &now, const json &params);
json semantic_tokens_in_range(session &now, const json &params);

} // namespace lsp

#endif
