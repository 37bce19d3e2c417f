/* synchronisation.cpp: keeps documents in step with the editor. */

#include "server/synchronisation.h"

#include "server/publishing.h"
#include "server/uris.h"

#include <optional>
#include <utility>
#include <vector>

namespace lsp {

namespace {

/* A change as the client sent it; without a range it replaces everything. */
struct content_change {
    std::optional<range> part;
    std::string text;
};

/* Throws request_error if one of them is malformed. */
std::vector<content_change> changes_in(const json &params) {
    const json &all = member(params, "contentChanges");
    if (!all.is_array())
        throw request_error(INVALID_PARAMS, "contentChanges is not a list");
    std::vector<content_change> changes;
    for (const json &each : all) {
        const json *part = optional_member(each, "range");
        changes.push_back(
            {part == nullptr ? std::nullopt : std::optional(range_from(*part)), text_member(each, "text")});
    }
    return changes;
}

/* Checks the file of a document again if it belongs to a folder. */
void look_at_file(session &now, const std::string &key) {
    if (now.sources.holds(key) || (now.sources.is_in_folder(key) && key.ends_with(".cdefsrc")))
        now.sources.look_at(key);
}

} // namespace

void did_open(session &now, const json &params) {
    const json &item = member(params, "textDocument");
    std::string uri = text_member(item, "uri");
    std::string key = key_of(uri);
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
    if (now.sources.is_in_folder(key))
        return look_at_file(now, key);
    if (!now.client.pulls)
        now.send(notification("textDocument/publishDiagnostics", {{"uri", uri}, {"diagnostics", json::array()}}));
}

void publish_next(session &now) {
    std::string key = *now.unpublished.begin();
    now.unpublished.erase(now.unpublished.begin());
    if (!now.client.pulls)
        publish(now, now.open.at(key).uri());
    look_at_file(now, key);
}

} // namespace lsp
