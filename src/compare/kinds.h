/* kinds.h: the kinds of records and entries that a database consists of. */
#ifndef CDGEN_COMPARE_KINDS_H
#define CDGEN_COMPARE_KINDS_H

#include "format/sections.h"

#include <string_view>

namespace compare {

enum class node_kind : std::uint8_t {
    database,
    /* The records of a class that have tables, in the order of cdb::side_tables. */
    persistent_class_attribute,
    dynamic_class_attribute,
    persistent_attribute,
    dynamic_attribute,
    class_action,
    action,
    error,
    dependency,
    /* Sections. */
    resource_class,
    manager,
    map,
    variable_class,
    class_hash,
    unused_section,
    empty_section,
    counters_section,
    /* Entries of lists. */
    variety,
    valid_value,
    element,
    variable,
    class_variable,
    hash_block
};

struct kind_row {
    node_kind kind;
    std::string_view text; /* its name in reports; empty: the name depends on the field that leads to it */
    bool is_looked_for;    /* true: readers look for one by its name or number */
};

constexpr kind_row row_of_section(node_kind kind, cdb_dsect_type_t type, bool is_looked_for = false) {
    return {kind, cdb::section_kinds[type].stanza, is_looked_for};
}

constexpr kind_row row_of_record(node_kind kind, bool is_looked_for) {
    constexpr auto FIRST = static_cast<std::size_t>(node_kind::persistent_class_attribute);
    return {kind, cdb::side_tables[static_cast<std::size_t>(kind) - FIRST].stanza, is_looked_for};
}

/* By kind. */
inline constexpr kind_row kinds[] = {
    {node_kind::database, "database", false},
    row_of_record(node_kind::persistent_class_attribute, true),
    row_of_record(node_kind::dynamic_class_attribute, true),
    row_of_record(node_kind::persistent_attribute, true),
    row_of_record(node_kind::dynamic_attribute, true),
    row_of_record(node_kind::class_action, true),
    row_of_record(node_kind::action, true),
    row_of_record(node_kind::error, false),
    row_of_record(node_kind::dependency, false),
    row_of_section(node_kind::resource_class, CDB_DSECT_CLASS, true),
    row_of_section(node_kind::manager, CDB_DSECT_RSRC_MGR),
    row_of_section(node_kind::map, CDB_DSECT_CMMAP),
    row_of_section(node_kind::variable_class, CDB_DSECT_VAR_CLASS),
    row_of_section(node_kind::class_hash, CDB_DSECT_CLASS_HASH),
    {node_kind::unused_section, "section of type 0", false},
    {node_kind::empty_section, "section of type 1", false},
    {node_kind::counters_section, "section of type 2", false},
    {node_kind::variety, cdb::list_kind_of(cdb::target::variety_lists).title, false},
    {node_kind::valid_value, cdb::list_kind_of(cdb::target::valid_vals).title, false},
    {node_kind::element, {}, false},
    {node_kind::variable, "variable", false},
    {node_kind::class_variable, "class variable", false},
    {node_kind::hash_block, "block", false},
};

consteval bool rows_are_by_kind() {
    for (std::size_t i = 0; i < std::size(kinds); ++i)
        if (kinds[i].kind != static_cast<node_kind>(i))
            return false;
    return std::size(kinds) == static_cast<std::size_t>(node_kind::hash_block) + 1;
}
static_assert(rows_are_by_kind());

constexpr const kind_row &row_of(node_kind kind) {
    return kinds[static_cast<std::size_t>(kind)];
}
static_assert(row_of(node_kind::persistent_class_attribute).text == "PersistentClassAttribute");
static_assert(row_of(node_kind::dependency).text == "dependency");

} // namespace compare

#endif
