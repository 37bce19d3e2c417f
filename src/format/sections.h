/* sections.h: the kinds of sections, and the tables inside a class section. */
#ifndef CDGEN_FORMAT_SECTIONS_H
#define CDGEN_FORMAT_SECTIONS_H

#include "format/records.h"

namespace cdb {

/* ---- Sections -------------------------------------------------------------------------------------------------- */

struct section_kind {
    cdb_dsect_type_t type;
    std::string_view spelling;
    const record_format *root = nullptr; /* the record at its start; null: files have no such sections */
    std::string_view key = {};           /* in JSON */
    std::string_view title = {};         /* in words */
    std::string_view stanza = {};        /* the kind of its record, as a source and a comparison call it */
    int rank = 0;                        /* its place in the order of sections */
};

/* By type. */
inline constexpr section_kind section_kinds[] = {
    {CDB_DSECT_UNUSED, "CDB_DSECT_UNUSED"},
    {CDB_DSECT_EMPTY, "CDB_DSECT_EMPTY"},
    {CDB_DSECT_TBL_CNTRS, "CDB_DSECT_TBL_CNTRS"},
    {CDB_DSECT_RSRC_MGR, "CDB_DSECT_RSRC_MGR", &format_for<rsrc_mgr_t>, "manager", "manager", "ResourceManager", 1},
    {CDB_DSECT_VAR_CLASS, "CDB_DSECT_VAR_CLASS", &format_for<rsrc_variable_class_t>, "variable_class", "variable class",
     "ResourceVariableClass", 3},
    {CDB_DSECT_CLASS, "CDB_DSECT_CLASS", &format_for<rsrc_class_t>, "class", "class", "ResourceClass", 0},
    {CDB_DSECT_CMMAP, "CDB_DSECT_CMMAP", &format_for<rsrc_cmmap_t>, "map", "map", "ClassToManagerMapping", 2},
    {CDB_DSECT_CLASS_HASH, "CDB_DSECT_CLASS_HASH", &format_for<rsrc_class_hash_t>, "class_hash", "class hash",
     "class hash", 4},
};

consteval bool kinds_are_by_type() {
    for (std::size_t i = 0; i < std::size(section_kinds); ++i)
        if (section_kinds[i].type != i)
            return false;
    return true;
}
static_assert(kinds_are_by_type());

/* The kind of sections of this type; null if files have no such sections. */
constexpr const section_kind *kind_of(std::uint32_t type) {
    bool known = type < std::size(section_kinds) && section_kinds[type].root != nullptr;
    return known ? &section_kinds[type] : nullptr;
}

/* The type of the sections that have this place in the order. */
constexpr cdb_dsect_type_t type_of_rank(int rank) {
    return std::find_if(std::begin(section_kinds), std::end(section_kinds),
                        [rank](const section_kind &k) { return k.root != nullptr && k.rank == rank; })
        ->type;
}

/* ---- The tables of a class ------------------------------------------------------------------------------------- */

/* How a table is written to the file. */
enum class table_form : std::uint8_t {
    LOCATED,   /* its offset is recorded */
    UNLOCATED, /* deliberately not */
    ROUNDED    /* recorded, and filled with zeros to a multiple of 8 */
};

inline constexpr int NOT_COUNTED = -1;

struct side_table {
    cdb_ref_t rsrc_class_t::*ref;      /* its offset in the section */
    cdb_uint16_t rsrc_class_t::*count; /* of its records; null: not a table of records */
    cdb_uint32_t rsrc_class_t::*bytes; /* its size; null: it has a count, or ends the section */
    const record_format *record;       /* of one record; null: likewise */
    const char *trace_name;            /* as the compiler's traces call it */
    std::size_t growth;                /* bytes by which the compiler lets it grow */
    int made;                          /* its place in the order in which the compiler makes them */
    int counted; /* its place in the order in which the compiler counts them. If several tables are too large, it names
                  * the first of them. NOT_COUNTED: the record does not hold its size, or deliberately holds 0 */
    table_form form = table_form::LOCATED;
    std::string_view key = {};    /* in JSON */
    std::string_view title = {};  /* of a record, in words */
    std::string_view stanza = {}; /* of a record */

