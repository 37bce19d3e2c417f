/* places.cpp: finds the lines of a source that a difference between databases is about. */

#include "gate/places.h"

#include "compare/identity.h"
#include "compare/writer.h"

#include <algorithm>
#include <iterator>
#include <vector>

namespace gate {

namespace {

using compare::node;
using compare::node_kind;
using source_index::stanza;

/* Whether a word is one of those in a list, which blanks separate. */
bool has_word(std::string_view list, std::string_view word) {
    for (std::size_t begin = 0; begin < list.size();) {
        std::size_t end = std::min(list.find(' ', begin), list.size());
        if (list.substr(begin, end - begin) == word)
            return true;
        begin = end + 1;
    }
    return false;
}

/* A removed part is no longer in the source, so its place is that of its owner. */
std::span<const node *const> what_is_left(const compare::difference &d) {
    return d.what == compare::change::REMOVED ? d.path.first(d.path.size() - 1) : d.path;
}

/* A class without a ResourceClass has only the other one. */
const stanza *first_class_of(const std::vector<stanza> &stanzas) {
    for (int kind : {SC_RESOURCE_CLASS, SC_CONTROL_DEFINITION})
        for (const stanza &each : stanzas)
            if (each.kind == kind)
                return &each;
    return nullptr;
}

bool is_class(const stanza &one) {
    return one.kind == SC_RESOURCE_CLASS || one.kind == SC_CONTROL_DEFINITION;
}

} // namespace

int stanza_kind_of(node_kind kind) {
    switch (kind) {
    case node_kind::persistent_attribute:
        return SC_PERSISTENT_RESOURCE_ATTRIBUTE;
    case node_kind::persistent_class_attribute:
        return SC_PERSISTENT_CLASS_ATTRIBUTE;
    case node_kind::dynamic_attribute:
        return SC_DYNAMIC_RESOURCE_ATTRIBUTE;
    case node_kind::dynamic_class_attribute:
        return SC_DYNAMIC_CLASS_ATTRIBUTE;
    case node_kind::action:
        return SC_RESOURCE_ACTION;
    case node_kind::class_action:
        return SC_CLASS_ACTION;
    default:
        return source_index::UNKNOWN_KIND;
    }
}

const source_places::tables &source_places::lookup() const {
    if (made)
        return *made;
    tables &to = made.emplace(tables{.by_name = {}, .newlines = {}, .first_class = first_class_of(parts.stanzas)});
    for (std::size_t i = 0; i < parts.stanzas.size(); ++i) {
        const stanza &each = parts.stanzas[i];
        to.by_name.push_back({each.kind, each.value(source, each.is_element() ? "ElementName" : "Name"), i});
    }
    std::sort(to.by_name.begin(), to.by_name.end());
    for (std::size_t i = source.find('\n'); i != std::string_view::npos; i = source.find('\n', i + 1))
        to.newlines.push_back(i);
    return to;
}

/* from: a position in the index. */
const stanza *source_places::first_called(int kind, std::string_view name, std::size_t from) const {
    const std::vector<called_stanza> &all = lookup().by_name;
    auto found = std::lower_bound(all.begin(), all.end(), called_stanza{kind, name, from});
    bool is_called = found != all.end() && found->kind == kind && found->name == name;
    return is_called ? &parts.stanzas[found->position] : nullptr;
}

std::size_t source_places::begin_of_class(int class_number) const {
    auto first = std::partition_point(parts.stanzas.begin(), parts.stanzas.end(),
                                      [=](const stanza &each) { return each.class_number < class_number; });
    return static_cast<std::size_t>(first - parts.stanzas.begin());
}

located source_places::at(const source_index::span &part, std::size_t line) const {
    const source_index::span &whole = parts.lines[line].whole;
    const std::vector<std::size_t> &newlines = lookup().newlines;
    auto next = std::lower_bound(newlines.begin(), newlines.end(), part.begin);
    std::size_t begin = next == newlines.begin() ? 0 : *std::prev(next) + 1; /* of the line in the file */
    check::place place = {.line = static_cast<int>(line) + 1,
                          .column = part.begin - whole.begin + 1,
                          .length = part.end - part.begin,
                          .file_line = static_cast<int>(next - newlines.begin()) + 1,
                          .file_column = part.begin - begin + 1};
    return {place, std::string(whole.of(source))};
}

located source_places::of_header(const stanza &of) const {
    return at(of.header, of.first_line);
}

/* names: of attributes; the first one in the stanza. Many differences may be about the same line. */
const source_index::attribute *source_places::first_attribute(const stanza &in, std::string_view names) const {
    auto [found, is_new] = attributes.try_emplace({&in, names}, nullptr);
    if (!is_new)
        return found->second;
    auto first = std::find_if(in.attributes.begin(), in.attributes.end(), [names](const auto &each) {
        return each.known != nullptr && has_word(names, each.known->ta_name);
    });
    if (first != in.attributes.end())
        found->second = &*first;
    return found->second;
}

located source_places::of_attribute(const stanza &in, std::string_view names) const {
    const source_index::attribute *first = first_attribute(in, names);
    if (first == nullptr)
        return of_header(in);
    return at(first->parts.value.is_empty() ? first->parts.name : first->parts.value, first->line);
}

/* class_number: 0 is any class. */
const stanza *source_places::named(int kind, std::string_view name, int class_number) const {
    const stanza *found = first_called(kind, name, begin_of_class(class_number));
    bool is_in_class = found != nullptr && (class_number == 0 || found->class_number == class_number);
    return is_in_class ? found : nullptr;
}

/* A class without a name, or of another one, is the only one or the first one. */
const stanza *source_places::class_stanza(std::string_view name) const {
    const stanza *found = named(SC_RESOURCE_CLASS, name, 0);
    return found != nullptr ? found : lookup().first_class;
}

/* owner: the stanza of an attribute or action, which its elements follow; that of a class owns its inputs. */
const stanza *source_places::element(const node &part, const stanza *owner) const {
    std::string_view name = compare::identity_of(part).name;
    bool is_input = is_class(*owner);
    std::size_t from =
        is_input ? begin_of_class(owner->class_number) : static_cast<std::size_t>(owner - parts.stanzas.data());
    const stanza *first = owner;
    for (int kind = 0; kind < SC_COUNT; ++kind) {
        const srtable_ctrl &row = sc_tables[static_cast<std::size_t>(kind)];
        if (row.sc_sd_owner == nullptr || !has_word(part.field->lines, row.sc_name))
            continue;
        const stanza *found = first_called(kind, name, from);
        if (found == nullptr)
            continue;
        bool is_owned = is_input ? found->class_number == owner->class_number : found->owner == from;
        if (is_owned && (first == owner || found < first))
            first = found;
    }
    return first;
}

/* The stanza of the deepest part that has one. path: from the database. */
const stanza *source_places::stanza_of(std::span<const node *const> path) const {
    const stanza *found = nullptr;
    for (const node *part : path) {
        std::string_view name = compare::has_name(*part) ? compare::identity_of(*part).name : std::string_view();
        int kind = stanza_kind_of(part->kind);
        if (part->kind == node_kind::resource_class)
            found = class_stanza(name);
        else if (kind != source_index::UNKNOWN_KIND && found != nullptr)
            if (const stanza *one = named(kind, name, found->class_number))
                found = one;
        if (part->kind == node_kind::element && part->field != nullptr && found != nullptr)
            found = element(*part, found);
    }
    return found != nullptr ? found : class_stanza({});
}

located source_places::of(const compare::difference &d) const {
    std::vector<const node *> path(what_is_left(d).begin(), what_is_left(d).end());
    if (d.what == compare::change::RENAMED)
        path.back() = d.renamed_to;
    const stanza *found = stanza_of(path);
    if (found == nullptr)
        return {};
    if (d.what == compare::change::CHANGED && d.before->what == &compare::ELEMENT_INDEX)
        return of_attribute(*found, "ElementIndex");
    if (d.what == compare::change::CHANGED)
        return of_attribute(*found, d.before->what->lines);
    if (d.path.back()->kind == node_kind::valid_value)
        return of_attribute(*found, "ValidValue ValidStateValue");
    if (d.path.back()->kind == node_kind::variety)
        return of_attribute(*found, "VarietyRange");
    return d.what == compare::change::RENAMED ? of_attribute(*found, "Name") : of_header(*found);
}

located source_places::of(int kind, std::string_view name, std::string_view attribute) const {
    const stanza *found = named(kind, name, 0);
    if (found == nullptr)
        found = class_stanza({});
    return found == nullptr ? located() : of_attribute(*found, attribute);
}

} // namespace gate
