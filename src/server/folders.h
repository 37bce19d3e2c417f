/* folders.h: messages about the client's folders, and about the files and settings in them. */
#ifndef CDGEN_SERVER_FOLDERS_H
#define CDGEN_SERVER_FOLDERS_H

#include "server/session.h"

#include <string>
#include <vector>

namespace lsp {

/* The paths of the folders in an initialize request. */
std::vector<std::string> folders_in(const json &initialize);

/* Adds the folders, and asks the client to watch their files. */
void begin_watching(session &now, const std::vector<std::string> &folders);

void did_change_folders(session &now, const json &params);
void did_change_files(session &now, const json &params);
/* Reads all project files again. */
void did_change_settings(session &now, const json &params);
/* The user has cancelled the check of the folders. */
void did_cancel_progress(session &now, const json &params);

/* Finds names in all sources. */
json workspace_symbols(session &now, const json &params);

} // namespace lsp

#endif
