/* folders.h: what the client says of its folders, and of files and settings in them. */
#ifndef CDGEN_SERVER_FOLDERS_H
#define CDGEN_SERVER_FOLDERS_H

#include "server/session.h"

#include <string>
#include <vector>

namespace lsp {

/* The paths of the folders that the client begins with. */
std::vector<std::string> folders_in(const json &initialize);

/* Looks at the folders, and asks the client to watch the files in them. */
void begin_watching(session &now, const std::vector<std::string> &folders);

void did_change_folders(session &now, const json &params);
void did_change_files(session &now, const json &params);
/* Settings are in project files, which are read anew. */
void did_change_settings(session &now, const json &params);
/* The client does not wait for the end of what has been announced to it. */
void did_cancel_progress(session &now, const json &params);

/* Names in all sources. */
json workspace_symbols(session &now, const json &params);

} // namespace lsp

#endif
