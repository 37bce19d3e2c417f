/* sarif.cpp: findings as SARIF 2.1.0. */

#include "report/sarif.h"

#include "report/fingerprint.h"
#include "report/json_text.h"
#include "report/places.h"
#include "report/report.h"
#include "report/rules.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <utility>
#include <vector>

namespace report {

namespace {

using check::finding;
using check::note;
using check::place;
using json = nlohmann::ordered_json;

/* Columns are counted in characters or, if the text of the line is not known, in bytes. A finding about the whole
 * source is at the first line, because consumers require a line. */
json region_of(const place &at, std::string_view source) {
    json region;
    region["startLine"] = std::max<size_t>(line_in_file(at), 1);
    if (at.column == 0)
        return region;
    character_range in_file = characters_in_file(at, source);
    region["startColumn"] = in_file.column;
    region["endColumn"] = in_file.column + in_file.length;
    return region;
}

json location_of(const std::string &file, const place &at, std::string_view source) {
    json location;
    json &physical = location["physicalLocation"];
    physical["artifactLocation"] = artifact_of(file);
    physical["region"] = region_of(at, source);
    return location;
}

/* The region that an edit removes: empty, a part of a line, or a part that includes the newline at its end. */
json replacement_of(const check::edit &made) {
    bool ends_line = made.removed.ends_with('\n');
    json replacement;
    json &region = replacement["deletedRegion"];
    region["startLine"] = made.line;
    region["startColumn"] = made.character;
    region["endLine"] = made.line + (ends_line ? 1 : 0);
    region["endColumn"] = ends_line ? 1 : made.character + characters_in(made.removed, made.removed.size());
    replacement["insertedContent"]["text"] = made.text;
    return replacement;
}

json fix_of(const std::string &file, const check::correction &fix) {
    bool certain = fix.sure == check::certainty::certain;
    json change;
    change["artifactLocation"] = artifact_of(file);
    for (const check::edit &made : fix.edits)
        change["replacements"].push_back(replacement_of(made));
    json entry;
    entry["description"]["text"] = certain ? "The only change that is near." : "A change that is likely to be meant.";
    entry["artifactChanges"].push_back(std::move(change));
    entry["properties"]["certainty"] = name_of(fix.sure);
    return entry;
}

/* Each once, as consumers want it. */
json related_locations(const std::string &file, const finding &found) {
    json all = json::array();
    auto add = [&](json related, const std::string &text) {
        related["message"]["text"] = text;
        if (std::find(all.begin(), all.end(), related) == all.end())
            all.push_back(std::move(related));
    };
    for (const note &more : found.notes)
        add(location_of(file, more.at, source_of(more, found)), more.text);
    for (const check::elsewhere &other : found.others)
        add(location_of(other.file, other.what.at, other.what.source), other.what.text);
    return all;
}

json result_of(const std::string &file, const finding &found, const fingerprint &print, std::size_t rule) {
    json entry;
    entry["ruleId"] = found.code;
    entry["ruleIndex"] = rule;
    entry["level"] = found.error ? "error" : "warning";
    entry["message"]["text"] = found.text;
    entry["locations"].push_back(location_of(file, found.at, found.source));
    if (!found.notes.empty() || !found.others.empty())
        entry["relatedLocations"] = related_locations(file, found);
    entry["partialFingerprints"]["primaryLocationLineHash"] = print.text();
    if (!found.fix.edits.empty())
        entry["fixes"].push_back(fix_of(file, found.fix));
    return entry;
}

/* Appended as text, because every log has more than a hundred rules, and most logs have few findings. */
void append_rule(std::string &to, const rule &known) {
    std::string help;
    append_json(help, known.help);
    append_json(to += R"({"id":)", known.code);
    if (!known.name.empty())
        append_json(to += R"(,"name":)", known.name);
    append_json(to += R"(,"shortDescription":{"text":)", known.title);
    append_json(to += R"(},"fullDescription":{"text":)", known.cause);
    to.append(R"(},"help":{"text":)").append(help).append(R"(,"markdown":)").append(help);
    append_json(to += R"(},"defaultConfiguration":{"level":)", known.error ? "error" : "warning");
    to += "}}";
}

class sarif_writer : public writer {
public:
    sarif_writer(output written_to, const std::vector<rule> &more)
        : rules(with(more)), to(std::move(written_to), "cdef check", rules) {}

