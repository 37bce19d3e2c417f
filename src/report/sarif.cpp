/* sarif.cpp: findings as SARIF 2.1.0. */

#include "language/messages.h"
#include "report/json_text.h"
#include "report/places.h"
#include "report/report.h"

#include <nlohmann/json.hpp>

#include <utility>

namespace report {

namespace {

using check::finding;
using check::note;
using check::place;
using json = nlohmann::ordered_json;

/* Columns are characters; without the line, bytes have to do. */
json region_of(const place &at, std::string_view source) {
    json region;
    region["startLine"] = at.line;
    if (at.column == 0)
        return region;
    size_t before = at.column - 1;
    size_t end = before + at.length;
    region["startColumn"] = (source.empty() ? before : characters_in(source, before)) + 1;
    region["endColumn"] = (source.empty() ? end : characters_in(source, end)) + 1;
    return region;
}

json location_of(const std::string &file, const place &at, std::string_view source) {
    json location;
    json &physical = location["physicalLocation"];
    physical["artifactLocation"]["uri"] = uri_of(file);
    if (at.line != 0)
        physical["region"] = region_of(at, source);
    return location;
}

/* The line that a note is about; empty if it is not known. */
std::string_view source_of(const note &more, const finding &found) {
    if (!more.source.empty())
        return more.source;
    return more.at.line == found.at.line ? std::string_view(found.source) : std::string_view();
}

json result_of(const std::string &file, const finding &found) {
    json entry;
    entry["ruleId"] = found.code;
    entry["level"] = found.error ? "error" : "warning";
    entry["message"]["text"] = found.text;
    entry["locations"].push_back(location_of(file, found.at, found.source));
    for (const note &more : found.notes) {
        json related = location_of(file, more.at, source_of(more, found));
        related["message"]["text"] = more.text;
        entry["relatedLocations"].push_back(std::move(related));
    }
    return entry;
}

json rules() {
    json all = json::array();
    for (const message &known : message_rows) {
        json rule;
        rule["id"] = known.code;
        rule["shortDescription"]["text"] = known.text;
        all.push_back(std::move(rule));
    }
    for (const check::warning &known : check::warnings) {
        json rule;
        rule["id"] = known.code;
        rule["name"] = known.name;
        rule["shortDescription"]["text"] = known.title;
        all.push_back(std::move(rule));
    }
    return all;
}

} // namespace

std::string as_sarif(std::span<const checked_source> checked) {
    json driver;
    driver["name"] = "cdef check";
    driver["version"] = CDGEN_VERSION;
    driver["rules"] = rules();
    json run;
    run["tool"]["driver"] = std::move(driver);
    run["columnKind"] = "unicodeCodePoints";
    run["results"] = json::array();
    for (const checked_source &each : checked)
        for (const finding &found : each.findings)
            run["results"].push_back(result_of(each.file, found));
    json log;
    log["$schema"] = "https://json.schemastore.org/sarif-2.1.0.json";
    log["version"] = "2.1.0";
    log["runs"].push_back(std::move(run));
    return json_text(log);
}

} // namespace report
