/* publishing.h: findings on their way to the client, which gets them by itself or asks for them. */
#ifndef CDGEN_SERVER_PUBLISHING_H
#define CDGEN_SERVER_PUBLISHING_H

#include "server/session.h"

#include <string>

namespace lsp {

/* Sends all findings of a document, as it is open or stored; none if it is neither. A client that asks for findings is
 * told to ask again instead. */
void publish(session &now, const std::string &uri);

/* Sends what is wrong with project files that have been read. */
void publish_problems(session &now);

/* All findings of a document, as it is open or stored. */
struct report_of_document {
    json version;                   /* null for a document that is not open */
    std::string diagnostics = "[]"; /* JSON */
};

report_of_document report_on(session &now, const std::string &uri);

} // namespace lsp

#endif
