/**
 * @file
 * The sections of a database, with their attributes, actions and lists. Include cdb_view.h, which includes this header.
 */
#ifndef CDGEN_CDB_SECTIONS_H
#define CDGEN_CDB_SECTIONS_H

#if __cplusplus < 202002L
#error "cdb_sections.h needs C++20"
#else

#include "cdb_values.h"

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace cdb {

/* ---- Inside a class -------------------------------------------------------------------------------------------- */

/** A class section, and those of its tables that records refer to. */
struct class_tables {
    /** The whole section, from the class record on. */
    bytes section;
    /** Names, texts and out-of-line values. */
    bytes strings;
    /** Lists of valid values. */
    bytes valid_vals;
    /** Lists of varieties. */
    bytes variety_lists;
    /** Definitions of structured data. */
    bytes sd_defs;
};

/** A range of varieties, both ends included. */
struct variety {
    /** Size in the file, in bytes. */
    static constexpr std::size_t SIZE = sizeof(vl_entry_t);

    /** The entry at a byte offset of the table. */
    variety(const bytes &variety_lists, std::uint64_t at)
        : low(variety_lists.number<std::uint32_t>(at + offsetof(vl_entry_t, vl_low_val))),
          high(variety_lists.number<std::uint32_t>(at + offsetof(vl_entry_t, vl_high_val))) {}

    /** The first variety. */
    std::uint32_t low;
    /** The last variety. */
    std::uint32_t high;
};

/** The varieties of an attribute or an action. */
using variety_list = list_of<variety, bytes>;

/** What is needed to read a list of valid values. */
struct valid_value_context {
    /** The tables of the class. */
    class_tables tables;
    /** The type of the values; for an attribute of an array type its element type. */
    vx_data_type_t type = VX_UNKNOWN;
};

/**
 * A valid value, or a range of them, both ends included. Only numbers, texts and binaries have valid values, so no
 * elements are followed here.
 */
struct valid_value {
    /** Size in the file, in bytes. */
    static constexpr std::size_t SIZE = sizeof(vv_entry_t);

    /** The entry at a byte offset of the table. */
    valid_value(const valid_value_context &of, std::uint64_t at)
        : low(of.tables.valid_vals, at + offsetof(vv_entry_t, vv_low_val), of.type, of.tables.strings, NESTING_MAX),
          high(of.tables.valid_vals, at + offsetof(vv_entry_t, vv_high_val), of.type, of.tables.strings, NESTING_MAX),
          message(of.tables.valid_vals.number<std::uint16_t>(at + offsetof(vv_entry_t, vv_disp_msgid))) {}

    /** The lowest value. */
    value low;
    /** The highest value; for a single value the same again. */
    value high;
    /** Number of the message that names the value; 0: none. */
    std::uint16_t message;
};

/** The valid values of an attribute or an element. */
using valid_value_list = list_of<valid_value, valid_value_context>;

/** The list that a reference leads to; empty if the reference leads to nothing. */
inline variety_list varieties_at(const class_tables &tables, const cdb_ref_t &ref) {
    std::uint64_t at = ref.offset[0];
    if (ref.offset[0] == CDB_NONE)
        return {};
    std::uint64_t first = at + offsetof(variety_list_t, vl_values);
    auto count = tables.variety_lists.number<std::uint32_t>(at + offsetof(variety_list_t, vl_count));
    return {tables.variety_lists, first, count_inside(tables.variety_lists, first, count, variety::SIZE)};
}

/**
 * The list that a reference leads to; empty if the reference leads to nothing. `owner` is the data type of the
 * attribute or element that the values are valid for.
 */
inline valid_value_list valid_values_at(const class_tables &tables, const cdb_ref_t &ref, vx_data_type_t owner) {
    std::uint64_t at = ref.offset[0];
    if (ref.offset[0] == CDB_NONE)
        return {};
    std::uint64_t first = at + offsetof(valid_values_t, vv_values);
    auto count = tables.valid_vals.number<std::uint32_t>(at + offsetof(valid_values_t, vv_count));
    return {{tables, element_type(owner)}, first, count_inside(tables.valid_vals, first, count, valid_value::SIZE)};
}

/** An element of a definition of structured data. */
class sd_element {
public:
    /** Size in the file, in bytes. */
    static constexpr std::size_t SIZE = sizeof(sd_field_t);

    /** The element at a byte offset of the table. */
    sd_element(const class_tables &of, std::uint64_t at) : tables(of), fields(of.sd_defs.record<sd_field_t>(at)) {}

    /** The element's record as in cdb.h, in the byte order of this machine. It is valid as long as this object. */
    const sd_field_t &record() const {
        return fields;
    }
    /** The element's name. */
    std::string_view name() const {
        return tables.strings.text(fields.u_sd_field_name);
    }
    /** The type of the element. In an unsound file it may be any number. */
    vx_data_type_t type() const {
        return fields.sd_field_type;
    }
    /** The valid values; empty if none are defined. */
    valid_value_list valid_values() const {
        return valid_values_at(tables, fields.u_sd_valid_vals, fields.sd_field_type);
    }

private:
    class_tables tables;
    sd_field_t fields;
};

/** A definition of structured data: its elements, in their order. */
using sd_definition = list_of<sd_element, class_tables>;

/** The definition that a reference leads to; empty if the reference leads to nothing. */
inline sd_definition sd_definition_at(const class_tables &tables, const cdb_ref_t &ref) {
    std::uint64_t at = ref.offset[0];
    if (ref.offset[0] == CDB_NONE)
        return {};
    std::uint64_t first = at + offsetof(sd_def_t, sd_fields);
    auto count = tables.sd_defs.number<std::uint32_t>(at + offsetof(sd_def_t, sd_count));
    return {tables, first, count_inside(tables.sd_defs, first, count, sd_element::SIZE)};
}

/**
 * An attribute: persistent (`rsrc_pattr_t`) or dynamic (`rsrc_dattr_t`). Use the names persistent_attribute and
 * dynamic_attribute.
 */
template <class Record> class attribute {
public:
    /** Size in the file, in bytes. */
    static constexpr std::size_t SIZE = sizeof(Record);

    /** The attribute at a byte offset of the class section. */
    attribute(const class_tables &of, std::uint64_t offset)
        : tables(of), at(offset), fields(of.section.record<Record>(offset)) {}

    /**
     * The attribute's record as in cdb.h, in the byte order of this machine: message numbers, properties, groups. Value
     * cells are left as they are in the file. It is valid as long as this object.
     */
    const Record &record() const {
        return fields;
    }
    /** The attribute's name. */
    std::string_view name() const {
        return tables.strings.text(fields.u_ra_name);
    }
    /** The attribute's number, as the source gave it. */
    std::int32_t id() const {
        return fields.ra_attr_id;
    }
    /** The type of its values. In an unsound file it may be any number. */
    vx_data_type_t type() const {
        return fields.ra_data_type;
    }
    /** The varieties that have the attribute. */
    variety_list varieties() const {
        return varieties_at(tables, fields.u_ra_variety_list);
    }
    /**
     * The valid values; empty if none are defined. If verify() warns with CDB353, they belong to another attribute:
     * ignore them.
     */
    valid_value_list valid_values() const {
        return valid_values_at(tables, fields.u_ra_valid_vals, fields.ra_data_type);
    }
    /** The elements of an `SD` or `SDArray` attribute; empty for any other type, and if none are defined. */
    sd_definition structure() const {
        return sd_definition_at(tables, fields.u_ra_sd);
    }

    /** The default value of a persistent attribute. */
    value default_value() const requires std::is_same_v<Record, rsrc_pattr_t> {
        return cell(offsetof(rsrc_pattr_t, ra_dflt_value));
    }

    /** The value of a dynamic attribute before its first observation. */
    value initial_value() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return cell(offsetof(rsrc_dattr_t, ra_init_value));
    }
    /**
     * The lower bound of a dynamic attribute: a number, or an array of one. If verify() warns with CDB452, it belongs
     * to another attribute: ignore it. Elements of the array are not followed further.
     */
    value min_value() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return cell(offsetof(rsrc_dattr_t, ra_min_value), NESTING_MAX - 1);
    }
    /** The upper bound, as for min_value(). */
    value max_value() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return cell(offsetof(rsrc_dattr_t, ra_max_value), NESTING_MAX - 1);
    }
    /** The condition that reports an event, as the source gave it; empty if there is none. */
    std::string_view expression() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return tables.strings.text(fields.u_ra_express);
    }
    /** The condition that re-arms the event, as the source gave it; empty if there is none. */
    std::string_view rearm_expression() const requires std::is_same_v<Record, rsrc_dattr_t> {
        return tables.strings.text(fields.u_ra_rearm_expr);
    }

