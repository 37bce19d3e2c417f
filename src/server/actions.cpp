/* actions.cpp: changes that an editor offers at a place. */

#include "server/actions.h"

#include "check/fix.h"
#include "language/suggestions.h"
#include "server/examples.h"
#include "server/places.h"
#include "text/shown.h"
#include "text/unified_diff.h"

#include <algorithm>

namespace lsp {

namespace {

constexpr std::string_view QUICK_FIX = "quickfix";
constexpr std::string_view REWRITE = "refactor.rewrite";
constexpr std::string_view FIX_ALL = "source.fixAll.cdef";

/* The kinds that the client wants; null: it names none and wants all. */
const json *wanted_kinds(const json &params) {
    const json *context = optional_member(params, "context");
    const json *only = context == nullptr ? nullptr : optional_member(*context, "only");
    return only != nullptr && only->is_array() ? only : nullptr;
}

/* Whether the client asks for this kind, or for a kind that includes it, by name. */
bool is_named(const json &params, std::string_view kind) {
    const json *only = wanted_kinds(params);
    return only != nullptr && std::any_of(only->begin(), only->end(), [&](const json &each) {
               std::string wanted = each.is_string() ? each.get<std::string>() : std::string();
               return !wanted.empty() && (kind == wanted || kind.starts_with(wanted + "."));
           });
}

bool is_wanted(const json &params, std::string_view kind) {
    const json *only = wanted_kinds(params);
    return only == nullptr || is_named(params, kind) || std::find(only->begin(), only->end(), "") != only->end();
}

/* Collects the actions for a request. */
class collector {
public:
    collector(session &of, document &about, const json &asked)
        : now(of), in(about), params(asked),
          part(about.stretch_of(range_from(member(asked, "range")), of.client.units)) {}

    json collect() {
        if (is_wanted(params, QUICK_FIX)) {
            add_corrections();
            for (const source_index::stanza *each : stanzas_in_range()) {
                add_missing_lines(*each);
                add_free_number(*each);
            }
        }
        if (is_wanted(params, REWRITE))
            add_quotes();
        if (is_named(params, FIX_ALL)) /* it checks the source several times, too often for each move of a cursor */
            add_all_corrections();
        return std::move(all);
    }

private:
    json &add(std::string_view title, std::string_view kind, json edits) {
        all.push_back({{"title", title}, {"kind", kind}, {"edit", workspace_edit(now, in, std::move(edits))}});
        return all.back();
    }
    json edit(const stretch &at, std::string by) const {
        return byte_edit(in, now.client.units, at, std::move(by));
    }
    void add_corrections();
    std::vector<const source_index::stanza *> stanzas_in_range() const;
    void add_missing_lines(const source_index::stanza &of);
    void add_free_number(const source_index::stanza &of);
    void add_quotes();
    void add_all_corrections();

