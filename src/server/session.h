/* session.h: what the features of the server share: the client, its documents, and what is to be sent to it. */
#ifndef CDGEN_SERVER_SESSION_H
#define CDGEN_SERVER_SESSION_H

#include "check/check.h"
#include "server/diagnostics.h"
#include "server/document.h"
#include "server/projects.h"
#include "server/rpc.h"
#include "server/workspace.h"

#include <functional>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <vector>

namespace lsp {

/* A message of a class. All are written as in the source. */
struct message_number {
    std::string uri;     /* the source's */
    std::string catalog; /* its MessageCatalog */
    std::string set;     /* its DescriptiveMessageSet */
    std::string number;
};

/* What the server needs of the machine. */
struct surroundings {
    /* The bytes of a file; nothing if it cannot be read. */
    std::function<std::optional<std::string>(const std::string &path)> read;
    /* The sources in a folder and the folders in it, as paths, in order. */
    std::function<std::vector<std::string>(const std::string &folder)> sources_in;
    std::string explanations;                     /* where the page about all codes is, a URI; empty: nowhere */
    std::string version;                          /* of the program */
    std::optional<std::string> project_file = {}; /* read in place of all others; empty: none is read */
    /* The text of a message. Empty as long as nothing reads catalogs. */
    std::function<std::optional<std::string>(const message_number &)> message_text = {};
};

/* What the client has said of itself. */
struct client_abilities {
    encoding units = encoding::utf16;
    bool relates = false;   /* shows places that are related to a finding */
    bool links = false;     /* follows links of codes */
    bool pulls = false;     /* asks for diagnostics itself */
    bool refreshes = false; /* can be asked to ask again */
    bool watches_files = false;
    bool shows_progress = false;
    bool versioned_edits = false;
    bool snippets = false;
    bool nested_symbols = false;
    bool literal_actions = false; /* takes code actions, not just commands */
};

client_abilities abilities_in(const json &initialize);

struct session {
    explicit session(surroundings machine) : world(std::move(machine)) {
        settings.only = world.project_file;
    }

    diagnostic_form form() const {
        return {client.units, client.relates, client.links, world.explanations};
    }
    void send(const json &message) {
        outbox.push_back(written(message));
    }
    /* Sends a request of the server. Returns its identifier. */
    std::string ask(std::string_view method, json params) {
        std::string id = "cdef/" + std::to_string(++asked);
        send(request(id, method, std::move(params)));
        return id;
    }
    /* The open document that the parameters of a request name. Throws request_error. */
    document &document_in(const json &params);

    surroundings world;
    client_abilities client;
    projects settings;
    workspace sources;
    std::map<std::string, document> open; /* by key_of their URIs */
    std::set<std::string> unpublished;    /* keys of open documents that changed since their findings were sent */
    std::vector<std::string> outbox;
    unsigned asked = 0;      /* requests of the server */
    bool asks_again = false; /* the client is to ask for findings again */
};

} // namespace lsp

#endif