private:
    value cell(std::size_t offset, unsigned nesting = 0) const {
        return {tables.section, at + offset, fields.ra_data_type, tables.strings, nesting};
    }

    class_tables tables;
    std::uint64_t at; /**< in the section */
    Record fields;
};

/** An attribute that is stored. */
using persistent_attribute = attribute<rsrc_pattr_t>;
/** An attribute that changes by itself and is observed. */
using dynamic_attribute = attribute<rsrc_dattr_t>;

/** An action of a class or of its resources. */
class action {
public:
    /** Size in the file, in bytes. */
    static constexpr std::size_t SIZE = sizeof(rsrc_action_t);

    /** The action at a byte offset of the class section. */
    action(const class_tables &of, std::uint64_t at) : tables(of), fields(of.section.record<rsrc_action_t>(at)) {}

    /**
     * The action's record as in cdb.h, in the byte order of this machine: message numbers, properties, permissions,
     * time-out. It is valid as long as this object.
     */
    const rsrc_action_t &record() const {
        return fields;
    }
    /** The action's name. */
    std::string_view name() const {
        return tables.strings.text(fields.u_ac_name);
    }
    /** The action's number, as the source gave it. */
    std::int32_t id() const {
        return fields.ac_action_id;
    }
    /** The varieties that have the action. */
    variety_list varieties() const {
        return varieties_at(tables, fields.u_ac_variety_list);
    }
    /** The elements of the action's input; empty if it has none. */
    sd_definition input() const {
        return sd_definition_at(tables, fields.u_ac_sd_input);
    }
    /** The elements of the action's response; empty if it has none. */
    sd_definition response() const {
        return sd_definition_at(tables, fields.u_ac_sd_resp);
    }

private:
    class_tables tables;
    rsrc_action_t fields;
};

