/* publishing.h: sends findings to the client. */
#ifndef CDGEN_SERVER_PUBLISHING_H
#define CDGEN_SERVER_PUBLISHING_H

#include "server/session.h"

#include <string>

namespace lsp {

/* Sends all findings of a document: of its text in the editor or else of the file; an empty list if there is neither. A
 * client that requests findings is told to request them again instead. */
void publish(session &now, const std::string &uri);

/* Sends the problems of the project files that have been read. */
void publish_problems(session &now);

/* All findings of a document: of its text in the editor or else of the file. */
struct report_of_document {
    json version;                   /* null for a document that is not open */
    std::string diagnostics = "[]"; /* JSON */
};

report_of_document report_on(session &now, const std::string &uri);

} // namespace lsp

#endif
