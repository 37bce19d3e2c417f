/* server.cpp: the life of the language server, and which feature a message is for. */

#include "server/server.h"

#include "server/actions.h"
#include "server/completion.h"
#include "server/folders.h"
#include "server/folding.h"
#include "server/formatting.h"
#include "server/hover.h"
#include "server/navigation.h"
#include "server/publishing.h"
#include "server/pulling.h"
#include "server/rename.h"
#include "server/symbols.h"
#include "server/synchronisation.h"
#include "server/tokens.h"

#include <array>
#include <exception>
#include <new>
#include <utility>

namespace lsp {

namespace {

struct request_row {
    std::string_view method;
    json (*answer)(session &, const json &params);
};

constexpr auto requests = std::array{
    request_row{"textDocument/hover", hover},
    request_row{"textDocument/diagnostic", document_diagnostic},
    request_row{"workspace/diagnostic", workspace_diagnostic},
    request_row{"workspace/symbol", workspace_symbols},
    request_row{"textDocument/formatting", format_document},
    request_row{"textDocument/rangeFormatting", format_range},
    request_row{"textDocument/completion", completion},
    request_row{"textDocument/definition", definition},
    request_row{"textDocument/references", references},
    request_row{"textDocument/documentHighlight", highlights},
    request_row{"textDocument/documentSymbol", document_symbols},
    request_row{"textDocument/foldingRange", folding_ranges},
    request_row{"textDocument/semanticTokens/full", semantic_tokens},
    request_row{"textDocument/semanticTokens/range", semantic_tokens_in_range},
    request_row{"textDocument/prepareRename", prepare_rename},
    request_row{"textDocument/rename", rename},
    request_row{"textDocument/codeAction", code_actions},
};

struct notification_row {
    std::string_view method;
    void (*take)(session &, const json &params);
};

constexpr auto notifications = std::array{
    notification_row{"textDocument/didOpen", did_open},
    notification_row{"textDocument/didChange", did_change},
    notification_row{"textDocument/didClose", did_close},
    notification_row{"workspace/didChangeWorkspaceFolders", did_change_folders},
    notification_row{"workspace/didChangeWatchedFiles", did_change_files},
    notification_row{"workspace/didChangeConfiguration", did_change_settings},
    notification_row{"window/workDoneProgress/cancel", did_cancel_progress},
};

/* The capabilities of the server. */
json offers_to(const client_abilities &client) {
    constexpr int INCREMENTAL = 2;
    json offers = {
        {"positionEncoding", client.units == encoding::utf8 ? "utf-8" : "utf-16"},
        {"textDocumentSync", {{"openClose", true}, {"change", INCREMENTAL}, {"save", false}}},
        {"hoverProvider", true},
        {"completionProvider", {{"triggerCharacters", {"=", ",", "."}}}},
        {"definitionProvider", true},
        {"referencesProvider", true},
        {"documentHighlightProvider", true},
        {"documentSymbolProvider", true},
        {"foldingRangeProvider", true},
        {"semanticTokensProvider", {{"legend", token_legend()}, {"full", true}, {"range", true}}},
        {"renameProvider", {{"prepareProvider", true}}},
        {"codeActionProvider", {{"codeActionKinds", {"quickfix", "refactor.rewrite", "source.fixAll.cdef"}}}},
        {"documentFormattingProvider", true},
        {"documentRangeFormattingProvider", true},
        {"workspaceSymbolProvider", true},
        {"workspace", {{"workspaceFolders", {{"supported", true}, {"changeNotifications", true}}}}}};
    if (client.pulls)
        offers["diagnosticProvider"] = {
            {"identifier", "cdef"}, {"interFileDependencies", true}, {"workspaceDiagnostics", true}};
    return offers;
}

const json *method_of(const json &message) {
    const json *method = optional_member(message, "method");
    return method != nullptr && method->is_string() ? method : nullptr;
}

bool is_of_protocol(const json &message) {
    const json *version = optional_member(message, "jsonrpc");
    return version != nullptr && *version == "2.0";
}

/* The identifier of a request; null for anything else. */
const json *request_id(const json &message) {
    const json *id = optional_member(message, "id");
    return id != nullptr && is_id(*id) && method_of(message) != nullptr ? id : nullptr;
}

json params_of(const json &message) {
    const json *params = optional_member(message, "params");
    return params == nullptr ? json::object() : *params;
}

} // namespace

void server::refuse(const json &id, error_code code, std::string_view text) {
    now.send(error_response(id, code, text));
}

void server::receive(const frame &message) {
    switch (message.state) {
    case frame_state::bad_header:
        refuse(nullptr, PARSE_ERROR, "not a header with a usable Content-Length");
        status = 1;
        return;
    case frame_state::too_large:
        return refuse(nullptr, INVALID_REQUEST, "the message is too large");
    case frame_state::other_charset:
        return refuse(nullptr, INVALID_REQUEST, "the message is not in UTF-8");
    case frame_state::whole:
        break;
    }
    try {
        json content = parsed(message.body);
        if (!content.is_object())
            return refuse(nullptr, INVALID_REQUEST, "the message is not an object");
        const json *method = method_of(content);
        if (is_of_protocol(content) && method != nullptr && *method == "$/cancelRequest" && !content.contains("id"))
            return cancel(params_of(content));
        waiting.push_back({std::move(content), message.body.size()});
        waiting_bytes += message.body.size();
    } catch (const request_error &wrong) {
        refuse(nullptr, wrong.code, wrong.what());
    }
}

void server::cancel(const json &params) {
    const json *id = optional_member(params, "id");
    for (waiting_message &each : waiting)
        if (const json *waits = request_id(each.content); waits != nullptr && id != nullptr && *waits == *id)
            each.cancelled = true;
}

bool server::has_work() const {
    return !status &&
           (!waiting.empty() || (state == phase::initialized && (!now.unpublished.empty() || now.sources.has_work())));
}

void server::work() {
    if (waiting.empty()) {
        if (now.unpublished.empty())
            now.sources.step(now);
        else
            publish_next(now);
        return finish_step();
    }
    waiting_message message = std::move(waiting.front());
    waiting.pop_front();
    waiting_bytes -= message.size;
    handle(message);
}

/* When all work is done, tells a client that requests findings to request them again. */
void server::finish_step() {
    publish_problems(now);
    if (now.refresh_due && !has_work()) {
        now.refresh_due = false;
        now.ask("workspace/diagnostic/refresh", nullptr);
    }
}

void server::handle(const waiting_message &waited) {
    const json &message = waited.content;
    const json *id = optional_member(message, "id");
    bool is_response = method_of(message) == nullptr && (message.contains("result") || message.contains("error"));
    json answered = id != nullptr && is_id(*id) && !is_response ? *id : json();
    if (!is_of_protocol(message))
        refuse(answered, INVALID_REQUEST, "the message is not JSON-RPC 2.0");
    else if (method_of(message) == nullptr) {
        if (!is_response)
            refuse(answered, INVALID_REQUEST, "the message has no method");
        else if (id != nullptr && id->is_string())
            now.sources.take_answer(now, id->get<std::string>(), message.contains("result"));
    } else if (message.contains("id") && (id == nullptr || !is_id(*id)))
        refuse(nullptr, INVALID_REQUEST, "an id is a text or a number");
    else if (id != nullptr)
        handle_request(waited);
    else
        handle_notification(message);
}

void server::handle_request(const waiting_message &waited) {
    const json &message = waited.content;
    const json &id = message.at("id");
    if (waited.cancelled)
        return refuse(id, REQUEST_CANCELLED, "cancelled");
    try {
        now.send(response(id, answer(message.at("method").get<std::string>(), params_of(message))));
    } catch (const request_error &wrong) {
        refuse(id, wrong.code, wrong.what());
    } catch (const std::bad_alloc &) {
        throw;
    } catch (const std::exception &defect) {
        refuse(id, INTERNAL_ERROR, defect.what());
    }
}

json server::answer(const std::string &method, const json &params) {
    if (method == "initialize")
        return initialize(params);
    if (state == phase::fresh)
        throw request_error(NOT_INITIALIZED, "initialize comes first");
    if (state == phase::shut_down)
        throw request_error(INVALID_REQUEST, "the server has shut down");
    if (method == "shutdown") {
        state = phase::shut_down;
        return nullptr;
    }
    for (const request_row &each : requests)
        if (each.method == method)
            return each.answer(now, params);
    throw request_error(METHOD_NOT_FOUND, method + ": no such method");
}

json server::initialize(const json &params) {
    if (state != phase::fresh)
        throw request_error(INVALID_REQUEST, "initialize comes once");
    now.client = abilities_in(params);
    if (const json *id = optional_member(params, "processId"); id != nullptr && id->is_number_integer())
        process = id->get<int>();
    folders = folders_in(params);
    state = phase::initialized;
    return {{"capabilities", offers_to(now.client)},
            {"serverInfo", {{"name", "cdef"}, {"version", now.world.version}}}};
}

/* A notification has no answer, so an error in one is only logged. */
void server::handle_notification(const json &message) {
    const std::string method = message.at("method").get<std::string>();
    if (method == "exit") {
        status = state == phase::shut_down ? 0 : 1;
        return;
    }
    if (state != phase::initialized)
        return;
    try {
        if (method == "initialized")
            begin_watching(now, std::exchange(folders, {}));
        for (const notification_row &each : notifications)
            if (each.method == method)
                each.take(now, params_of(message));
    } catch (const request_error &wrong) {
        now.log(method + ": " + wrong.what());
    }
}

std::vector<std::string> server::take_output() {
    return std::exchange(now.outbox, {});
}

} // namespace lsp
