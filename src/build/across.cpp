/* across.cpp: conflicts between classes that are built together. */

#include "build/across.h"

#include "cdb_view.h"
#include "check/notes.h"
#include "language/suggestions.h"

#include <algorithm>
#include <utility>

namespace build {

namespace {

using check::mention;
using language::quoted;

mention found_in_file(const check::view &source, mention at) {
    source.line.find_in_file(at.at);
    return at;
}

/* The line of an attribute of the map, or nothing. */
mention map_line(const check::view &source, std::string_view attribute) {
    const mention *at = check::map_value(source.known, attribute);
    return at == nullptr ? mention() : found_in_file(source, *at);
}

mention on_line(const check::view &source, int line, std::string_view text) {
    return found_in_file(source, {{.line = line}, std::string(text), {}});
}

/* "a.cdefsrc:12" */
std::string place_of(const std::string &source, const mention &at) {
    int line = at.at.line;
    return source + (line == 0 ? "" : ":" + std::to_string(line));
}

check::elsewhere in_other(const std::string &source, const mention &at, std::string what) {
    return {source, {at.at, std::move(what), at.source}};
}

std::string keys_of(const mapping &map) {
    return std::to_string(map.first) + " to " + std::to_string(map.last);
}

} // namespace

/* If a class has two ResourceClass stanzas, only the place of the last class is known. */
class_facts facts_of(const check::view &source, std::span<const std::byte> image) {
    cdb::database db(image);
    class_facts facts;
    for (const auto &each : db.classes())
        facts.classes.push_back({{}, std::string(each.name()), {}});
    const std::vector<int> &lines = source.known.class_lines;
    if (!facts.classes.empty())
        facts.classes.back() = on_line(source, source.known.class_stanza().header.line, facts.classes.back().text);
    for (size_t i = 0; i + 1 < facts.classes.size() && lines.size() == facts.classes.size(); ++i)
        facts.classes[i] = on_line(source, lines[i], facts.classes[i].text);
    auto managers = db.managers().begin();
    for (const auto &each : db.maps()) {
        mention manager = map_line(source, "ResourceManager");
        manager.text = (*managers).name();
        facts.maps.push_back({std::string(each.message_catalog()), std::move(manager), map_line(source, "FirstKey"),
                              each.record().rcm_first_key, each.record().rcm_last_key});
    }
    for (const auto &each : db.variable_classes())
        facts.variable_classes.push_back({{{}, std::string(each.name()), {}},
                                          std::string(each.alias()),
                                          each.record().rvc_obsv_interval,
                                          each.record().rvc_report_interval});
    const check::kept_lines &names = source.known.variable_classes;
    for (size_t i = 0; i < names.size() && names.size() == facts.variable_classes.size(); ++i) {
        variable_class &named = facts.variable_classes[i];
        named.name = found_in_file(source, {names.at(i), named.name.text, std::string(names.line_of(i))});
    }
    return facts;
}

/* Reported once for each source; one report is enough to see that names or keys must change. */
void class_family::warn(check::warning_id id, const mention &at, std::string text, check::elsewhere other) {
    const check::warning &known = check::warnings[id];
    bool is_told =
        std::any_of(found.begin(), found.end(), [&](const check::finding &f) { return f.code == known.code; });
    if (!wanted[id] || is_told)
        return;
    check::finding one;
    one.error = false;
    one.code = known.code;
    one.name = known.name;
    one.text = std::move(text);
    one.at = at.at;
    one.source = at.source;
    one.others.push_back(std::move(other));
    found.push_back(std::move(one));
}

void class_family::look_at_name(const mention &name, const std::string &source) {
    auto [same, is_new] = classes.emplace(name.text, member<mention>{source, name});
    if (!is_new)
        warn(check::SHARED_NAME, name,
             "the class " + quoted(name.text) + " is also in " + place_of(same->second.source, same->second.fact),
             in_other(same->second.source, same->second.fact, "the other class " + quoted(name.text)));
}

void class_family::look_at_keys(const mapping &map) {
    for (const member<mapping> &other : maps[map.catalog])
        if (map.first <= other.fact.last && other.fact.first <= map.last)
            return warn(check::SHARED_KEYS, map.first_key,
                        "the keys " + keys_of(map) + " overlap " + keys_of(other.fact) + " in " +
                            place_of(other.source, other.fact.first_key) + ", which has the message catalog " +
                            quoted(map.catalog) + " too",
                        in_other(other.source, other.fact.first_key, "the keys " + keys_of(other.fact)));
}

void class_family::look_at_manager(const mapping &map) {
    for (const member<mapping> &other : maps[map.catalog])
        if (map.manager.text != other.fact.manager.text)
            return warn(check::OTHER_MANAGER, map.manager,
                        "classes with the message catalog " + quoted(map.catalog) + " have the manager " +
                            quoted(map.manager.text) + " here and " + quoted(other.fact.manager.text) + " in " +
                            place_of(other.source, other.fact.manager),
                        in_other(other.source, other.fact.manager, "the manager " + quoted(other.fact.manager.text)));
}

void class_family::look_at_variables(const variable_class &variables, const std::string &source) {
    auto [same, is_new] = variable_classes.emplace(variables.name.text, member<variable_class>{source, variables});
    const variable_class &other = same->second.fact;
    if (is_new || (other.observed == variables.observed && other.reported == variables.reported &&
                   other.alias == variables.alias))
        return;
    warn(check::OTHER_VARIABLE_CLASS, variables.name,
         "the variable class " + quoted(variables.name.text) + " has other intervals or another alias than in " +
             place_of(same->second.source, other.name),
         in_other(same->second.source, other.name, "the other variable class " + quoted(other.name.text)));
}

std::vector<check::finding> class_family::add(const std::string &source, const class_facts &facts,
                                              const check::warning_set &wanted_warnings) {
    wanted = wanted_warnings;
    for (const mention &name : facts.classes)
        look_at_name(name, source);
    for (const mapping &map : facts.maps) {
        look_at_keys(map);
        look_at_manager(map);
        maps[map.catalog].push_back({source, map});
    }
    for (const variable_class &variables : facts.variable_classes)
        look_at_variables(variables, source);
    return std::exchange(found, {});
}

} // namespace build
