/* json.cpp: findings for programs: JSON of our own, and SARIF 2.1.0. */

#include "check/check.h"
#include "report/json_text.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <cctype>

namespace cdef::check {

namespace {

using json = nlohmann::ordered_json;

const char *level_of(const finding &found) {
    return found.error ? "error" : "warning";
}

json number_or_null(size_t number) {
    return number == 0 ? json() : json(number);
}

void add_place(json &to, const place &at) {
    to["line"] = number_or_null(static_cast<size_t>(at.line));
    to["column"] = number_or_null(at.column);
    to["length"] = at.column == 0 ? json() : json(at.length);
}

json json_of(const finding &found) {
    json data;
    data["code"] = found.code;
    data["severity"] = level_of(found);
    data["name"] = found.name;
    data["message"] = found.text;
    add_place(data, found.at);
    data["source"] = found.source;
    data["notes"] = json::array();
    for (const note &more : found.notes) {
        json entry;
        entry["message"] = more.text;
        add_place(entry, more.at);
        data["notes"].push_back(std::move(entry));
    }
    return data;
}

} // namespace

std::string as_json(std::span<const result> checked) {
    json all = json::array();
    for (const result &each : checked) {
        json entry;
        entry["file"] = each.file;
        entry["errors"] = each.errors;
        entry["warnings"] = each.warnings;
        entry["findings"] = json::array();
        for (const finding &found : each.findings)
            entry["findings"].push_back(json_of(found));
        all.push_back(std::move(entry));
    }
    return json_text(all);
}

namespace {

/* ---- SARIF ---------------------------------------------------------------------------------------------------- */

/* What may not stand in a URI reference as it is. */
std::string uri_of(const std::string &file) {
    constexpr const char *hexadecimal = "0123456789ABCDEF";
    std::string uri;
    for (char c : file) {
        auto byte = static_cast<unsigned char>(c);
        bool plain = std::isalnum(byte) != 0 || std::string_view("-._~/").find(c) != std::string_view::npos;
        if (plain)
            uri += c;
        else
            uri += {'%', hexadecimal[byte >> 4], hexadecimal[byte & 15]};
    }
    return uri;
}

/* Characters among the first bytes of a line. */
size_t characters(std::string_view source, size_t bytes) {
    auto text = source.substr(0, bytes);
    return static_cast<size_t>(
        std::count_if(text.begin(), text.end(), [](char c) { return (static_cast<unsigned char>(c) & 0xC0) != 0x80; }));
}

json region_of(const place &at, std::string_view source) {
    json region;
    region["startLine"] = at.line;
    if (at.column == 0)
        return region;
    region["startColumn"] = source.empty() ? at.column : characters(source, at.column - 1) + 1;
    region["endColumn"] = source.empty() ? at.column + at.length : characters(source, at.column - 1 + at.length) + 1;
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

/* The line that a note stands at, as far as it is known. */
std::string_view source_of(const note &more, const finding &found) {
    if (!more.source.empty())
        return more.source;
    return more.at.line == found.at.line ? std::string_view(found.source) : std::string_view();
}

json sarif_of(const std::string &file, const finding &found) {
    json entry;
    entry["ruleId"] = found.code;
    entry["level"] = level_of(found);
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
    for (const warning &known : warnings) {
        json rule;
        rule["id"] = known.code;
        rule["name"] = known.name;
        rule["shortDescription"]["text"] = known.title;
        all.push_back(std::move(rule));
    }
    return all;
}

} // namespace

std::string as_sarif(std::span<const result> checked) {
    json driver;
    driver["name"] = "cdef check";
    driver["version"] = CDGEN_VERSION;
    driver["rules"] = rules();
    json run;
    run["tool"]["driver"] = std::move(driver);
    run["columnKind"] = "unicodeCodePoints";
    run["results"] = json::array();
    for (const result &each : checked)
        for (const finding &found : each.findings)
            run["results"].push_back(sarif_of(each.file, found));
    json log;
    log["$schema"] = "https://json.schemastore.org/sarif-2.1.0.json";
    log["version"] = "2.1.0";
    log["runs"].push_back(std::move(run));
    return json_text(log);
}

} // namespace cdef::check
