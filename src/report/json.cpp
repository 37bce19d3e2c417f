/* json.cpp: findings as JSON. */

#include "report/json_text.h"
#include "report/report.h"

#include <nlohmann/json.hpp>

#include <utility>

namespace report {

namespace {

using json = nlohmann::ordered_json;

json number_or_null(size_t number) {
    return number == 0 ? json() : json(number);
}

void add_place(json &to, const check::place &at) {
    to["line"] = number_or_null(static_cast<size_t>(at.line));
    to["column"] = number_or_null(at.column);
    to["length"] = at.column == 0 ? json() : json(at.length);
}

json json_of(const check::finding &found) {
    json data;
    data["code"] = found.code;
    data["severity"] = found.error ? "error" : "warning";
    data["name"] = found.name;
    data["message"] = found.text;
    add_place(data, found.at);
    data["source"] = found.source;
    data["notes"] = json::array();
    for (const check::note &more : found.notes) {
        json entry;
        entry["message"] = more.text;
        add_place(entry, more.at);
        data["notes"].push_back(std::move(entry));
    }
    return data;
}

} // namespace

std::string as_json(std::span<const checked_source> checked) {
    json all = json::array();
    for (const checked_source &each : checked) {
        json entry;
        entry["file"] = each.file;
        entry["errors"] = each.count.errors;
        entry["warnings"] = each.count.warnings;
        entry["findings"] = json::array();
        for (const check::finding &found : each.findings)
            entry["findings"].push_back(json_of(found));
        all.push_back(std::move(entry));
    }
    return json_text(all);
}

} // namespace report
