/* publishing.cpp: sends findings to the client. */

#include "server/publishing.h"

#include "report/places.h"
#include "server/uris.h"
#include "text/utf8.h"

#include <optional>

namespace lsp {

namespace {

location location_in(const document &other, const check::place &at, encoding units) {
    return {other.uri(), other.positions(units).of(finding_places(other.text()).of(at))};
}

/* A place in another source: in its text in the editor or else in the file. */
location location_elsewhere(const session &now, const check::elsewhere &other) {
    auto open = now.open.find(other.file);
    if (open != now.open.end())
        return location_in(open->second, other.what.at, now.client.units);
    document stored(report::uri_of(other.file), 0, now.world.read(other.file).value_or(""));
    return location_in(stored, other.what.at, now.client.units);
}

/* The findings of a text, followed by those that other classes cause. */
std::string diagnostics_in(session &now, const std::string &uri, const document &in,
                           const std::vector<check::finding> &own) {
    std::vector<check::finding> all = now.sources.across(key_of(uri));
    if (!all.empty()) /* a copy of many findings takes long */
        all.insert(all.begin(), own.begin(), own.end());
    const std::vector<check::finding> &findings = all.empty() ? own : all;
    auto elsewhere = [&](const check::elsewhere &other) { return location_elsewhere(now, other); };
    return diagnostics_text(in.text(), in.lines(), uri, findings, now.form(), elsewhere);
}

/* A problem without a line is shown in the first one. Its columns count characters. */
json problem_diagnostic(const config::problem &what, const document &in, encoding units) {
    std::size_t line = what.line > 0 ? static_cast<std::size_t>(what.line) - 1 : 0;
    stretch part;
    if (line < in.lines().count()) {
        part = in.lines().line(in.text(), line);
        std::string_view rest = part.of(in.text());
        for (int column = 1; column < what.column && !rest.empty(); ++column)
            rest.remove_prefix(text::length_or_1(rest));
        part.begin = part.end - rest.size();
    }
    constexpr int ERROR = 1;
    return {{"range", to_json(in.positions(units).of(part))},
            {"severity", ERROR},
            {"source", "cdef"},
            {"message", what.text}};
}

} // namespace

report_of_document report_on(session &now, const std::string &uri) {
    auto open = now.open.find(key_of(uri));
    if (open != now.open.end()) {
        document &in = open->second;
        return {in.version(), diagnostics_in(now, in.uri(), in, in.findings(now.settings.wanted_in(uri)))};
    }
    std::optional<std::string> path = path_of(uri);
    std::optional<std::string> text = path ? now.world.read(*path) : std::nullopt;
    if (!text)
        return {};
    auto known = now.sources.files().find(*path);
    document stored(uri, 0, std::move(*text));
    bool is_known = known != now.sources.files().end();
    const std::vector<check::finding> &own =
        is_known ? known->second.own : stored.findings(now.settings.wanted_in(uri));
    return {nullptr, diagnostics_in(now, uri, stored, own)};
}

void publish(session &now, const std::string &uri) {
    if (now.client.pulls) {
        now.refresh_due = now.client.refreshes;
        return;
    }
    report_of_document found = report_on(now, uri);
    auto open = now.open.find(key_of(uri));
    json params = {{"uri", open == now.open.end() ? uri : open->second.uri()}};
    if (!found.version.is_null())
        params["version"] = found.version;
    /* The list, which may be long, is already JSON text. */
    std::string text = std::move(found.diagnostics);
    text.insert(0, R"({"jsonrpc":"2.0","method":"textDocument/publishDiagnostics","params":{"diagnostics":)");
    text.append(",").append(written(params).substr(1)).append("}");
    now.outbox.push_back(std::move(text));
}

void publish_problems(session &now) {
    for (const auto &[path, problems] : now.settings.take_problems()) {
        document file(report::uri_of(path), 0, now.world.read(path).value_or(""));
        json all = json::array();
        for (const config::problem &each : problems)
            all.push_back(problem_diagnostic(each, file, now.client.units));
        now.send(
            notification("textDocument/publishDiagnostics", {{"uri", file.uri()}, {"diagnostics", std::move(all)}}));
    }
}

} // namespace lsp
