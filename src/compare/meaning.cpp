/* meaning.cpp: what a database means, as a tree. The fields of its records come from the field tables, so
 * that none is forgotten. */

#include "compare/compare.h"
#include "compare/fields.h"
#include "format/sections.h"
#include "reader/tables.h"

namespace cdef {

namespace {

constexpr const char *VALID_VALUE = "valid value";

template <class Record> const cdb::field_fact &fact_of(std::size_t offset) {
    return cdb::format_for<Record>.fact_at(offset);
}

class builder {
public:
    builder(const cdb::database &database, const cdb::ownership &ownership)
        : db(database), owners(ownership), tell(database.file().size()) {}

    thing whole();

private:
    template <class Record>
    thing record(std::string_view kind, const cdb::bytes &area, std::size_t at, const cdb::class_tables &tables);
    void add_text(thing &to, const cdb::field_fact &what, std::string_view text);
    void add_reference(thing &to, const cdb::field &f, const cdb::field_fact &what, const cdb_ref_t &ref,
                       const cdb::class_tables &tables, vx_data_type_t type);
    void add_value(thing &to, const cdb::field_fact &what, const cdb::value &value, bool is_own,
                   const cdb::bytes &strings);
    void add_varieties(thing &to, const cdb::variety_list &varieties);
    void add_valid_values(thing &to, const cdb::valid_value_list &values, const cdb::class_tables &tables);
    void add_elements(thing &to, const cdb::field_fact &what, const cdb_ref_t &ref, const cdb::class_tables &tables);
    template <class Record>
    void add_records(thing &to, table from, const cdb::class_tables &tables, const cdb_ref_t &first, std::size_t count);
    void add_errors(thing &to, const rsrc_class_t &rc, const cdb::class_tables &tables);
    void add_dependencies(thing &to, const rsrc_class_t &rc, const cdb::bytes &section);
    thing resource_class(const cdb::bytes &section);
    thing class_hash(const cdb::bytes &section);
    thing variable_class(const cdb::bytes &section, const cdb::class_tables &tables);
    thing section(std::size_t index);

