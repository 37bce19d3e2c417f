/* cdef_diff_meaning.cpp: what a database means, as a tree. The fields of its records come from the field tables: one
 * that has no label here shows under its own name, so that none is forgotten. */

#include "cdb_names.h"
#include "cdef.h"
#include "cdef_diff.h"

namespace cdef {

namespace {

constexpr const char *VALID_VALUE = "valid value";

/* How a number reads. */
enum class form : std::uint8_t {
    number,
    identifier, /* signed */
    bits,
    version,
    data_type,
    variable_type,
    permission,
    element_index, /* 0xFFFF: none */
    locator,       /* likewise */
    reference      /* a reference that leads nowhere: 0, or its offset */
};

struct label {
    std::string_view field;
    std::string_view words;
    form as = form::number;
};

constexpr label labels[] = {
    {"cdb_hdr_seqno", "sequence number"},
    {"rc_class_id", "class number"},
    {"rc_dscr_msgid", "description"},
    {"rc_disp_msgid", "display name"},
    {"rc_locator", "locator", form::locator},
    {"rc_version", "version", form::version},
    {"rc_perm_temp", "resource permission template", form::bits},
    {"rc_perm_tempC", "class permission template", form::bits},
    {"rc_num_errors", "errors"},
    {"rc_num_depends", "dependencies"},
    {"u_rc_alias", "alias"},
    {"ra_dscr_msgid", "description"},
    {"ra_disp_msgid", "display name"},
    {"ra_group_msgid", "group name"},
    {"ra_group_id", "group"},
    {"ra_dflt_value", "default"},
    {"ra_attr_id", "Id", form::identifier},
    {"ra_data_type", "type", form::data_type},
    {"ra_max_sd_idx", "highest element index", form::element_index},
    {"ra_var_type", "variable type", form::variable_type},
    {"ra_init_value", "initial value"},
    {"ra_min_value", "lower bound"},
    {"ra_max_value", "upper bound"},
    {"ra_expr_desc", "expression description"},
    {"ra_rearm_desc", "re-arm description"},
    {"u_ra_express", "expression"},
    {"u_ra_rearm_expr", "re-arm expression"},
    {"u_ra_vclass", "u_ra_vclass", form::reference},
    {"u_ra_next_in_vclass", "u_ra_next_in_vclass", form::reference},
    {"u_ra_ZAV_name", "u_ra_ZAV_name", form::reference},
    {"ac_action_id", "Id", form::identifier},
    {"ac_dscr_msgid", "description"},
    {"ac_disp_msgid", "display name"},
    {"ac_confirm_msgid", "confirmation"},
    {"ac_timeout", "time-out"},
    {"ac_perms", "permission", form::permission},
    {"vv_disp_msgid", "display name"},
    {"sd_field_type", "type", form::data_type},
    {"sd_disp_msgid", "display name"},
    {"sd_dscr_msgid", "description"},
    {"sd_action_id", "action"},
    {"sd_valid_type", "valid type"},
    {"rm_id", "number"},
    {"rcm_class_ID", "class number"},
    {"rcm_rm_ID", "manager number"},
    {"u_rcm_msg_file", "message catalog"},
    {"rcm_dscr_msg_set", "message set"},
    {"rcm_first_key", "first key"},
    {"rcm_last_key", "last key"},
    {"rvc_obsv_interval", "observation interval"},
    {"rvc_report_interval", "reporting interval"},
    {"u_rvc_compat_name", "alias"},
};

/* Named exceptions. Layout: where things stand, how many and how long they are; their contents are compared instead. */
constexpr std::string_view layout[] = {
    "cdb_hdr_length",
    "cdb_hdr_checksum",
    "cdb_hdr_format",
    "cdb_hdr_timestamp.tv_sec", /* not layout, but no part of the meaning either */
    "cdb_hdr_timestamp.tv_usec",
    "cdb_hdr_dsect_count",
    "cdb_hdr_max_rm_id",
    "cdb_hdr_max_class_id",
    "cdb_hdr_rsrc_class_size",
    "cdb_hdr_rsrc_cmmap_size",
    "cdb_hdr_rsrc_mgr_size",
    "cdb_hdr_rsrc_variable_class_size",
    "cdb_hdr_rsrc_pattr_size",
    "cdb_hdr_rsrc_dattr_size",
    "cdb_hdr_rsrc_action_size",
    "cdb_hdr_rsrc_error_size",
    "cdb_hdr_rsrc_depend_size",
    "rc_cb_ID",
    "u_rc_pattrsC",
    "u_rc_dattrsC",
    "u_rc_pattrs",
    "u_rc_dattrs",
    "u_rc_actionsC",
    "u_rc_actions",
    "u_rc_errors",
    "u_rc_depends",
    "u_rc_variety_lists",
    "u_rc_sbs_defs",
    "u_rc_sd_defs",
    "u_rc_valid_vals",
    "u_rc_strings",
    "rc_num_pattrsC",
    "rc_num_dattrsC",
    "rc_num_pattrs",
    "rc_num_dattrs",
    "rc_num_actionsC",
    "rc_num_actions",
    "rc_varlist_size",
    "rc_sd_size",
    "rc_valval_size",
    "ra_cb_ID",
    "ac_cb_ID",
    "rm_cb_ID",
    "u_rm_strings_table",
    "rcm_cb_ID",
    "u_rcm_strings",
    "rvc_cb_ID",
    "rvc_var_count",
    "u_rvc_string_tbl",
};

/* By these things are found. */
constexpr std::string_view names[] = {"u_rc_name",       "u_ra_name",   "u_ac_name",
                                      "u_sd_field_name", "u_rm_RMname", "u_rvc_name"};

/* SD definitions: what their elements are called. */
constexpr label structures[] = {
    {"u_rc_def_input", "define input element"},
    {"u_rc_undef_input", "undefine input element"},
    {"u_rc_online_input", "online input element"},
    {"u_rc_offline_input", "offline input element"},
    {"u_rc_reset_input", "reset input element"},
    {"u_ra_sd", "element"},
    {"u_ac_sd_input", "input element"},
    {"u_ac_sd_resp", "response element"},
};

template <class Rows> bool contains(const Rows &rows, std::string_view field) {
    return std::find(std::begin(rows), std::end(rows), field) != std::end(rows);
}

template <class Rows> label label_of(const Rows &rows, std::string_view field) {
    for (const label &row : rows)
        if (row.field == field)
            return row;
    return {field, field};
}

/* Names joined with "+"; bits without a name in hexadecimal; none. */
std::string text_of_bits(std::uint32_t bits, std::span<const props_t> known) {
    std::string text;
    for (const props_t &property : known) {
        if ((bits & property.p) != property.p)
            continue;
        text += (text.empty() ? "" : "+") + std::string(property.s);
        bits &= ~property.p;
    }
    if (bits != 0)
        appendf(text, text.empty() ? "0x%x" : "+0x%x", bits);
    return text.empty() ? "none" : text;
}

std::string text_of_permission(std::uint32_t mask) {
    for (const valid_perms_t &known : perm_list)
        if (known.mask == mask)
            return {known.permission};
    return text_of_bits(mask, {});
}

std::string text_of_number(std::uint32_t number, form as) {
    std::string text;
    switch (as) {
    case form::number:
        return std::to_string(number);
    case form::identifier:
        return std::to_string(static_cast<std::int32_t>(number));
    case form::bits:
        return text_of_bits(number, {});
    case form::version:
        appendf(text, "%u.%u.%u.%u", number >> 24, number >> 16 & 255, number >> 8 & 255, number & 255);
        return text;
    case form::data_type:
        return std::string(cdb::name_of(static_cast<vx_data_type_t>(number)));
    case form::variable_type:
        return number < std::size(vxVarStr) ? vxVarStr[number] : std::to_string(number);
    case form::permission:
        return text_of_permission(number);
    case form::element_index:
    case form::locator:
        return number == 0xFFFF ? "none" : std::to_string(number);
    case form::reference:
        return number == CDB_NONE ? "0" : std::to_string(number);
    }
    return text;
}

/* A kind of record, and the names of the bits in its properties. */
struct record_kind {
    std::string_view name;
    std::span<const props_t> properties;
};

/* By table. */
constexpr record_kind kinds[RECORD_TABLES] = {
    {"PersistentClassAttribute", pa_props},
    {"DynamicClassAttribute", da_props},
    {"PersistentResourceAttribute", pa_props},
    {"DynamicResourceAttribute", da_props},
    {"ClassAction", act_props},
    {"ResourceAction", act_props},
};

class builder {
public:
    explicit builder(const cdb::database &database) : db(database), tell(database.file().size()) {}