/* ---- Sections -------------------------------------------------------------------------------------------------- */

/** The owner of attributes or actions: each resource of a class, or the class itself. */
enum class level { of_resource, of_class };

/** A class section. */
class resource_class {
public:
    /** The type of class sections in their anchors. */
    static constexpr cdb_dsect_type_t TYPE = CDB_DSECT_CLASS;

    /** The class whose section these bytes are. database::classes() makes them. */
    explicit resource_class(const bytes &section) : fields(section.record<rsrc_class_t>(0)) {
        auto table = [&](const cdb_ref_t &ref, std::uint64_t size) { return section.part(ref.offset[0], size); };
        tables = {section, table(fields.u_rc_strings, UINT64_MAX), table(fields.u_rc_valid_vals, fields.rc_valval_size),
                  table(fields.u_rc_variety_lists, fields.rc_varlist_size),
                  table(fields.u_rc_sd_defs, fields.rc_sd_size)};
    }

    /** The class record as in cdb.h, in the byte order of this machine. It is valid as long as this object. */
    const rsrc_class_t &record() const {
        return fields;
    }
    /** The class's name. */
    std::string_view name() const {
        return tables.strings.text(fields.u_rc_name);
    }
    /** Another name of the class; empty if there is none. The compiler writes none. */
    std::string_view alias() const {
        return tables.strings.text(fields.u_rc_alias);
    }
    /** The persistent attributes of each resource, or of the class itself, in the order of the source. */
    list_of<persistent_attribute, class_tables> persistent_attributes(level of) const {
        return of == level::of_class ? records<persistent_attribute>(fields.u_rc_pattrsC, fields.rc_num_pattrsC)
                                     : records<persistent_attribute>(fields.u_rc_pattrs, fields.rc_num_pattrs);
    }
    /** The dynamic attributes of each resource, or of the class itself, in the order of the source. */
    list_of<dynamic_attribute, class_tables> dynamic_attributes(level of) const {
        return of == level::of_class ? records<dynamic_attribute>(fields.u_rc_dattrsC, fields.rc_num_dattrsC)
                                     : records<dynamic_attribute>(fields.u_rc_dattrs, fields.rc_num_dattrs);
    }
    /** The actions of each resource, or of the class itself, in the order of the source. */
    list_of<action, class_tables> actions(level of) const {
        return of == level::of_class ? records<action>(fields.u_rc_actionsC, fields.rc_num_actionsC)
                                     : records<action>(fields.u_rc_actions, fields.rc_num_actions);
    }
    /**
     * The elements of one of the class's five inputs, named by its field in the class record, as in
     * `sd_input(&rsrc_class_t::u_rc_def_input)`. Empty if the class does not define it.
     */
    sd_definition sd_input(cdb_ref_t rsrc_class_t::*input) const {
        return sd_definition_at(tables, fields.*input);
    }
    /** The section and its tables, for readers that follow references of record() themselves. */
    const class_tables &side_tables() const {
        return tables;
    }

private:
    template <class Item> list_of<Item, class_tables> records(const cdb_ref_t &ref, std::size_t count) const {
        std::uint64_t first = ref.offset[0];
        return {tables, first, count_inside(tables.section, first, count, Item::SIZE)};
    }