    /* The size of the table in bytes according to the class record; 0 for the strings, whose size is not recorded. */
    constexpr std::uint64_t size_in(const rsrc_class_t &rc) const {
        return count != nullptr ? std::uint64_t{rc.*count} * record->size : bytes != nullptr ? rc.*bytes : 0;
    }
};

/* In the order of the file. */
inline constexpr side_table side_tables[] = {
    {&rsrc_class_t::u_rc_pattrsC, &rsrc_class_t::rc_num_pattrsC, nullptr, &format_for<rsrc_pattr_t>, "ClassPattrsC",
     16 * sizeof(rsrc_pattr_t), 0, 0, table_form::LOCATED, "persistent_class_attributes", "persistent class attribute",
     "PersistentClassAttribute"},
    {&rsrc_class_t::u_rc_dattrsC, &rsrc_class_t::rc_num_dattrsC, nullptr, &format_for<rsrc_dattr_t>, "ClassDattrsC",
     16 * sizeof(rsrc_dattr_t), 1, 2, table_form::LOCATED, "dynamic_class_attributes", "dynamic class attribute",
     "DynamicClassAttribute"},
    {&rsrc_class_t::u_rc_pattrs, &rsrc_class_t::rc_num_pattrs, nullptr, &format_for<rsrc_pattr_t>, "ClassPattrs",
     16 * sizeof(rsrc_pattr_t), 2, 1, table_form::LOCATED, "persistent_resource_attributes",
     "persistent resource attribute", "PersistentResourceAttribute"},
    {&rsrc_class_t::u_rc_dattrs, &rsrc_class_t::rc_num_dattrs, nullptr, &format_for<rsrc_dattr_t>, "ClassDattrs",
     16 * sizeof(rsrc_dattr_t), 3, 3, table_form::LOCATED, "dynamic_resource_attributes", "dynamic resource attribute",
     "DynamicResourceAttribute"},
    {&rsrc_class_t::u_rc_actionsC, &rsrc_class_t::rc_num_actionsC, nullptr, &format_for<rsrc_action_t>, "ClassActionsC",
     4 * sizeof(rsrc_action_t), 4, 5, table_form::LOCATED, "class_actions", "class action", "ClassAction"},
    {&rsrc_class_t::u_rc_actions, &rsrc_class_t::rc_num_actions, nullptr, &format_for<rsrc_action_t>, "ClassActions",
     4 * sizeof(rsrc_action_t), 5, 6, table_form::LOCATED, "resource_actions", "resource action", "ResourceAction"},
    {&rsrc_class_t::u_rc_errors, &rsrc_class_t::rc_num_errors, nullptr, &format_for<rsrc_error_t>, "ClassErrors",
     4 * sizeof(rsrc_error_t), 6, NOT_COUNTED, table_form::UNLOCATED, "errors", "error", "error"},
    {&rsrc_class_t::u_rc_depends, &rsrc_class_t::rc_num_depends, nullptr, &format_for<rsrc_depend_t>, "ClassDepends",
     4 * sizeof(rsrc_depend_t), 7, NOT_COUNTED, table_form::UNLOCATED, "dependencies", "dependency", "dependency"},
    {&rsrc_class_t::u_rc_variety_lists, nullptr, &rsrc_class_t::rc_varlist_size, nullptr, "ClassVarietyList",
     4 * sizeof(variety_list_t), 10, 7},
    {&rsrc_class_t::u_rc_sbs_defs, nullptr, &rsrc_class_t::rc_sbs_size, nullptr, "ClassSBSDefs", 8 * sizeof(sbs_def_t),
     8, NOT_COUNTED, table_form::UNLOCATED},
    {&rsrc_class_t::u_rc_sd_defs, nullptr, &rsrc_class_t::rc_sd_size, nullptr, "ClassSDDefs", 4 * sizeof(sd_def_t), 12,
     4},
    {&rsrc_class_t::u_rc_valid_vals, nullptr, &rsrc_class_t::rc_valval_size, nullptr, "ClassValidVals",
     8 * sizeof(valid_values_t), 9, 8},
    {&rsrc_class_t::u_rc_strings, nullptr, nullptr, nullptr, "ClassStrings", 8192, 11, NOT_COUNTED,
     table_form::ROUNDED},
};

/* How many of these are tables of records. They come first, and the first four are tables of attributes. */
inline constexpr std::size_t TABLES_OF_RECORDS = static_cast<std::size_t>(std::count_if(
    std::begin(side_tables), std::end(side_tables), [](const side_table &t) { return t.count != nullptr; }));
inline constexpr std::size_t TABLES_OF_ATTRIBUTES = 4;

/* In the order in which the compiler makes them. */
inline constexpr std::array side_tables_as_made = [] {
    std::array<side_table, std::size(side_tables)> sorted = {};
    std::copy(std::begin(side_tables), std::end(side_tables), sorted.begin());
    std::sort(sorted.begin(), sorted.end(), [](const side_table &a, const side_table &b) { return a.made < b.made; });
    return sorted;
}();

/* In the order in which the compiler counts them, without those that it does not count. */
inline constexpr std::array side_tables_as_counted = [] {
    constexpr auto COUNT = static_cast<std::size_t>(std::count_if(
        std::begin(side_tables), std::end(side_tables), [](const side_table &t) { return t.counted != NOT_COUNTED; }));
    std::array<side_table, COUNT> sorted = {};
    std::copy_if(std::begin(side_tables), std::end(side_tables), sorted.begin(),
                 [](const side_table &t) { return t.counted != NOT_COUNTED; });
    std::sort(sorted.begin(), sorted.end(),
              [](const side_table &a, const side_table &b) { return a.counted < b.counted; });
    return sorted;
}();

/* ---- The lists in a class's tables ----------------------------------------------------------------------------- */

struct list_kind {
    target to;                  /* the table that has such lists */
    const record_format *head;  /* identifier and count */
    const record_format *entry; /* follows count times */
    vx_uint32_t id;
    std::string_view title; /* of an entry, in words */
};

inline constexpr list_kind list_kinds[] = {
    {target::variety_lists, &format_for<variety_list_t>, &format_for<vl_entry_t>, CDB_ID_VARIETY_LIST, "variety"},
    {target::valid_vals, &format_for<valid_values_t>, &format_for<vv_entry_t>, CDB_ID_VALID_VALUES, "valid value"},
    {target::sd_defs, &format_for<sd_def_t>, &format_for<sd_field_t>, CDB_ID_SD_DEF, "element"},
};

/* In all three. */
inline constexpr std::size_t LIST_COUNT = 4; /* offset of the count */
inline constexpr std::size_t LIST_HEAD = 8;  /* bytes before the first entry */
static_assert(offsetof(variety_list_t, vl_values) == LIST_HEAD && offsetof(variety_list_t, vl_count) == LIST_COUNT);
static_assert(offsetof(valid_values_t, vv_values) == LIST_HEAD && offsetof(valid_values_t, vv_count) == LIST_COUNT);
static_assert(offsetof(sd_def_t, sd_fields) == LIST_HEAD && offsetof(sd_def_t, sd_count) == LIST_COUNT);

/* Of the lists that a reference leads to; it must lead to lists. */
constexpr const list_kind &list_kind_of(target to) {
    return *std::find_if(std::begin(list_kinds), std::end(list_kinds), [to](const list_kind &k) { return k.to == to; });
}

} // namespace cdb

#endif
