/* meaning.cpp: what a database means, as a tree. The fields of its records come from the field tables, so
 * that none is forgotten. */

#include "compare/compare.h"
#include "compare/fields.h"
#include "compare/text.h"
#include "format/sections.h"
#include "reader/tables.h"

namespace compare {

namespace {

template <class Record> const cdb::field_fact &fact_of(std::size_t offset) {
    return cdb::format_for<Record>.fact_at(offset);
}

class builder {
public:
    builder(const cdb::database &database, const cdb::ownership &ownership)
        : db(database), owners(ownership), writer(database.file().size()) {}

    node whole();

private:
    template <class Record>
    node record(node_kind kind, const cdb::bytes &area, std::size_t at, const cdb::class_tables &tables);
    void add_text(node &to, const cdb::field_fact &what, std::string_view text);
    void add_reference(node &to, const cdb::field &f, const cdb::field_fact &what, const cdb_ref_t &ref,
                       const cdb::class_tables &tables, vx_data_type_t type);
    void add_value(node &to, const cdb::field_fact &what, const cdb::value &value, bool is_own,
                   const cdb::bytes &strings);
    void add_varieties(node &to, const cdb::variety_list &varieties);
    void add_valid_values(node &to, const cdb::valid_value_list &values, const cdb::class_tables &tables);
    void add_elements(node &to, const cdb::field_fact &what, const cdb_ref_t &ref, const cdb::class_tables &tables);
    template <class Record>
    void add_records(node &to, node_kind kind, const cdb::class_tables &tables, const cdb_ref_t &first,
                     std::size_t count);
    void add_errors(node &to, const rsrc_class_t &rc, const cdb::class_tables &tables);
    void add_dependencies(node &to, const rsrc_class_t &rc, const cdb::bytes &section);
    node resource_class(const cdb::bytes &section);
    node class_hash(const cdb::bytes &section);
    node variable_class(const cdb::bytes &section, const cdb::class_tables &tables);
    node section(std::size_t index);

