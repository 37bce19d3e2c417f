/* rename.h: renames an attribute, an action, an element or a variable class. */
#ifndef CDGEN_SERVER_RENAME_H
#define CDGEN_SERVER_RENAME_H

#include "server/session.h"

namespace lsp {

/* The name at a place and its range; null if there is no name that can be changed. */
json prepare_rename(session &now, const json &params);

/* The edits. Throws request_error if the name cannot be written, if something else has it, or if the class would get a
 * new finding. */
json rename(session &now, const json &params);

} // namespace lsp

#endif
