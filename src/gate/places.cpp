/* places.cpp: finds the lines of a source that a difference between databases is about. */

#include "gate/places.h"

#include "compare/identity.h"
#include "compare/writer.h"

#include <algorithm>
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

located source_places::at(const source_index::span &part, std::size_t line) const {
    const source_index::span &whole = parts.lines[line].whole;
    std::string_view before = source.substr(0, part.begin);
    check::place place = {.line = static_cast<int>(line) + 1,
                          .column = part.begin - whole.begin + 1,
                          .length = part.end - part.begin,
                          .file_line = static_cast<int>(std::count(before.begin(), before.end(), '\n')) + 1,
                          .file_column = before.size() - before.rfind('\n')};
    return {place, std::string(whole.of(source))};
}

located source_places::of_header(const stanza &of) const {
    return at(of.header, of.first_line);
}

/* names: of attributes; the first line that gives one of them. */
located source_places::of_attribute(const stanza &in, std::string_view names) const {
    for (const source_index::attribute &each : in.attributes)
        if (each.known != nullptr && has_word(names, each.known->ta_name))
            return at(each.parts.value.is_empty() ? each.parts.name : each.parts.value, each.line);
    return of_header(in);
}

const stanza *source_places::named(int kind, std::string_view name, int class_number) const {
    for (const stanza &each : parts.stanzas)
        if (each.kind == kind && each.value(source, "Name") == name &&
            (class_number == 0 || each.class_number == class_number))
            return &each;
    return nullptr;
}

/* A class without a name, or of another one, is the only one or the first one. */
const stanza *source_places::class_stanza(std::string_view name) const {
    if (const stanza *found = named(SC_RESOURCE_CLASS, name, 0))
        return found;
    for (int kind : {SC_RESOURCE_CLASS, SC_CONTROL_DEFINITION})
        for (const stanza &each : parts.stanzas)
            if (each.kind == kind)
                return &each;
    return nullptr;
}

/* owner: the stanza of an attribute or action; that of a class owns its inputs. */
const stanza *source_places::element(const node &part, const stanza *owner) const {
    std::string_view name = compare::identity_of(part).name;
    bool is_input = owner->kind == SC_RESOURCE_CLASS || owner->kind == SC_CONTROL_DEFINITION;
    for (const stanza &each : parts.stanzas) {
        bool is_owned = is_input ? each.class_number == owner->class_number
                                 : each.owner != source_index::NONE && &parts.stanzas[each.owner] == owner;
        if (each.is_element() && is_owned && has_word(part.field->lines, each.row().sc_name) &&
            each.value(source, "ElementName") == name)
            return &each;
    }
    return owner;
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