    void begin_source(const std::string &name) override {
        file = name;
    }
    void add(const finding &found) override {
        to.add(result_of(file, found, made.of(file, found), index_of(found.code)));
    }
    void end_source(const check::totals & /* count */) override {}
    void fail_source(const std::string &why) override {
        to.fail(file, why);
    }
    void fail_output(const std::string &why) override {
        to.fail(file, why);
    }
    void close() override {
        to.close();
    }

private:
    /* All rules, those of sources first. */
    static std::vector<rule> with(const std::vector<rule> &more) {
        std::vector<rule> all = all_rules();
        all.insert(all.end(), more.begin(), more.end());
        return all;
    }
    std::size_t index_of(std::string_view code) const {
        auto found = std::find_if(rules.begin(), rules.end(), [code](const rule &each) { return each.code == code; });
        return static_cast<std::size_t>(found - rules.begin());
    }

    std::vector<rule> rules;
    sarif_log to;
    std::string file;
    fingerprints made;
};

} // namespace

json artifact_of(const std::string &file) {
    json artifact;
    artifact["uri"] = uri_of(file);
    return artifact;
}

sarif_log::sarif_log(output written_to, std::string_view tool, std::span<const rule> rules)
    : to(std::move(written_to)) {
    to.open_object();
    to.add_text("$schema", "https://json.schemastore.org/sarif-2.1.0.json");
    to.add_text("version", "2.1.0");
    to.open_list("runs");
    to.open_object();
    to.open_object("tool");
    add_driver(tool, rules);
    to.close();
    to.add_text("columnKind", "unicodeCodePoints");
    to.open_list("results");
}

void sarif_log::add_driver(std::string_view tool, std::span<const rule> rules) {
    to.open_object("driver");
    to.add_text("name", tool);
    to.add_text("semanticVersion", CDGEN_VERSION);
    to.add_text("version", CDGEN_VERSION);
    to.add_text("informationUri", "man:cdef(1)");
    to.open_list("rules");
    std::string line;
    for (const rule &known : rules) {
        line.clear();
        append_rule(line, known);
        to.add_json({}, line);
    }
    to.close();
    to.close();
}

void sarif_log::add(const json &result) {
    to.add_whole([&] { to.add_json({}, json_line(result)); });
}

void sarif_log::fail(const std::string &file, const std::string &why) {
    json notice;
    notice["level"] = "error";
    notice["message"]["text"] = why;
    json location;
    location["physicalLocation"]["artifactLocation"] = artifact_of(file);
    notice["locations"].push_back(std::move(location));
    unreadable.push_back(json_line(notice));
}

void sarif_log::add_invocation() {
    to.open_list("invocations");
    to.open_object();
    to.add_truth("executionSuccessful", unreadable.empty());
    if (!unreadable.empty()) {
        to.open_list("toolExecutionNotifications");
        for (const std::string &notice : unreadable)
            to.add_json({}, notice);
        to.close();
    }
    to.close();
    to.close();
}

void sarif_log::close() {
    to.close();
    add_invocation();
    for (int levels = 3; levels > 0; --levels)
        to.close();
}

std::unique_ptr<writer> sarif_form(output to) {
    return sarif_form(std::move(to), {});
}

std::unique_ptr<writer> sarif_form(output to, const std::vector<rule> &more) {
    return std::make_unique<sarif_writer>(std::move(to), more);
}

} // namespace report