    const cdb::database &db;
    const cdb::ownership &owners;
    value_writer writer;
};

void add_number(node &to, const cdb::field_fact &what, std::uint32_t number) {
    to.facts.push_back({&what, text_of_number(number, what.as)});
}

void builder::add_text(node &to, const cdb::field_fact &what, std::string_view text) {
    if (what.is == cdb::role::NAME)
        to.name = writer.text_of(text);
    else
        to.facts.push_back({&what, text.empty() ? "nothing" : writer.text_of(text)});
}

void builder::add_value(node &to, const cdb::field_fact &what, const cdb::value &value, bool is_own,
                        const cdb::bytes &strings) {
    bool bound = what.as == cdb::meaning::BOUND;
    std::string text = bound ? writer.text_of_bound(value, is_own, strings, owners) : writer.text_of(value, strings);
    to.facts.push_back({&what, std::move(text)});
}

void builder::add_varieties(node &to, const cdb::variety_list &varieties) {
    for (const cdb::variety &v : varieties)
        to.parts.push_back({node_kind::variety, std::to_string(v.low) + " to " + std::to_string(v.high)});
}

void builder::add_valid_values(node &to, const cdb::valid_value_list &values, const cdb::class_tables &tables) {
    for (const cdb::valid_value &v : values) {
        std::string text = writer.text_of(v.low, tables.strings);
        std::string high = writer.text_of(v.high, tables.strings);
        if (text != high)
            text.append(" to ").append(high);
        node entry = {node_kind::valid_value, text};
        entry.facts.push_back({&fact_of<vv_entry_t>(offsetof(vv_entry_t, vv_disp_msgid)), std::to_string(v.message)});
        to.parts.push_back(std::move(entry));
    }
}

/* An element's place in the structure is part of what it means. */
void builder::add_elements(node &to, const cdb::field_fact &what, const cdb_ref_t &ref,
                           const cdb::class_tables &tables) {
    std::size_t count = cdb::sd_definition_at(tables, ref).size();
    std::size_t at = ref.offset[0] + offsetof(sd_def_t, sd_fields);
    for (std::size_t i = 0; i < count; ++i, at += sizeof(sd_field_t)) {
        node element = record<sd_field_t>(node_kind::element, tables.sd_defs, at, tables);
        element.field = &what;
        element.facts.insert(element.facts.begin(), {&ELEMENT_INDEX, std::to_string(i)});
        to.parts.push_back(std::move(element));
    }
}

void builder::add_reference(node &to, const cdb::field &f, const cdb::field_fact &what, const cdb_ref_t &ref,
                            const cdb::class_tables &tables, vx_data_type_t type) {
    if (what.as == cdb::meaning::UNUSED)
        return add_number(to, what, ref.offset[0]);
    switch (f.to) {
    case cdb::target::strings:
        return add_text(to, what, tables.strings.text(ref));
    case cdb::target::variety_lists:
        return add_varieties(to, cdb::varieties_at(tables, ref));
    case cdb::target::valid_vals:
        return add_valid_values(to, cdb::valid_values_at(tables, ref, type), tables);
    default: /* definitions */
        return add_elements(to, what, ref, tables);
    }
}

/* The data type that a record names; VX_UNKNOWN if it names none. */
template <class Record> vx_data_type_t type_of(const Record &record) {
    if constexpr (requires { record.ra_data_type; })
        return record.ra_data_type;
    else if constexpr (requires { record.sd_field_type; })
        return record.sd_field_type;
    else
        return VX_UNKNOWN;
}

template <class Field> Field load(const std::byte *from) {
    Field field;
    std::memcpy(&field, from, sizeof field);
    return field;
}

template <class Record>
node builder::record(node_kind kind, const cdb::bytes &area, std::size_t at, const cdb::class_tables &tables) {
    auto copy = area.record<Record>(at);
    const auto *bytes = reinterpret_cast<const std::byte *>(&copy);
    vx_data_type_t type = type_of(copy);
    node made = {kind};
    const cdb::record_format &format = cdb::format_for<Record>;
    for (std::size_t i = 0; i < format.fields.size(); ++i) {
        const cdb::field &f = format.fields[i];
        const cdb::field_fact &what = format.facts[i];
        const std::byte *from = bytes + f.offset;
        bool is_own = owners.is_own(area, at + f.offset);
        if (what.is == cdb::role::LAYOUT || (f.to == cdb::target::valid_vals && !is_own))
            continue;
        if (f.kind == cdb::field_kind::number)
            add_number(made, what, f.width == 2 ? load<std::uint16_t>(from) : load<std::uint32_t>(from));
        else if (f.kind == cdb::field_kind::reference)
            add_reference(made, f, what, load<cdb_ref_t>(from), tables, type);
        else if (f.kind == cdb::field_kind::value)
            add_value(made, what, {area, at + f.offset, type, tables.strings}, is_own, tables.strings);
    }
    return made;
}

template <class Record>
void builder::add_records(node &to, node_kind kind, const cdb::class_tables &tables, const cdb_ref_t &first,
                          std::size_t count) {
    std::size_t at = first.offset[0];
    for (std::size_t i = 0; i < count; ++i, at += sizeof(Record))
        to.parts.push_back(record<Record>(kind, tables.section, at, tables));
}

void builder::add_errors(node &to, const rsrc_class_t &rc, const cdb::class_tables &tables) {
    std::size_t at = rc.u_rc_errors.offset[0];
    std::size_t count = cdb::count_placed(tables.section, rc.u_rc_errors, rc.rc_num_errors, sizeof(rsrc_error_t));
    for (std::size_t i = 0; i < count; ++i, at += sizeof(rsrc_error_t))
        to.parts.push_back(record<rsrc_error_t>(node_kind::error, tables.section, at, tables));
}

void builder::add_dependencies(node &to, const rsrc_class_t &rc, const cdb::bytes &section) {
    std::size_t at = rc.u_rc_depends.offset[0];
    std::size_t count = cdb::count_placed(section, rc.u_rc_depends, rc.rc_num_depends, sizeof(rsrc_depend_t));
    for (std::size_t i = 0; i < count; ++i, at += sizeof(rsrc_depend_t)) {
        to.parts.push_back(record<rsrc_depend_t>(node_kind::dependency, section, at, {}));
        to.parts.back().name = std::to_string(section.record<rsrc_depend_t>(at).rd_class_ID);
    }
}

/* The heads and links of its chains are places, and so are the references to classes, which count from an unknown
 * base. */
node builder::class_hash(const cdb::bytes &section) {
    node made = {node_kind::class_hash};
    add_number(made, fact_of<rsrc_class_hash_t>(offsetof(rsrc_class_hash_t, rch_cb_ID)),
               section.number<std::uint32_t>(0));
    std::size_t at = offsetof(rsrc_class_hash_t, rc_hash_blocks);
    std::size_t count =
        cdb::count_inside(section, at, section.number<std::uint32_t>(offsetof(rsrc_class_hash_t, rch_num_hash_blocks)),
                          sizeof(rc_hash_block_t));
    for (std::size_t i = 0; i < count; ++i, at += sizeof(rc_hash_block_t)) {
        made.parts.push_back(record<rc_hash_block_t>(node_kind::hash_block, section, at, {}));
        made.parts.back().name = std::to_string(section.record<rc_hash_block_t>(at).rch_class_id);
    }
    return made;
}

node builder::resource_class(const cdb::bytes &section) {
    cdb::resource_class view(section);
    const rsrc_class_t &rc = view.record();
    const cdb::class_tables &tables = view.side_tables();
    node made = record<rsrc_class_t>(node_kind::resource_class, section, 0, tables);
    add_records<rsrc_pattr_t>(made, node_kind::persistent_attribute, tables, rc.u_rc_pattrs, rc.rc_num_pattrs);
    add_records<rsrc_pattr_t>(made, node_kind::persistent_class_attribute, tables, rc.u_rc_pattrsC, rc.rc_num_pattrsC);
    add_records<rsrc_dattr_t>(made, node_kind::dynamic_attribute, tables, rc.u_rc_dattrs, rc.rc_num_dattrs);
    add_records<rsrc_dattr_t>(made, node_kind::dynamic_class_attribute, tables, rc.u_rc_dattrsC, rc.rc_num_dattrsC);
    add_records<rsrc_action_t>(made, node_kind::action, tables, rc.u_rc_actions, rc.rc_num_actions);
    add_records<rsrc_action_t>(made, node_kind::class_action, tables, rc.u_rc_actionsC, rc.rc_num_actionsC);
    add_errors(made, rc, tables);
    add_dependencies(made, rc, tables.section);
    return made;
}

node builder::variable_class(const cdb::bytes &section, const cdb::class_tables &tables) {
    cdb::variable_class view(section);
    node made = record<rsrc_variable_class_t>(node_kind::variable_class, section, 0, tables);
    for (const cdb::variable_id &id : view.variable_ids())
        made.parts.push_back({id.of_class() ? node_kind::class_variable : node_kind::variable,
                              std::to_string(id.number & ~(id.of_class() ? VAR_ID_CLASS_ATTR : 0))});
    return made;
}

node builder::section(std::size_t index) {
    cdb::bytes bytes = db.section(index);
    cdb_dsect_type_t type = db.anchor(index).cda_type;
    cdb::class_tables tables = cdb::tables_of(db, index);
    switch (type) {
    case CDB_DSECT_CLASS:
        return resource_class(bytes);
    case CDB_DSECT_VAR_CLASS:
        return variable_class(bytes, tables);
    case CDB_DSECT_RSRC_MGR:
        return record<rsrc_mgr_t>(node_kind::manager, bytes, 0, tables);
    case CDB_DSECT_CMMAP:
        return record<rsrc_cmmap_t>(node_kind::map, bytes, 0, tables);
    case CDB_DSECT_CLASS_HASH:
        return class_hash(bytes);
    case CDB_DSECT_EMPTY:
        return {node_kind::empty_section};
    case CDB_DSECT_TBL_CNTRS:
        return {node_kind::counters_section};
    case CDB_DSECT_UNUSED: /* a readable database has no section of any other type */
        break;
    }
    return {node_kind::unused_section};
}

node builder::whole() {
    node made = record<orb_cdb_header_t>(node_kind::database, db.file(), 0, {});
    for (std::size_t i = 0; i < db.section_count(); ++i) {
        made.parts.push_back(section(i));
        add_number(made.parts.back(), fact_of<cdb_dsect_anchor_t>(offsetof(cdb_dsect_anchor_t, cda_revision)),
                   db.anchor(i).cda_revision);
    }
    return made;
}

} // namespace

node meaning_of(const cdb::database &db, const cdb::ownership &owners) {
    return builder(db, owners).whole();
}

} // namespace compare
