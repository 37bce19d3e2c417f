/* node.cpp: the records of a database and the entries of its lists, as nodes for comparisons. */

#include "compare/node.h"

#include "format/sections.h"
#include "reader/tables.h"

namespace compare {

namespace {

/* True if a field may lead to a list whose entries are parts. Most fields do not. */
bool may_lead_to_parts(const cdb::field &f) {
    return f.kind == cdb::field_kind::reference &&
           (f.to == cdb::target::variety_lists || f.to == cdb::target::valid_vals || f.to == cdb::target::sd_defs);
}

/* The lists that fields of a record lead to, and the tables that follow it. */
class family_finder {
public:
    family_finder(const node &of, families &found) : n(of), to(found) {}

    void find() {
        if (n.format != nullptr)
            add_lists();
        if (n.kind == node_kind::resource_class)
            add_tables();
        if (n.kind == node_kind::variable_class)
            add_variables();
        if (n.kind == node_kind::class_hash)
            add_blocks();
    }

private:
    const cdb::class_tables &tables() const {
        return n.section->tables;
    }

    /* A part of the same section. */
    node part(node_kind kind, const cdb::record_format *format, const cdb::bytes &area, std::size_t at) const {
        return {.kind = kind, .from = n.from, .format = format, .area = area, .at = at, .section = n.section};
    }

    /* Entries begin after the list's header. A list that belongs to another record counts as empty here. */
    void add_entries(const node &first, const cdb::field &f) {
        std::uint32_t place = number_in(n, f);
        bool has_list =
            place != CDB_NONE && (f.to != cdb::target::valid_vals || n.from->owners.is_own(n.area, n.at + f.offset));
        std::size_t size = cdb::list_kind_of(f.to).entry->size;
        std::size_t count = !has_list
                                ? 0
                                : cdb::count_inside(first.area, first.at,
                                                    first.area.number<std::uint32_t>(place + cdb::LIST_COUNT), size);
        to.add({first, count, size});
    }

    void add_lists() {
        std::span<const cdb::field> fields = n.format->fields;
        for (const cdb::field &f : fields)
            if (may_lead_to_parts(f))
                add_list(f, n.format->facts[static_cast<std::size_t>(&f - fields.data())]);
    }

    void add_list(const cdb::field &f, const cdb::field_fact &what) {
        if (what.is == cdb::role::LAYOUT || what.as == cdb::meaning::UNUSED)
            return;
        std::size_t entries = std::size_t{number_in(n, f)} + cdb::LIST_HEAD;
        if (f.to == cdb::target::variety_lists)
            add_entries(part(node_kind::variety, nullptr, tables().variety_lists, entries), f);
        if (f.to == cdb::target::valid_vals) {
            node first = part(node_kind::valid_value, &cdb::format_for<vv_entry_t>, tables().valid_vals, entries);
            first.type = cdb::element_type(data_type_of(n));
            add_entries(first, f);
        }
        if (f.to == cdb::target::sd_defs) {
            node first = part(node_kind::element, &cdb::format_for<sd_field_t>, tables().sd_defs, entries);
            first.field = &what;
            add_entries(first, f);
        }
    }

    /* Attributes and actions of resources come before those of the class, unlike in the file. */
    void add_tables() {
        using enum node_kind;
        constexpr node_kind order[] = {persistent_attribute,
                                       persistent_class_attribute,
                                       dynamic_attribute,
                                       dynamic_class_attribute,
                                       action,
                                       class_action,
                                       error,
                                       dependency};
        auto rc = n.area.record<rsrc_class_t>(0);
        for (node_kind kind : order) {
            const cdb::side_table &table =
                cdb::side_tables[static_cast<std::size_t>(kind) - static_cast<std::size_t>(persistent_class_attribute)];
            const cdb_ref_t &ref = rc.*table.ref;
            bool may_have_no_place = kind == error || kind == dependency;
            std::size_t count = may_have_no_place ? cdb::count_placed(n.area, ref, rc.*table.count, table.record->size)
                                                  : std::size_t{rc.*table.count};
            to.add({part(kind, table.record, n.area, ref.offset[0]), count, table.record->size});
        }
    }