    session &now;
    document &in;
    const json &params;
    stretch part;
    json all = json::array();
};

std::string title_of(const check::finding &found) {
    const std::vector<check::edit> &edits = found.fix.edits;
    if (edits.size() != 1)
        return "Correct " + std::to_string(edits.size()) + " places";
    const check::edit &one = edits.front();
    auto shown = [](std::string_view text) {
        return text.find('\n') == text.npos ? language::quoted(text::escaped(text)) : std::string("a line");
    };
    if (one.text.find_first_not_of("\r\n") == std::string::npos)
        return one.removed.find_first_not_of("\r\n\t ") == std::string::npos ? "Remove blanks"
                                                                             : "Remove " + shown(one.removed);
    return one.removed.empty() ? "Insert " + shown(one.text)
                               : "Replace " + shown(one.removed) + " with " + shown(one.text);
}

/* Every correction that a finding in the range carries. */
void collector::add_corrections() {
    finding_places places(in.text());
    std::vector<check::finding> corrected;
    for (const check::finding &each : in.findings(now.settings.wanted_in(in.uri())))
        if (stretch at = places.of(each.at); !each.fix.edits.empty() && at.begin <= part.end && at.end >= part.begin)
            corrected.push_back(each);
    json shown = json::parse(diagnostics_text(in.text(), in.lines(), in.uri(), corrected, now.form(), {}));
    for (std::size_t i = 0; i < corrected.size(); ++i) {
        json edits = json::array();
        for (const check::edit &made : corrected[i].fix.edits)
            edits.push_back(byte_edit(in, now.client.units, places.of(made), made.text));
        json &action = add(title_of(corrected[i]), QUICK_FIX, std::move(edits));
        action["diagnostics"] = json::array({std::move(shown[i])});
        if (corrected[i].fix.sure == check::certainty::certain)
            action["isPreferred"] = true;
    }
}

/* Whether a stanza may continue after what looks like a header: an attribute in column 1, or the rest of a line that
 * the compiler reads in pieces. A missing attribute may be there. */
bool may_continue(document &in, const source_index::stanza &of) {
    const std::vector<source_index::stanza> &all = in.index().stanzas;
    auto next = std::find_if(all.begin(), all.end(), [&](const auto &each) { return each.first_line > of.first_line; });
    if (next == all.end() || next->is_known())
        return false;
    bool begins_line = in.text()[in.index().lines[next->first_line].whole.begin - 1] == '\n';
    return !begins_line || next->header.of(in.text()).find('=') != std::string_view::npos;
}

/* Whether a line of a stanza is not understood. It may be the missing one. */
bool has_unknown_line(const source_index::stanza &of) {
    return std::any_of(of.attributes.begin(), of.attributes.end(),
                       [](const source_index::attribute &each) { return each.known == nullptr; });
}

/* The line after which missing lines are inserted: the last required one in front of all optional ones. */
std::size_t line_before_missing(const source_index::stanza &of) {
    std::size_t line = of.first_line;
    for (const source_index::attribute &each : of.attributes) {
        if (each.known == nullptr || (each.known->req_bit & OPTIONAL) != 0)
            break;
        line = each.line;
    }
    return line;
}

/* The stanzas that the range touches. Of very many the first ones: each takes time, and nobody reads so long a list. */
std::vector<const source_index::stanza *> collector::stanzas_in_range() const {
    constexpr std::size_t STANZAS_MAX = 100;
    const source_index::index &index = in.index();
    std::vector<const source_index::stanza *> found;
    if (index.lines.empty())
        return found;
    std::size_t first = index.stanza_at(index.line_at(part.begin));
    std::size_t last = index.line_at(part.end);
    for (std::size_t at = first == source_index::NONE ? 0 : first; at < index.stanzas.size(); ++at) {
        const source_index::stanza &each = index.stanzas[at];
        if (each.first_line > last || found.size() == STANZAS_MAX)
            break;
        if (each.is_known())
            found.push_back(&each);
    }
    return found;
}

void collector::add_missing_lines(const source_index::stanza &of) {
    if (may_continue(in, of) || has_unknown_line(of))
        return;
    std::vector<const table_attrs *> missing = missing_in(of);
    if (missing.empty())
        return;
    std::string lines;
    language::name_list names;
    for (const table_attrs *each : missing) {
        lines += "\n\t" + std::string(each->ta_name) + "=" + example_value(in.text(), in.index(), of, *each);
        names.push_back(each->ta_name);
    }
    /* A long line has several in the index. */
    std::size_t end = in.text().find('\n', in.index().lines[line_before_missing(of)].whole.end);
    end = std::min(end, in.text().size());
    add("Add " + language::listed(names), QUICK_FIX, json::array({edit({end, end}, lines)}));
}

/* Whether the elements in front of one in its run have their right numbers. Otherwise theirs are corrected first. */
bool follows_right_elements(document &in, const source_index::stanza &element) {
    std::size_t number = 0;
    for (const source_index::stanza &each : in.index().stanzas) {
        if (&each == &element)
            return true;
        bool is_in_run = each.run == element.run && each.run != source_index::NONE;
        if (is_in_run && each.value(in.text(), "ElementIndex") != std::to_string(number++))
            return false;
    }
    return true;
}

void collector::add_free_number(const source_index::stanza &of) {
    const source_index::attribute *number = of.find(of.is_element() ? "ElementIndex" : "Id");
    if (number == nullptr || !number->parts.has_equals)
        return;
    const stretch &line = in.index().lines[number->line].whole;
    if (line.begin > part.end || line.end < part.begin)
        return;
    bool replaceable = of.is_element() ? follows_right_elements(in, of) : !in.index().is_free_id(in.text(), of);
    if (!replaceable)
        return;
    std::string next = example_value(in.text(), in.index(), of, *number->known);
    if (number->parts.value.of(in.text()) != next)
        add((of.is_element() ? "Use the element's place, " : "Use the next free number, ") + next, QUICK_FIX,
            json::array({edit(number->parts.value, next)}));
}

/* Only if the value is the same with quotes. */
void collector::add_quotes() {
    place_in_source place = place_at(in, part.begin);
    if (place.attribute == nullptr || place.attribute->parts.quoted || place.attribute->parts.value.is_empty())
        return;
    std::string_view value = place.attribute->parts.value.of(in.text());
    if (value.find_first_of("\"\r") != value.npos)
        return; /* only the compiler knows where such a value would end */
    const source_index::line &line = in.index().lines[place.line];
    std::string quotes = "\"" + std::string(value) + "\"";
    std::string after = in.text().substr(line.whole.begin, place.attribute->parts.value.begin - line.whole.begin) +
                        quotes + in.text().substr(line.text.end, line.whole.end - line.text.end);
    if (source_index::has_value(after, value))
        add("Put the value in quotes", REWRITE, json::array({edit(place.attribute->parts.value, quotes)}));
}

/* One edit for each run of changed lines. */
void collector::add_all_corrections() {
    const std::string &before = in.text();
    check::fixed_source fixed = check::fix_bytes(before, "source", now.settings.wanted_in(in.uri()));
    json edits = json::array();
    for (const text::line_change &each : text::changed_lines(before, fixed.text))
        edits.push_back(edit({each.begin, each.end}, std::string(each.by)));
    if (!edits.empty())
        add("Correct all that is certain", FIX_ALL, std::move(edits));
}

} // namespace

json code_actions(session &now, const json &params) {
    document &in = now.document_in(params);
    if (!now.client.literal_actions)
        return json::array();
    return collector(now, in, params).collect();
}

} // namespace lsp
