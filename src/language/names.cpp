/* names.cpp: the names that the catalogue has. */

#include "language/names.h"

#include "format/names.h"

#include <span>

namespace language {

namespace {

template <class Properties> name_list names_of(const Properties &properties) {
    name_list names;
    for (const props_t &property : properties)
        names.emplace_back(property.s);
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

name_list missing_names(const srtable_ctrl &kind, vx_uint32_t seen) {
    name_list names;
    for (const table_attrs &attr : kind.sc_attrs)
        if ((attr.req_bit & OPTIONAL) == 0 && (attr.req_bit & seen) == 0)
            names.emplace_back(attr.ta_name);
    return names;
}

} // namespace language
