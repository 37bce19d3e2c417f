/* session.h: state that the features of the server share: the client, its documents, and the messages for it. */
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

/* The number of a message of a class. All texts are as written in the source. */
struct message_number {
    std::string uri;     /* the source's */
    std::string catalog; /* its MessageCatalog */
    std::string set;     /* its DescriptiveMessageSet */
    std::string number;
};

/* The sources in a folder and the folders in it, as paths, in order. */
struct source_list {
    std::vector<std::string> paths;
    bool is_complete = true; /* false: there may be more, because the search ended early */
};

/* The functions and settings that the server gets from the program. */
struct surroundings {
    /* The bytes of a file; nothing if it cannot be read. */
    std::function<std::optional<std::string>(const std::string &path)> read;
    std::function<source_list(const std::string &folder)> sources_in;
    std::string explanations;                     /* URI of the page that explains the codes; empty: there is none */
    std::string version;                          /* of the program */
    std::optional<std::string> project_file = {}; /* read instead of all others; empty: none is read */
    /* The text of a message. Not set, because nothing reads catalogs yet. */
    std::function<std::optional<std::string>(const message_number &)> message_text = {};
};

/* The capabilities of the client. */
struct client_abilities {
    encoding units = encoding::utf16;
    bool relates = false;   /* shows related places of a diagnostic */
    bool links = false;     /* shows links of codes */
    bool pulls = false;     /* requests diagnostics itself */
    bool refreshes = false; /* can be told to request diagnostics again */
    bool watches_files = false;
    bool shows_progress = false;
    bool versioned_edits = false;
    bool snippets = false;
    bool nested_symbols = false;
    bool literal_actions = false; /* supports code actions, not only commands */
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
    /* Sends a warning for the log that the client shows. */
    void log(const std::string &text) {
        constexpr int WARNING = 2;
        send(notification("window/logMessage", {{"type", WARNING}, {"message", text}}));
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
    unsigned asked = 0;       /* number of requests that the server has sent */
    bool refresh_due = false; /* true: the client has to be told to request findings again */
};

} // namespace lsp

#endif
