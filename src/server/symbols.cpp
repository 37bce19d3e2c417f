/* symbols.cpp: the outline of a document. */

#include "server/symbols.h"

#include "server/places.h"

#include <algorithm>
#include <cctype>
#include <map>

namespace lsp {

namespace {

using source_index::stanza;

constexpr int CLASS = 5;
constexpr int METHOD = 6;
constexpr int PROPERTY = 7;
constexpr int FIELD = 8;
constexpr int INTERFACE = 11;
constexpr int VARIABLE = 13;
constexpr int STRUCT = 23;

int kind_of(const stanza &of) {
    if (of.is_element())
        return FIELD;
    switch (of.kind) {
    case SC_PERSISTENT_RESOURCE_ATTRIBUTE:
    case SC_PERSISTENT_CLASS_ATTRIBUTE:
        return PROPERTY;
    case SC_DYNAMIC_RESOURCE_ATTRIBUTE:
    case SC_DYNAMIC_CLASS_ATTRIBUTE:
        return VARIABLE;
    case SC_CLASS_ACTION:
    case SC_RESOURCE_ACTION:
        return METHOD;
    case SC_RESOURCE_VARIABLE_CLASS:
        return STRUCT;
    case SC_CLASS_TO_MANAGER_MAPPING:
        return INTERFACE;
    default:
        return CLASS;
    }
}

/* The line that names a stanza; null if it has none. */
const source_index::attribute *name_of(const stanza &of) {
    for (const char *name : {"Name", "ElementName", "VariableClass", "ResourceManager"})
        if (const source_index::attribute *found = of.find(name); found != nullptr && !found->parts.value.is_empty())
            return found;
    return nullptr;
}

/* Builds an outline, in the order of the source. */
class outline {
public:
    outline(document &of, encoding units) : in(of), positions(of.positions(units)) {}

    json made() {
        for (std::size_t at = 0; at < in.index().stanzas.size(); ++at)
            if (in.index().stanzas[at].is_known())
                add(at);
        return nested(source_index::NONE);
    }

private:
    /* Elements belong to their attribute or action. */
    void add(std::size_t at) {
        const stanza &of = in.index().stanzas[at];
        children[of.is_element() ? of.owner : source_index::NONE].push_back(at);
    }

    json nested(std::size_t owner) {
        json all = json::array();
        for (std::size_t at : children[owner])
            all.push_back(symbol(at));
        return all;
    }

    json symbol(std::size_t at) {
        const stanza &of = in.index().stanzas[at];
        const source_index::attribute *name = name_of(of);
        stretch chosen = name == nullptr ? of.header : name->parts.value;
        stretch whole = in.index().extent_of(of);
        json made = {{"name", std::string((name == nullptr ? of.header : chosen).of(in.text()))},
                     {"detail", of.row().sc_name},
                     {"kind", kind_of(of)},
                     {"selectionRange", to_json(positions.of(chosen))}};
        if (auto elements = children.find(at); elements != children.end()) {
            whole.end = in.index().extent_of(in.index().stanzas[elements->second.back()]).end;
            made["children"] = nested(at);
        }
        made["range"] = to_json(positions.of(whole));
        return made;
    }

    document &in;
    position_maker positions;
    std::map<std::size_t, std::vector<std::size_t>> children; /* by owner; NONE: at the top level */
};

/* The same symbols as a flat list. */
void flatten(const json &nested, const std::string &uri, const std::string &container, json &to) {
    for (const json &each : nested) {
        json symbol = {{"name", each.at("name")},
                       {"kind", each.at("kind")},
                       {"location", {{"uri", uri}, {"range", each.at("range")}}}};
        if (!container.empty())
            symbol["containerName"] = container;
        to.push_back(std::move(symbol));
        if (each.contains("children"))
            flatten(each.at("children"), uri, each.at("name").get<std::string>(), to);
    }
}

std::string lower(std::string_view text) {
    std::string made(text);
    std::transform(made.begin(), made.end(), made.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return made;
}

} // namespace

json document_symbols(session &now, const json &params) {
    document &in = now.document_in(params);
    json nested = outline(in, now.client.units).made();
    if (now.client.nested_symbols)
        return nested;
    json flat = json::array();
    flatten(nested, in.uri(), {}, flat);
    return flat;
}

json symbols_called(document &in, std::string_view query, encoding units) {
    json found = json::array();
    position_maker positions = in.positions(units);
    const std::string wanted = lower(query);
    for (const source_index::mention &each : in.names().mentions) {
        const std::string &name = in.names().all[each.name].text;
        if (each.defines && lower(name).find(wanted) != std::string::npos)
            found.push_back({{"name", name},
                             {"kind", kind_of(in.index().stanzas[each.stanza])},
                             {"containerName", in.index().stanzas[each.stanza].row().sc_name},
                             {"location", {{"uri", in.uri()}, {"range", to_json(positions.of(each.at))}}}});
    }
    return found;
}

} // namespace lsp