    rsrc_class_t fields;
    class_tables tables;
};

/** A manager section. */
class manager {
public:
    /** The type of manager sections in their anchors. */
    static constexpr cdb_dsect_type_t TYPE = CDB_DSECT_RSRC_MGR;

    /** The manager whose section these bytes are. database::managers() makes them. */
    explicit manager(const bytes &section)
        : fields(section.record<rsrc_mgr_t>(0)), texts(section.part(sizeof(rsrc_mgr_t))) {}

    /** The manager's record as in cdb.h, in the byte order of this machine. It is valid as long as this object. */
    const rsrc_mgr_t &record() const {
        return fields;
    }
    /** The manager's name. */
    std::string_view name() const {
        return texts.text(fields.u_rm_RMname);
    }
    /** The strings of the section, which references in the record lead into. */
    const bytes &strings() const {
        return texts;
    }

private:
    rsrc_mgr_t fields;
    bytes texts;
};

/** A class-to-manager map section: which manager serves a class, and where the class's messages are. */
class class_map {
public:
    /** The type of map sections in their anchors. */
    static constexpr cdb_dsect_type_t TYPE = CDB_DSECT_CMMAP;

    /** The map whose section these bytes are. database::maps() makes them. */
    explicit class_map(const bytes &section) : fields(section.record<rsrc_cmmap_t>(0)) {
        texts = section.part(fields.u_rcm_strings.offset[0]);
    }

    /**
     * The map's record as in cdb.h, in the byte order of this machine: the manager's number, keys, the message set. It
     * is valid as long as this object.
     */
    const rsrc_cmmap_t &record() const {
        return fields;
    }
    /** The file name of the message catalog; empty if none was given. */
    std::string_view message_catalog() const {
        return texts.text(fields.u_rcm_msg_file);
    }
    /** The strings of the section, which references in the record lead into. */
    const bytes &strings() const {
        return texts;
    }

private:
    rsrc_cmmap_t fields;
    bytes texts;
};

/** A dynamic attribute of a variable class. */
struct variable_id {
    /** Size in the file, in bytes. */
    static constexpr std::size_t SIZE = sizeof(var_id_t);

    /** The entry at a byte offset of the section. */
    variable_id(const bytes &section, std::uint64_t at) : number(section.number<var_id_t>(at)) {}

    /** True for an attribute of the class itself, false for one of its resources. */
    bool of_class() const {
        return (number & VAR_ID_CLASS_ATTR) != 0;
    }

    /** The attribute's number; for an attribute of the class itself with bit 0x8000 (VAR_ID_CLASS_ATTR) set. */
    var_id_t number;
};

/** A variable class section: attributes that are observed and reported together. */
class variable_class {
public:
    /** The type of variable class sections in their anchors. */
    static constexpr cdb_dsect_type_t TYPE = CDB_DSECT_VAR_CLASS;

    /** The variable class whose section these bytes are. database::variable_classes() makes them. */
    explicit variable_class(const bytes &whole)
        : fields(whole.record<rsrc_variable_class_t>(0)), section(whole),
          texts(whole.part(sizeof fields, fields.u_rvc_string_tbl.offset[0])) {}

    /**
     * The record as in cdb.h, in the byte order of this machine: the two intervals. It is valid as long as this object.
     */
    const rsrc_variable_class_t &record() const {
        return fields;
    }
    /** The variable class's name. */
    std::string_view name() const {
        return texts.text(fields.u_rvc_name);
    }
    /** Its other name; empty if there is none. */
    std::string_view alias() const {
        return texts.text(fields.u_rvc_compat_name);
    }
    /** The strings of the section, which references in the record lead into. */
    const bytes &strings() const {
        return texts;
    }
    /** The dynamic attributes that belong to it: those of the class first, then those of its resources. */
    list_of<variable_id, bytes> variable_ids() const {
        std::uint64_t first = sizeof fields + std::uint64_t{fields.u_rvc_string_tbl.offset[0]};
        return {section, first, count_inside(section, first, fields.rvc_var_count, variable_id::SIZE)};
    }

private:
    rsrc_variable_class_t fields;
    bytes section;
    bytes texts;
};

} // namespace cdb

#endif
#endif