    const cdb::database &db;
    const cdb::ownership &owners;
    teller tell;
};

void add_number(thing &to, const cdb::field_fact &what, std::uint32_t number) {
    to.facts.push_back({&what, text_of_number(number, what.as)});
}

void builder::add_text(thing &to, const cdb::field_fact &what, std::string_view text) {
    if (what.is == cdb::role::NAME)
        to.name = tell.text_of(text);
    else
        to.facts.push_back({&what, text.empty() ? "nothing" : tell.text_of(text)});
}

void builder::add_value(thing &to, const cdb::field_fact &what, const cdb::value &value, bool is_own,
                        const cdb::bytes &strings) {
    bool bound = what.as == cdb::meaning::BOUND;
    std::string text = bound ? tell.text_of_bound(value, is_own, strings, owners) : tell.text_of(value, strings);
    to.facts.push_back({&what, std::move(text)});
}

void builder::add_varieties(thing &to, const cdb::variety_list &varieties) {
    for (const cdb::variety &v : varieties)
        to.parts.push_back({"variety", std::to_string(v.low) + " to " + std::to_string(v.high), {}, {}});
}

void builder::add_valid_values(thing &to, const cdb::valid_value_list &values, const cdb::class_tables &tables) {
    for (const cdb::valid_value &v : values) {
        std::string text = tell.text_of(v.low, tables.strings);
        std::string high = tell.text_of(v.high, tables.strings);
        if (text != high)
            text.append(" to ").append(high);
        thing entry = {VALID_VALUE, text, {}, {}};
        entry.facts.push_back({&fact_of<vv_entry_t>(offsetof(vv_entry_t, vv_disp_msgid)), std::to_string(v.message)});
        to.parts.push_back(std::move(entry));
    }
}

/* An element's place in the structure is part of what it means. */
void builder::add_elements(thing &to, const cdb::field_fact &what, const cdb_ref_t &ref,
                           const cdb::class_tables &tables) {
    std::size_t count = cdb::sd_definition_at(tables, ref).size();
    std::size_t at = ref.offset[0] + offsetof(sd_def_t, sd_fields);
    for (std::size_t i = 0; i < count; ++i, at += sizeof(sd_field_t)) {
        thing element = record<sd_field_t>(what.label(), tables.sd_defs, at, tables);
        element.facts.insert(element.facts.begin(), {&ELEMENT_INDEX, std::to_string(i)});
        to.parts.push_back(std::move(element));
    }
}

void builder::add_reference(thing &to, const cdb::field &f, const cdb::field_fact &what, const cdb_ref_t &ref,
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

/* The one data type that a record knows of itself. */
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
thing builder::record(std::string_view kind, const cdb::bytes &area, std::size_t at, const cdb::class_tables &tables) {
    auto copy = area.record<Record>(at);
    const auto *bytes = reinterpret_cast<const std::byte *>(&copy);
    vx_data_type_t type = type_of(copy);
    thing made = {std::string(kind), {}, {}, {}};
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
void builder::add_records(thing &to, table from, const cdb::class_tables &tables, const cdb_ref_t &first,
                          std::size_t count) {
    std::size_t at = first.offset[0];
    for (std::size_t i = 0; i < count; ++i, at += sizeof(Record))
        to.parts.push_back(
            record<Record>(cdb::side_tables[static_cast<std::size_t>(from)].stanza, tables.section, at, tables));
}

/* A table of errors or dependencies whose place is 0, where the class stands, has no place: nothing can be known of it
 * but its count, which is a field of the class. */
template <class Record> std::size_t count_placed(const cdb::bytes &section, const cdb_ref_t &first, std::size_t count) {
    std::size_t at = first.offset[0];
    return at == 0 ? 0 : cdb::count_inside(section, at, count, sizeof(Record));
}

void builder::add_errors(thing &to, const rsrc_class_t &rc, const cdb::class_tables &tables) {
    std::size_t at = rc.u_rc_errors.offset[0];
    std::size_t count = count_placed<rsrc_error_t>(tables.section, rc.u_rc_errors, rc.rc_num_errors);
    for (std::size_t i = 0; i < count; ++i, at += sizeof(rsrc_error_t))
        to.parts.push_back(record<rsrc_error_t>("error", tables.section, at, tables));
}

void builder::add_dependencies(thing &to, const rsrc_class_t &rc, const cdb::bytes &section) {
    std::size_t at = rc.u_rc_depends.offset[0];
    std::size_t count = count_placed<rsrc_depend_t>(section, rc.u_rc_depends, rc.rc_num_depends);
    for (std::size_t i = 0; i < count; ++i, at += sizeof(rsrc_depend_t)) {
        to.parts.push_back(record<rsrc_depend_t>("dependency", section, at, {}));
        to.parts.back().name = std::to_string(section.record<rsrc_depend_t>(at).rd_class_ID);
    }
}

/* The heads and links of its chains are places. So are the references to classes: they have no base that is known. */
thing builder::class_hash(const cdb::bytes &section) {
    thing made = {"class hash", {}, {}, {}};
    add_number(made, fact_of<rsrc_class_hash_t>(offsetof(rsrc_class_hash_t, rch_cb_ID)),
               section.number<std::uint32_t>(0));
    std::size_t at = offsetof(rsrc_class_hash_t, rc_hash_blocks);
    std::size_t count =
        cdb::count_inside(section, at, section.number<std::uint32_t>(offsetof(rsrc_class_hash_t, rch_num_hash_blocks)),
                          sizeof(rc_hash_block_t));
    for (std::size_t i = 0; i < count; ++i, at += sizeof(rc_hash_block_t)) {
        made.parts.push_back(record<rc_hash_block_t>("block", section, at, {}));
        made.parts.back().name = std::to_string(section.record<rc_hash_block_t>(at).rch_class_id);
    }
    return made;
}

thing builder::resource_class(const cdb::bytes &section) {
    cdb::resource_class view(section);
    const rsrc_class_t &rc = view.record();
    const cdb::class_tables &tables = view.side_tables();
    thing made = record<rsrc_class_t>("ResourceClass", section, 0, tables);
    add_records<rsrc_pattr_t>(made, table::persistent_attributes, tables, rc.u_rc_pattrs, rc.rc_num_pattrs);
    add_records<rsrc_pattr_t>(made, table::persistent_class_attributes, tables, rc.u_rc_pattrsC, rc.rc_num_pattrsC);
    add_records<rsrc_dattr_t>(made, table::dynamic_attributes, tables, rc.u_rc_dattrs, rc.rc_num_dattrs);
    add_records<rsrc_dattr_t>(made, table::dynamic_class_attributes, tables, rc.u_rc_dattrsC, rc.rc_num_dattrsC);
    add_records<rsrc_action_t>(made, table::actions, tables, rc.u_rc_actions, rc.rc_num_actions);
    add_records<rsrc_action_t>(made, table::class_actions, tables, rc.u_rc_actionsC, rc.rc_num_actionsC);
    add_errors(made, rc, tables);
    add_dependencies(made, rc, tables.section);
    return made;
}

thing builder::variable_class(const cdb::bytes &section, const cdb::class_tables &tables) {
    cdb::variable_class view(section);
    thing made = record<rsrc_variable_class_t>("ResourceVariableClass", section, 0, tables);
    for (const cdb::variable_id &id : view.variable_ids())
        made.parts.push_back({id.of_class() ? "class variable" : "variable",
                              std::to_string(id.number & ~(id.of_class() ? VAR_ID_CLASS_ATTR : 0)),
                              {},
                              {}});
    return made;
}

thing builder::section(std::size_t index) {
    cdb::bytes bytes = db.section(index);
    cdb_dsect_type_t type = db.anchor(index).cda_type;
    cdb::class_tables tables = cdb::tables_of(db, index);
    switch (type) {
    case CDB_DSECT_CLASS:
        return resource_class(bytes);
    case CDB_DSECT_VAR_CLASS:
        return variable_class(bytes, tables);
    case CDB_DSECT_RSRC_MGR:
        return record<rsrc_mgr_t>("ResourceManager", bytes, 0, tables);
    case CDB_DSECT_CMMAP:
        return record<rsrc_cmmap_t>("ClassToManagerMapping", bytes, 0, tables);
    case CDB_DSECT_CLASS_HASH:
        return class_hash(bytes);
    case CDB_DSECT_UNUSED:
    case CDB_DSECT_EMPTY:
    case CDB_DSECT_TBL_CNTRS:
        break;
    }
    return {"section of type " + std::to_string(type), {}, {}, {}};
}

thing builder::whole() {
    thing made = record<orb_cdb_header_t>("database", db.file(), 0, {});
    for (std::size_t i = 0; i < db.section_count(); ++i) {
        made.parts.push_back(section(i));
        add_number(made.parts.back(), fact_of<cdb_dsect_anchor_t>(offsetof(cdb_dsect_anchor_t, cda_revision)),
                   db.anchor(i).cda_revision);
    }
    return made;
}

} // namespace

thing meaning_of(const cdb::database &db, const cdb::ownership &owners) {
    return builder(db, owners).whole();
}

} // namespace cdef
