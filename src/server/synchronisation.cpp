/* synchronisation.cpp: documents follow the editor. */

#include "server/synchronisation.h"

#include "server/uris.h"

namespace lsp {

namespace {

void publish(session &now, const std::string &uri, const json &version, json diagnostics) {
    json params = {{"uri", uri}, {"diagnostics", std::move(diagnostics)}};
    if (!version.is_null())
        params["version"] = version;
    now.send(notification("textDocument/publishDiagnostics", std::move(params)));
}

} // namespace

void did_open(session &now, const json &params) {
    const json &item = member(params, "textDocument");
    std::string uri = text_member(item, "uri");
    std::string key = key_of(uri);
    now.open.insert_or_assign(key, document(uri, number_member(item, "version"), text_member(item, "text")));
    now.unpublished.insert(key);
}

void did_change(session &now, const json &params) {
    document &changed = now.document_in(params);
    const json &all = member(params, "contentChanges");
    if (!all.is_array())
        throw request_error(INVALID_PARAMS, "contentChanges is not a list");
    for (const json &each : all) {
        const json *part = optional_member(each, "range");
        if (part == nullptr)
            changed.replace(text_member(each, "text"));
        else
            changed.replace(range_from(*part), text_member(each, "text"), now.client.units);
    }
    changed.set_version(number_member(member(params, "textDocument"), "version"));
    now.unpublished.insert(key_of(changed.uri()));
}

void did_close(session &now, const json &params) {
    std::string uri = now.document_in(params).uri();
    now.open.erase(key_of(uri));
    now.unpublished.erase(key_of(uri));
    publish(now, uri, nullptr, json::array());
}

void publish_next(session &now) {
    document &changed = now.open.at(*now.unpublished.begin());
    now.unpublished.erase(now.unpublished.begin());
    publish(now, changed.uri(), changed.version(),
            diagnostics_of(changed.text(), changed.lines(), changed.uri(), changed.findings(now.wanted), now.form()));
}

} // namespace lsp
