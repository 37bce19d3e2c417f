/* rename.cpp: renames an attribute, an action, an element or a variable class. */

#include "server/rename.h"

#include "index/expressions.h"
#include "language/suggestions.h"
#include "server/places.h"

#include <algorithm>
#include <map>

namespace lsp {

namespace {

using source_index::mention;
using source_index::named;
using source_index::names;

/* The mention at a place if its name can be changed. Other programs use the name of the class. */
const mention *renamable_at(const place_in_source &place) {
    const mention *here = place.in.names().at(place.offset);
    if (here == nullptr || place.in.names().all[here->name].kind == source_index::name_kind::resource_class)
        return nullptr;
    return here;
}

struct replacement {
    stretch at;
    std::string text;
};

/* Whether the name is the whole value of its line, not a word of an expression. */
bool is_whole_value(document &in, const mention &each) {
    const source_index::attribute *line = in.index().attribute_at(in.index().line_at(each.at.begin));
    return line != nullptr && line->parts.value == each.at;
}

/* The text that replaces a mention: the new name, with quotes if it needs them. */
replacement written_at(document &in, const mention &each, std::string_view name) {
    const source_index::attribute *line = in.index().attribute_at(in.index().line_at(each.at.begin));
    bool keeps_quotes = !is_whole_value(in, each) || line->parts.quoted;
    return {each.at, keeps_quotes ? std::string(name) : source_index::written_value(name)};
}

std::string replaced(const std::string &text, const std::vector<replacement> &all) {
    std::string made;
    std::size_t done = 0;
    for (const replacement &each : all) {
        made.append(text, done, each.at.begin - done).append(each.text);
        done = each.at.end;
    }
    return made.append(text, done);
}

/* Whether mentions that had the same name in one source have the same name in the other, and no others. */
bool have_same_structure(const names &before, const names &after) {
    std::map<std::size_t, std::size_t> partner;
    std::map<std::size_t, std::size_t> taken;
    bool same = before.mentions.size() == after.mentions.size();
    for (std::size_t i = 0; same && i < before.mentions.size(); ++i) {
        const mention &a = before.mentions[i];
        const mention &b = after.mentions[i];
        same = a.defines == b.defines && a.stanza == b.stanza &&
               partner.try_emplace(a.name, b.name).first->second == b.name &&
               taken.try_emplace(b.name, a.name).first->second == a.name;
    }
    return same;
}

/* The first finding whose code occurs more often than before; null if there is none. */
const check::finding *new_finding(const std::vector<check::finding> &before, const std::vector<check::finding> &after) {
    std::map<std::string_view, int> known;
    for (const check::finding &each : before)
        ++known[each.code];
    for (const check::finding &each : after)
        if (--known[each.code] < 0)
            return &each;
    return nullptr;
}

void require_writable(const place_in_source &place, const named &old, const std::string &name) {
    if (name.empty() || name.find_first_of(std::string_view("\n\r\0", 3)) != std::string::npos)
        throw request_error(REQUEST_FAILED, "this is not a name");
    if (!source_index::has_value("\ta=\"" + name + "\"", name))
        throw request_error(REQUEST_FAILED, "a source cannot have " + language::quoted(name) + " as a name");
    if (old.in_expressions && !source_index::is_expression_name(name))
        throw request_error(REQUEST_FAILED, "an expression uses the name, and cannot have " + language::quoted(name));
    for (const named &each : place.in.names().all)
        if (each.kind == old.kind && each.scope == old.scope && each.text == name && name != old.text)
            throw request_error(REQUEST_FAILED, "there is " + language::quoted(name) + " already");
}

} // namespace

json prepare_rename(session &now, const json &params) {
    place_in_source place = place_in(now, params);
    const mention *here = renamable_at(place);
    if (here == nullptr)
        return nullptr;
    return {{"range", to_json(place.in.positions(now.client.units).of(here->at))},
            {"placeholder", place.in.names().all[here->name].text}};
}

json rename(session &now, const json &params) {
    place_in_source place = place_in(now, params);
    std::string name = text_member(params, "newName");
    const mention *here = renamable_at(place);
    if (here == nullptr)
        throw request_error(REQUEST_FAILED, "there is no name here that can be changed");
    require_writable(place, place.in.names().all[here->name], name);
    std::vector<replacement> all;
    for (const mention &each : place.in.names().of(here->name))
        all.push_back(written_at(place.in, each, name));
    document after(place.in.uri(), 0, replaced(place.text(), all));
    if (!have_same_structure(place.in.names(), after.names()))
        throw request_error(REQUEST_FAILED, "something else would have the name " + language::quoted(name));
    const check::warning_set &wanted = now.settings.wanted_in(place.in.uri());
    if (const check::finding *wrong = new_finding(place.in.findings(wanted), after.findings(wanted)))
        throw request_error(REQUEST_FAILED, std::string(wrong->code) + ": " + wrong->text);
    json edits = json::array();
    position_maker positions = place.in.positions(now.client.units);
    for (const replacement &each : all)
        edits.push_back(text_edit(positions, each.at, each.text));
    return workspace_edit(now, place.in, std::move(edits));
}

} // namespace lsp
