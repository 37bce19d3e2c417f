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

json region_of(const place &at, std::string_view source) {
    json region;
    region["startLine"] = at.line;
    if (at.column == 0)
        return region;
    character_range in_characters = characters_of(at, source);
    region["startColumn"] = in_characters.column;
    region["endColumn"] = in_characters.column + in_characters.length;
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

class sarif_writer : public writer {
public:
    explicit sarif_writer(output written_to) : to(std::move(written_to)) {
        to.open_object();
        to.add_text("$schema", "https://json.schemastore.org/sarif-2.1.0.json");
        to.add_text("version", "2.1.0");
        to.open_list("runs");
        to.open_object();
        json driver;
        driver["name"] = "cdef check";
        driver["version"] = CDGEN_VERSION;
        driver["rules"] = rules();
        to.open_object("tool");
        to.add_json("driver", json_line(driver));
        to.close();
        to.add_text("columnKind", "unicodeCodePoints");
        to.open_list("results");
    }
    void begin_source(const std::string &name) override {
        file = name;
    }
    void add(const finding &found) override {
        to.add_whole([&] { to.add_json({}, json_line(result_of(file, found))); });
    }
    void end_source(const check::totals & /* count */) override {}
    void fail_source(const std::string & /* why */) override {}
    void close() override {
        for (int levels = 4; levels > 0; --levels)
            to.close();
    }

private:
    json_writer to;
    std::string file;
};

} // namespace

std::unique_ptr<writer> sarif_form(output to) {
    return std::make_unique<sarif_writer>(std::move(to));
}

} // namespace report