    void add_variables() {
        cdb::variable_class view(n.area);
        std::size_t first = sizeof(rsrc_variable_class_t) + view.record().u_rvc_string_tbl.offset[0];
        to.add({part(node_kind::variable, nullptr, n.area, first), view.variable_ids().size(), cdb::variable_id::SIZE});
    }

    void add_blocks() {
        std::size_t first = offsetof(rsrc_class_hash_t, rc_hash_blocks);
        auto said = n.area.number<std::uint32_t>(offsetof(rsrc_class_hash_t, rch_num_hash_blocks));
        std::size_t count = cdb::count_inside(n.area, first, said, sizeof(rc_hash_block_t));
        to.add({part(node_kind::hash_block, &cdb::format_for<rc_hash_block_t>, n.area, first), count,
                sizeof(rc_hash_block_t)});
    }

    const node &n;
    families &to;
};

node_kind kind_of_section(cdb_dsect_type_t type) {
    switch (type) {
    case CDB_DSECT_CLASS:
        return node_kind::resource_class;
    case CDB_DSECT_VAR_CLASS:
        return node_kind::variable_class;
    case CDB_DSECT_RSRC_MGR:
        return node_kind::manager;
    case CDB_DSECT_CMMAP:
        return node_kind::map;
    case CDB_DSECT_CLASS_HASH:
        return node_kind::class_hash;
    case CDB_DSECT_EMPTY:
        return node_kind::empty_section;
    case CDB_DSECT_TBL_CNTRS:
        return node_kind::counters_section;
    case CDB_DSECT_UNUSED: /* a readable database has no section of any other type */
        break;
    }
    return node_kind::unused_section;
}

} // namespace

/* ---- Whole databases and sections ------------------------------------------------------------------------------ */

node database_node(const origin &from) {
    return {.kind = node_kind::database,
            .from = &from,
            .format = &cdb::format_for<orb_cdb_header_t>,
            .area = from.db.file()};
}

node section_node(const origin &from, std::size_t index, section_tables &room) {
    cdb_dsect_type_t type = from.db.anchor(index).cda_type;
    const cdb::section_kind *kind = cdb::kind_of(type);
    room.tables = cdb::tables_of(from.db, index);
    room.first_text = room.tables.strings.text(std::size_t{0});
    return {.kind = kind_of_section(type),
            .from = &from,
            .format = kind == nullptr ? nullptr : kind->root,
            .area = from.db.section(index),
            .index = index,
            .section = &room};
}

/* ---- Facts ----------------------------------------------------------------------------------------------------- */

std::string_view text_in(const node &n, const cdb::field &f) {
    std::uint32_t place = number_in(n, f);
    if (place == CDB_NONE || n.section == nullptr)
        return {};
    return place == 0 ? n.section->first_text : n.section->tables.strings.text(std::size_t{place});
}

vx_data_type_t data_type_of(const node &n) {
    bool has_type = n.format != nullptr && n.format->type != nullptr;
    return has_type ? static_cast<vx_data_type_t>(number_in(n, *n.format->type)) : VX_UNKNOWN;
}

std::optional<fact> fact_in(const node &n, std::size_t field_index) {
    const cdb::field &f = n.format->fields[field_index];
    const cdb::field_fact &what = n.format->facts[field_index];
    bool is_reference = f.kind == cdb::field_kind::reference;
    if (what.is == cdb::role::LAYOUT || what.is == cdb::role::NAME)
        return std::nullopt;
    if (f.kind == cdb::field_kind::number || (is_reference && what.as == cdb::meaning::UNUSED))
        return fact{&what, number_in(n, f)};
    if (is_reference && f.to == cdb::target::strings)
        return fact{&what, text_in(n, f)};
    bool is_value = f.kind == cdb::field_kind::value && f.type_at != cdb::TYPE_OF_OWNER;
    if (is_value && n.section != nullptr)
        return fact{&what,
                    value_in(n.area, n.at + f.offset, data_type_of(n), n.section->tables.strings, n.from->owners)};
    return std::nullopt;
}

/* ---- Parts ----------------------------------------------------------------------------------------------------- */

node family::at(std::size_t index) const {
    node made = first;
    made.at += index * size;
    made.index = index;
    if (first.kind == node_kind::variable && cdb::variable_id(made.area, made.at).of_class())
        made.kind = node_kind::class_variable;
    return made;
}

void add_families(const node &n, families &to) {
    family_finder(n, to).find();
}

} // namespace compare