    thing whole();

private:
    template <class Record>
    thing record(const record_kind &kind, const cdb::bytes &area, std::size_t at, const cdb::class_tables &tables);
    void add_number(thing &to, const record_kind &kind, const cdb::field &f, std::uint32_t number);
    void add_text(thing &to, const cdb::field &f, std::string_view text);
    void add_reference(thing &to, const cdb::field &f, const cdb_ref_t &ref, const cdb::class_tables &tables,
                       vx_data_type_t type);
    void add_value(thing &to, const cdb::field &f, const cdb::value &value, const cdb::bytes &strings);
    void add_varieties(thing &to, const cdb::variety_list &varieties);
    void add_valid_values(thing &to, const cdb::valid_value_list &values, const cdb::class_tables &tables);
    void add_elements(thing &to, const cdb::field &f, const cdb_ref_t &ref, const cdb::class_tables &tables);
    template <class Record>
    void add_records(thing &to, table from, const cdb::class_tables &tables, const cdb_ref_t &first, std::size_t count);
    thing resource_class(const cdb::bytes &section, bool is_last);
    thing variable_class(const cdb::bytes &section);
    thing section(std::size_t index);
    std::size_t last_class() const;

    const cdb::database &db;
    teller tell;
};

void builder::add_number(thing &to, const record_kind &kind, const cdb::field &f, std::uint32_t number) {
    bool properties = f.name.ends_with("_props");
    label words = label_of(labels, f.name);
    to.facts.push_back({f.name, properties ? "properties" : words.words,
                        properties ? text_of_bits(number, kind.properties) : text_of_number(number, words.as)});
}

void builder::add_text(thing &to, const cdb::field &f, std::string_view text) {
    if (contains(names, f.name))
        to.name = tell.text_of(text);
    else
        to.facts.push_back({f.name, label_of(labels, f.name).words, text.empty() ? "nothing" : tell.text_of(text)});
}

void builder::add_value(thing &to, const cdb::field &f, const cdb::value &value, const cdb::bytes &strings) {
    bool bound = f.name == "ra_min_value" || f.name == "ra_max_value";
    to.facts.push_back({f.name, label_of(labels, f.name).words,
                        bound ? tell.text_of_bound(value, strings) : tell.text_of(value, strings)});
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
        entry.facts.push_back({"vv_disp_msgid", "display name", std::to_string(v.message)});
        to.parts.push_back(std::move(entry));
    }
}

/* An element's place in the structure is part of what it means. */
void builder::add_elements(thing &to, const cdb::field &f, const cdb_ref_t &ref, const cdb::class_tables &tables) {
    std::size_t count = cdb::sd_definition_at(tables, ref).size();
    std::size_t at = ref.offset[0] + offsetof(sd_def_t, sd_fields);
    for (std::size_t i = 0; i < count; ++i, at += sizeof(sd_field_t)) {
        record_kind kind = {label_of(structures, f.name).words, {}};
        thing element = record<sd_field_t>(kind, tables.sd_defs, at, tables);
        element.facts.insert(element.facts.begin(), {"ElementIndex", "index", std::to_string(i)});
        to.parts.push_back(std::move(element));
    }
}

void builder::add_reference(thing &to, const cdb::field &f, const cdb_ref_t &ref, const cdb::class_tables &tables,
                            vx_data_type_t type) {
    if (label_of(labels, f.name).as == form::reference)
        return add_number(to, {}, f, ref.offset[0]);
    switch (f.to) {
    case cdb::target::strings:
        return add_text(to, f, tables.strings.text(ref));
    case cdb::target::variety_lists:
        return add_varieties(to, cdb::varieties_at(tables, ref));
    case cdb::target::valid_vals:
        return add_valid_values(to, cdb::valid_values_at(tables, ref, type), tables);
    case cdb::target::sd_defs:
        return add_elements(to, f, ref, tables);
    case cdb::target::section:
    case cdb::target::none:
        return add_number(to, {}, f, ref.offset[0]);
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
thing builder::record(const record_kind &kind, const cdb::bytes &area, std::size_t at,
                      const cdb::class_tables &tables) {
    auto copy = area.record<Record>(at);
    const auto *bytes = reinterpret_cast<const std::byte *>(&copy);
    vx_data_type_t type = type_of(copy);
    thing made = {std::string(kind.name), {}, {}, {}};
    for (const cdb::field &f : cdb::fields_of<Record>) {
        const std::byte *from = bytes + f.offset;
        if (contains(layout, f.name))
            continue;
        if (f.kind == cdb::field_kind::number)
            add_number(made, kind, f, f.width == 2 ? load<std::uint16_t>(from) : load<std::uint32_t>(from));
        else if (f.kind == cdb::field_kind::reference)
            add_reference(made, f, load<cdb_ref_t>(from), tables, type);
        else if (f.kind == cdb::field_kind::value)
            add_value(made, f, {area, at + f.offset, type, tables.strings}, tables.strings);
    }
    return made;
}

template <class Record>
void builder::add_records(thing &to, table from, const cdb::class_tables &tables, const cdb_ref_t &first,
                          std::size_t count) {
    std::size_t at = first.offset[0];
    for (std::size_t i = 0; i < count; ++i, at += sizeof(Record))
        to.parts.push_back(record<Record>(kinds[static_cast<std::size_t>(from)], tables.section, at, tables));
}

/* What seems to be the valid values of the last attribute of a table. */
void drop_valid_values(thing &of_class, std::string_view kind) {
    auto last =
        std::find_if(of_class.parts.rbegin(), of_class.parts.rend(), [&](const thing &t) { return t.kind == kind; });
    std::erase_if(last->parts, [](const thing &part) { return part.kind == VALID_VALUE; });
}

thing builder::resource_class(const cdb::bytes &section, bool is_last) {
    cdb::resource_class view(section);
    const rsrc_class_t &rc = view.record();
    const cdb::class_tables &tables = view.side_tables();
    thing made = record<rsrc_class_t>({"ResourceClass", rc_props}, section, 0, tables);
    add_records<rsrc_pattr_t>(made, table::persistent_attributes, tables, rc.u_rc_pattrs, rc.rc_num_pattrs);
    add_records<rsrc_pattr_t>(made, table::persistent_class_attributes, tables, rc.u_rc_pattrsC, rc.rc_num_pattrsC);
    add_records<rsrc_dattr_t>(made, table::dynamic_attributes, tables, rc.u_rc_dattrs, rc.rc_num_dattrs);
    add_records<rsrc_dattr_t>(made, table::dynamic_class_attributes, tables, rc.u_rc_dattrsC, rc.rc_num_dattrsC);
    add_records<rsrc_action_t>(made, table::actions, tables, rc.u_rc_actions, rc.rc_num_actions);
    add_records<rsrc_action_t>(made, table::class_actions, tables, rc.u_rc_actionsC, rc.rc_num_actionsC);
    std::array<bool, ATTRIBUTE_TABLES> without = without_valid_values(view, is_last);
    for (std::size_t t = 0; t < without.size(); ++t)
        if (without[t])
            drop_valid_values(made, kinds[t].name);
    return made;
}

thing builder::variable_class(const cdb::bytes &section) {
    cdb::variable_class view(section);
    cdb::class_tables tables;
    tables.strings = section.part(sizeof(rsrc_variable_class_t), view.record().u_rvc_string_tbl.offset[0]);
    thing made = record<rsrc_variable_class_t>({"ResourceVariableClass", {}}, section, 0, tables);
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
    cdb::class_tables tables;
    switch (type) {
    case CDB_DSECT_CLASS:
        return resource_class(bytes, index == last_class());
    case CDB_DSECT_VAR_CLASS:
        return variable_class(bytes);
    case CDB_DSECT_RSRC_MGR:
        tables.strings = bytes.part(sizeof(rsrc_mgr_t));
        return record<rsrc_mgr_t>({"ResourceManager", {}}, bytes, 0, tables);
    case CDB_DSECT_CMMAP:
        tables.strings = bytes.part(bytes.record<rsrc_cmmap_t>(0).u_rcm_strings.offset[0]);
        return record<rsrc_cmmap_t>({"ClassToManagerMapping", {}}, bytes, 0, tables);
    case CDB_DSECT_UNUSED:
    case CDB_DSECT_EMPTY:
    case CDB_DSECT_TBL_CNTRS:
    case CDB_DSECT_CLASS_HASH:
        break;
    }
    return {"section of type " + std::to_string(type), {}, {}, {}};
}

std::size_t builder::last_class() const {
    std::size_t last = db.section_count();
    while (last > 0 && db.anchor(last - 1).cda_type != CDB_DSECT_CLASS)
        --last;
    return last - 1;
}

thing builder::whole() {
    thing made = record<orb_cdb_header_t>({"database", {}}, db.file(), 0, {});
    for (std::size_t i = 0; i < db.section_count(); ++i) {
        made.parts.push_back(section(i));
        made.parts.back().facts.push_back({"cda_revision", "revision", std::to_string(db.anchor(i).cda_revision)});
    }
    return made;
}

} // namespace

bool is_layout(std::string_view field) {
    return contains(layout, field);
}

thing meaning_of(const cdb::database &db) {
    return builder(db).whole();
}

} // namespace cdef
