/* pulling.cpp: answers clients that request findings. */

#include "server/pulling.h"

#include "report/places.h"
#include "server/publishing.h"
#include "server/synchronisation.h"
#include "server/uris.h"

#include <functional>
#include <map>

namespace lsp {

namespace {

/* Equal findings have equal identifiers. */
std::string result_id(const std::string &diagnostics) {
    return std::to_string(std::hash<std::string>()(diagnostics));
}

json pulled(session &now, const std::string &uri, const json *previous) {
    report_of_document found = report_on(now, uri);
    std::string id = result_id(found.diagnostics);
    json report = {{"kind", "unchanged"}, {"resultId", id}};
    if (previous == nullptr || *previous != id)
        report = {{"kind", "full"}, {"resultId", id}, {"items", json::parse(found.diagnostics)}};
    report["version"] = found.version;
    return report;
}

/* The identifiers of the results that the client already has, by path. */
std::map<std::string, json> results_before(const json &params) {
    std::map<std::string, json> known;
    const json *all = optional_member(params, "previousResultIds");
    if (all != nullptr && all->is_array())
        for (const json &each : *all)
            known[key_of(text_member(each, "uri"))] = member(each, "value");
    return known;
}

} // namespace

json document_diagnostic(session &now, const json &params) {
    std::string uri = text_member(member(params, "textDocument"), "uri");
    json report = pulled(now, uri, optional_member(params, "previousResultId"));
    report.erase("version");
    return report;
}

json workspace_diagnostic(session &now, const json &params) {
    while (!now.unpublished.empty())
        publish_next(now);
    while (now.sources.has_work())
        now.sources.step(now);
    const std::map<std::string, json> earlier = results_before(params);
    json items = json::array();
    for (const auto &[path, file] : now.sources.files()) {
        auto open = now.open.find(path);
        std::string uri = open == now.open.end() ? report::uri_of(path) : open->second.uri();
        auto previous = earlier.find(path);
        json report = pulled(now, uri, previous == earlier.end() ? nullptr : &previous->second);
        report["uri"] = uri;
        items.push_back(std::move(report));
    }
    return {{"items", std::move(items)}};
}

} // namespace lsp
