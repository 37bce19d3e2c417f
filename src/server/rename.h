/* rename.h: gives an attribute, an action, an element or a variable class another name, everywhere. */
#ifndef CDGEN_SERVER_RENAME_H
#define CDGEN_SERVER_RENAME_H

#include "server/session.h"

namespace lsp {

/* The name at a place, and where it is; null if there is none that can be changed. */
json prepare_rename(session &now, const json &params);

/* A change that leaves everything else as it is. Throws request_error if there is none: if the name cannot be written,
 * if something else has it, or if the change would lead to a new finding. */
json rename(session &now, const json &params);

} // namespace lsp

#endif
