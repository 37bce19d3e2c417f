/* catalogue.cpp: the catalogue while a program runs: its rows, and looking names up in them. */

#include "language/catalogue_rows.h"

#include <cstring>

namespace {

using language::rows::catalogue;

constexpr name_index stanza_names(SC_COUNT, [](std::size_t i) { return std::string_view(catalogue[i].sc_name); });

/* The stanzas that the assembly reaches by index instead of by name. */
constexpr bool named(stanza_id id, std::string_view name) {
    return catalogue[id].sc_name == name;
}
static_assert(named(SC_RESOURCE_CLASS, "ResourceClass"), "ResourceClass table not found");
static_assert(named(SC_PERSISTENT_RESOURCE_ATTRIBUTE, "PersistentResourceAttribute"),
              "PersistentResourceAttribute table not found; PersistentResourceAttribute table missing");
static_assert(named(SC_PERSISTENT_CLASS_ATTRIBUTE, "PersistentClassAttribute"),
              "PersistentClassAttribute table not found");
static_assert(named(SC_DYNAMIC_RESOURCE_ATTRIBUTE, "DynamicResourceAttribute"),
              "DynamicResourceAttribute table not found");
static_assert(named(SC_DYNAMIC_CLASS_ATTRIBUTE, "DynamicClassAttribute"), "DynamicClassAttribute table not found");
static_assert(named(SC_RESOURCE_ACTION, "ResourceAction"), "Resource Action table not found");
static_assert(named(SC_CLASS_ACTION, "ClassAction"), "Class Action table not found");

} // namespace

constinit const std::array<srtable_ctrl, SC_COUNT + 1> sc_tables = catalogue;

int set_table_id(const char *name) {
    int id = stanza_names.candidate(name);
    return id >= 0 && std::strcmp(sc_tables[static_cast<std::size_t>(id)].sc_name, name) == 0 ? id : -1;
}

const table_attrs *find_attr(const srtable_ctrl &scp, std::string_view name) {
    int at = scp.sc_attr_names.candidate(name);
    if (at < 0)
        return nullptr;
    const table_attrs &attr = scp.sc_attrs[static_cast<std::size_t>(at)];
    return name.size() == attr.ta_length && std::memcmp(name.data(), attr.ta_name, attr.ta_length) == 0 ? &attr
                                                                                                        : nullptr;
}

const char *is_attr_SD(int table_id) {
    return std::strstr(sc_tables[static_cast<std::size_t>(table_id)].sc_name, "AttrSDDefinition");
}
