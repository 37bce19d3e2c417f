/* names.cpp: the names in the catalogue. */

#include "language/names.h"

#include "format/names.h"

#include <algorithm>
#include <span>
#include <tuple>
#include <utility>

namespace language {

namespace {

template <class Properties> name_list names_of(const Properties &properties) {
    name_list names;
    for (const props_t &property : properties)
        names.emplace_back(property.s);
    return names;
}

/* An attribute, and the attribute with the same purpose in other kinds. */
constexpr std::pair<std::string_view, std::string_view> sisters[] = {
    {"Name", "ElementName"},
    {"Name", "VariableClass"},
    {"ElementName", "Name"},
    {"Id", "ElementIndex"},
    {"ElementIndex", "Id"},
    {"DefaultValue", "InitialValue"},
    {"InitialValue", "DefaultValue"},
    {"ValidValue", "ValidStateValue"},
    {"ValidStateValue", "ValidValue"},
    {"Permission", "ClassPermTemplate"},
    {"Permission", "ResourcePermTemplate"},
    {"ClassPermTemplate", "Permission"},
    {"ResourcePermTemplate", "Permission"},
};

/* The attributes of a kind that have the same purpose as an attribute of another kind. */
name_list sisters_of(std::string_view attribute, const srtable_ctrl &kind) {
    name_list found;
    for (const auto &[other, here] : sisters)
        if (other == attribute && find_attr(kind, here) != nullptr)
            found.push_back(here);
    return found;
}

/* The attribute names of all kinds, each once. */
name_list all_attribute_names() {
    name_list names;
    for (const srtable_ctrl &kind : std::span(sc_tables).first(SC_COUNT))
        for (const table_attrs &attr : kind.sc_attrs)
            if (std::find(names.begin(), names.end(), attr.ta_name) == names.end())
                names.emplace_back(attr.ta_name);
    return names;
}

} // namespace

name_list stanza_names() {
    name_list names;
    for (const srtable_ctrl &kind : std::span(sc_tables).first(SC_COUNT))
        names.emplace_back(kind.sc_name);
    return names;
}

name_list attribute_names(const srtable_ctrl &kind) {
    name_list names;
    for (const table_attrs &attr : kind.sc_attrs)
        names.emplace_back(attr.ta_name);
    return names;
}

guess attribute_meant_by(std::string_view text, const srtable_ctrl &kind) {
    name_list known = attribute_names(kind);
    if (!near_miss(text, known).empty())
        return meant_by(text, known);
    if (kinds_with(text).any())
        return {sisters_of(text, kind)};
    guess part = meant_by(text, known);
    return part.names.empty() ? guess{sisters_of(meant_by(text, all_attribute_names()).name(), kind)} : part;
}

kind_set kinds_with(std::string_view attribute) {
    kind_set kinds;
    for (size_t kind = 0; kind < SC_COUNT; ++kind)
        kinds[kind] = find_attr(sc_tables[kind], attribute) != nullptr;
    return kinds;
}

name_list property_names(int attr_type) {
    switch (attr_type) {
    case AT_CLASS_PROPS:
        return names_of(rc_props);
    case AT_PATTR_PROPS:
        return names_of(pa_props);
    case AT_DATTR_PROPS:
        return names_of(da_props);
    default:
        return names_of(act_props);
    }
}

bool comes_before(const table_attrs &one, const table_attrs &other) {
    auto rank = [](const table_attrs &attr) {
        bool required = (attr.req_bit & OPTIONAL) == 0;
        bool is_name = std::string_view(attr.ta_name) == "Name";
        return required ? std::tuple(0, attr.dup_allowed, attr.req_bit, static_cast<const table_attrs *>(nullptr))
                        : std::tuple(1, is_name ? 0 : 1, vx_uint32_t{0}, &attr);
    };
    return rank(one) < rank(other);
}

std::vector<const table_attrs *> in_usual_order(const srtable_ctrl &kind) {
    std::vector<const table_attrs *> all;
    for (const table_attrs &attr : kind.sc_attrs)
        all.push_back(&attr);
    std::stable_sort(all.begin(), all.end(), [](const auto *a, const auto *b) { return comes_before(*a, *b); });
    return all;
}

name_list missing_names(const srtable_ctrl &kind, vx_uint32_t seen) {
    name_list names;
    for (const table_attrs &attr : kind.sc_attrs)
        if ((attr.req_bit & OPTIONAL) == 0 && (attr.req_bit & seen) == 0)
            names.emplace_back(attr.ta_name);
    return names;
}

} // namespace language
