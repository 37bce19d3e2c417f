/* synchronisation.cpp: keeps documents in step with the editor. */

#include "server/synchronisation.h"

#include "report/places.h"
#include "server/publishing.h"
#include "server/uris.h"

#include <optional>
#include <tuple>
#include <utility>
#include <vector>

namespace lsp {

namespace {

/* A change as the client sent it; without a range it replaces everything. */
struct content_change {
    std::optional<range> part;
    std::string text;
};

/* The replaced part of a change; nothing if it replaces everything. */
std::optional<range> part_of(const json &change) {
    const json *given = optional_member(change, "range");
    if (given == nullptr)
        return std::nullopt;
    range part = range_from(*given);
    if (std::tie(part.end.line, part.end.character) < std::tie(part.start.line, part.start.character))
        throw request_error(INVALID_PARAMS, "a range ends before it begins");
    return part;
}

/* Throws request_error if one of them is malformed. */
std::vector<content_change> changes_in(const json &params) {
    const json &all = member(params, "contentChanges");
    if (!all.is_array())
        throw request_error(INVALID_PARAMS, "contentChanges is not a list");
    std::vector<content_change> changes;
    for (const json &each : all)
        changes.push_back({part_of(each), text_member(each, "text")});
    return changes;
}

/* Whether a document is a source in a folder, which is also checked while it is not open. */
bool is_source_of_folder(const session &now, const std::string &key) {
    return now.sources.holds(key) || (now.sources.is_in_folder(key) && key.ends_with(".cdefsrc"));
}

/* Takes back the findings under one spelling of a URI. */
void clear_findings(session &now, const std::string &uri) {
    if (!now.client.pulls)
        now.send(notification("textDocument/publishDiagnostics", {{"uri", uri}, {"diagnostics", json::array()}}));
}

} // namespace

void did_open(session &now, const json &params) {
    const json &item = member(params, "textDocument");
    std::string uri = text_member(item, "uri");
    std::string key = key_of(uri);
    if (now.sources.holds(key) && uri != report::uri_of(key))
        clear_findings(now, report::uri_of(key));
    now.open.insert_or_assign(key, document(uri, number_member(item, "version"), text_member(item, "text")));
    now.unpublished.insert(key);
}

/* Reads the whole message first: of a malformed one, nothing is applied. */
void did_change(session &now, const json &params) {
    document &changed = now.document_in(params);
    int version = number_member(member(params, "textDocument"), "version");
    for (content_change &each : changes_in(params)) {
        if (each.part)
            changed.replace(*each.part, each.text, now.client.units);
        else
            changed.replace(std::move(each.text));
    }
    changed.set_version(version);
    now.unpublished.insert(key_of(changed.uri()));
}

void did_close(session &now, const json &params) {
    std::string uri = now.document_in(params).uri();
    std::string key = key_of(uri);
    now.open.erase(key);
    now.unpublished.erase(key);
    bool is_checked_again = is_source_of_folder(now, key);
    if (!is_checked_again || uri != report::uri_of(key))
        clear_findings(now, uri);
    if (is_checked_again)
        now.sources.look_at(key);
}

void publish_next(session &now) {
    std::string key = *now.unpublished.begin();
    now.unpublished.erase(now.unpublished.begin());
    if (!now.client.pulls)
        publish(now, now.open.at(key).uri());
    if (is_source_of_folder(now, key))
        now.sources.look_at(key);
}

} // namespace lsp
