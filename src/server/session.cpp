/* session.cpp: state that the features of the server share. */

#include "server/session.h"

#include "server/uris.h"

#include <algorithm>

namespace lsp {

namespace {

/* UTF-8 if the client supports it, because sources are stored in it. */
encoding units_in(const json &capabilities) {
    const json::json_pointer path("/general/positionEncodings");
    if (!capabilities.contains(path) || !capabilities.at(path).is_array())
        return encoding::utf16;
    const json &known = capabilities.at(path);
    return std::find(known.begin(), known.end(), "utf-8") == known.end() ? encoding::utf16 : encoding::utf8;
}

} // namespace

client_abilities abilities_in(const json &initialize) {
    const json *given = optional_member(initialize, "capabilities");
    const json none = json::object();
    const json &of = given == nullptr || !given->is_object() ? none : *given;
    const std::string document = "/textDocument/";
    auto has = [&](const std::string &path) { return is_true(of, path.c_str()); };
    return {.units = units_in(of),
            .relates = has(document + "publishDiagnostics/relatedInformation"),
            .links = has(document + "publishDiagnostics/codeDescriptionSupport"),
            .pulls = of.contains(json::json_pointer(document + "diagnostic")),
            .refreshes = has("/workspace/diagnostics/refreshSupport"),
            .watches_files = has("/workspace/didChangeWatchedFiles/dynamicRegistration"),
            .shows_progress = has("/window/workDoneProgress"),
            .versioned_edits = has("/workspace/workspaceEdit/documentChanges"),
            .snippets = has(document + "completion/completionItem/snippetSupport"),
            .nested_symbols = has(document + "documentSymbol/hierarchicalDocumentSymbolSupport"),
            .literal_actions = of.contains(json::json_pointer(document + "codeAction/codeActionLiteralSupport"))};
}

document &session::document_in(const json &params) {
    std::string uri = text_member(member(params, "textDocument"), "uri");
    auto found = open.find(key_of(uri));
    if (found == open.end())
        throw request_error(INVALID_PARAMS, uri + ": the document is not open");
    return found->second;
}

} // namespace lsp
