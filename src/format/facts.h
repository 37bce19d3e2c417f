/* facts.h: the meaning of the fields of records. There is one row for each field of each record that a file may
 * contain, in the order of include/cdb_fields.h. A field without a row, or a row without a field, does not compile. */
#ifndef CDGEN_FORMAT_FACTS_H
#define CDGEN_FORMAT_FACTS_H

#include "cdb_fields.h"
#include "format/constants.h"
#include "format/names.h"

#include <algorithm>
#include <optional>

namespace cdb {

/* The meaning of a number or reference, if it is not a plain number or the reference that its row in cdb_fields.h
 * describes. */
enum class meaning : std::uint8_t {
    PLAIN,
    SIGNED,
    BITS,
    MARK, /* four characters, the first one in the highest byte */
    TIME, /* seconds since 1970; 0: none */
    CHECKSUM,
    SECTION_TYPE,
    CLASS_PROPERTIES,
    PERSISTENT_PROPERTIES,
    DYNAMIC_PROPERTIES,
    ACTION_PROPERTIES,
    PERMISSIONS,
    DATA_TYPE,
    VARIABLE_TYPE,
    VERSION,
    NONE_IS_0,
    NONE_IS_255,
    NONE_IS_65535,
    LOCATOR, /* of a persistent attribute: the low half of its ID; 65535: none */
    MANAGER,
    BOUND,  /* of a dynamic attribute's values */
    OFFSET, /* where something is stored, and nothing else */
    UNUSED  /* a reference that is 0 in every compiled file */
};

/* The role of a field in a comparison of records. */
enum class role : std::uint8_t {
    CONTENT,
    NAME,   /* finds the record */
    NUMBER, /* likewise, for programs */
    LAYOUT  /* layout, not content: where things are stored, how many or how long they are, or when the file was made */
};

struct field_fact {
    std::string_view field; /* as in cdb_fields.h */
    meaning as = meaning::PLAIN;
    role is = role::CONTENT;
    std::string_view words = {};              /* its name in messages; if empty, the name of the field */
    std::string_view lines = {};              /* attributes, or runs of SD stanzas, that fill it: "A B" */
    std::optional<std::uint32_t> always = {}; /* the value that the compiler gives it in every file */

    constexpr std::string_view label() const {
        return words.empty() ? field : words;
    }
};

/* The names of the bits in a field of properties; empty for any other field. */
constexpr std::span<const props_t> properties_of(meaning as) {
    switch (as) {
    case meaning::CLASS_PROPERTIES:
        return rc_props;
    case meaning::PERSISTENT_PROPERTIES:
        return pa_props;
    case meaning::DYNAMIC_PROPERTIES:
        return da_props;
    case meaning::ACTION_PROPERTIES:
        return act_props;
    default:
        return {};
    }
}

/* The number that means "none" in a field of this meaning. */
constexpr std::optional<std::uint32_t> none_of(meaning as) {
    switch (as) {
    case meaning::NONE_IS_0:
        return 0;
    case meaning::NONE_IS_255:
        return NO_GROUP;
    case meaning::NONE_IS_65535:
        return NO_SD_INDEX;
    case meaning::LOCATOR:
        return NO_LOCATOR;
    default:
        return std::nullopt;
    }
}

/* ---- How rows are made ----------------------------------------------------------------------------------------- */

namespace facts {

using enum meaning;

/* Filled by lines of a source. */
consteval field_fact filled(std::string_view field, std::string_view lines, std::string_view words,
                            meaning as = PLAIN) {
    return {.field = field, .as = as, .words = words, .lines = lines};
}

/* The same, for a field by which records are found. */
consteval field_fact name(std::string_view field, std::string_view lines = {}) {
    return {.field = field, .is = role::NAME, .lines = lines};
}
consteval field_fact number(std::string_view field, std::string_view lines, std::string_view words) {
    return {.field = field, .as = SIGNED, .is = role::NUMBER, .words = words, .lines = lines};
}

consteval field_fact layout(std::string_view field, meaning as = PLAIN) {
    return {.field = field, .as = as, .is = role::LAYOUT};
}

/* No line fills it, and the compiler gives it the same value in every file. */
consteval field_fact constant(std::string_view field, std::string_view words = {}, meaning as = PLAIN,
                              std::uint32_t value = 0) {
    return {.field = field, .as = as, .words = words, .always = value};
}

/* Lines of a source set a field of another record; the compiler leaves 0 here. */
consteval field_fact elsewhere(std::string_view field, std::string_view lines, std::string_view words, meaning as) {
    return {.field = field, .as = as, .words = words, .lines = lines, .always = 0};
}

/* A field of a record that the compiler does not write. */
consteval field_fact unmade(std::string_view field, std::string_view words = {}, meaning as = PLAIN) {
    return {.field = field, .as = as, .words = words};
}

/* Reserved bytes, or the beginning of a list's entries. */
consteval field_fact nothing(std::string_view field) {
    return {.field = field, .is = role::LAYOUT};
}

/* ---- The file and its sections --------------------------------------------------------------------------------- */

inline constexpr field_fact header[] = {
    layout("cdb_hdr_length"),
    layout("cdb_hdr_checksum", CHECKSUM),
    layout("cdb_hdr_format", MARK),
    constant("cdb_hdr_seqno", "sequence number"),
    layout("cdb_hdr_timestamp.tv_sec", TIME),
    layout("cdb_hdr_timestamp.tv_usec"),
    layout("cdb_hdr_dsect_count"),
    layout("cdb_hdr_max_rm_id"),
    layout("cdb_hdr_max_class_id"),
    layout("cdb_hdr_rsrc_class_size"),
    layout("cdb_hdr_rsrc_cmmap_size"),
    layout("cdb_hdr_rsrc_mgr_size"),
    layout("cdb_hdr_rsrc_variable_class_size"),
    layout("cdb_hdr_rsrc_pattr_size"),
    layout("cdb_hdr_rsrc_dattr_size"),
    layout("cdb_hdr_rsrc_action_size"),
    layout("cdb_hdr_rsrc_error_size"),
    layout("cdb_hdr_rsrc_depend_size"),
    nothing("cdb_hdr_spares"),
};

inline constexpr field_fact anchor[] = {
    layout("cda_type", SECTION_TYPE),
    layout("cda_offset", OFFSET),
    layout("cda_length"),
    constant("cda_revision", "revision"),
};

/* ---- Classes --------------------------------------------------------------------------------------------------- */

inline constexpr field_fact resource_class[] = {
    layout("rc_cb_ID", MARK),
    filled("rc_props", "Properties", "properties", CLASS_PROPERTIES),
    name("u_rc_name", "Name"),
    constant("u_rc_alias", "alias", PLAIN, CDB_NONE),
    layout("u_rc_pattrsC", OFFSET),
    layout("u_rc_dattrsC", OFFSET),
    layout("u_rc_pattrs", OFFSET),
    layout("u_rc_dattrs", OFFSET),
    filled("u_rc_def_input", "DefineSDDefinition", "define input element"),
    filled("u_rc_undef_input", "UndefineSDDefinition", "undefine input element"),
    filled("u_rc_online_input", "OnlineSDDefinition", "online input element"),
    filled("u_rc_offline_input", "OfflineSDDefinition", "offline input element"),
    filled("u_rc_reset_input", "ResetSDDefinition", "reset input element"),
    layout("u_rc_actionsC", OFFSET),
    layout("u_rc_actions", OFFSET),
    layout("u_rc_errors", UNUSED),
    layout("u_rc_depends", UNUSED),
    layout("u_rc_variety_lists", OFFSET),
    layout("u_rc_sbs_defs", UNUSED),
    layout("u_rc_sd_defs", OFFSET),
    layout("u_rc_valid_vals", OFFSET),
    layout("u_rc_strings", OFFSET),
    layout("rc_num_pattrsC"),
    layout("rc_num_dattrsC"),
    layout("rc_num_pattrs"),
    layout("rc_num_dattrs"),
    layout("rc_num_actionsC"),
    layout("rc_num_actions"),
    constant("rc_num_errors", "errors"),
    constant("rc_num_depends", "dependencies"),
    layout("rc_varlist_size"),
    constant("rc_sbs_size"),
    layout("rc_sd_size"),
    layout("rc_valval_size"),
    filled("rc_perm_temp", "ResourcePermTemplate", "resource permission template", BITS),
    filled("rc_perm_tempC", "ClassPermTemplate", "class permission template", BITS),
    constant("rc_class_id", "class number"),
    filled("rc_dscr_msgid", "Description", "description"),
    filled("rc_disp_msgid", "DisplayName", "display name"),
    filled("rc_locator", "Locator", "locator", LOCATOR),
    filled("rc_version", "FileVersion", "version", VERSION),
    nothing("rc_spare"),
};

inline constexpr field_fact pattr[] = {
    layout("ra_cb_ID", MARK),
    filled("ra_props", "Properties", "properties", PERSISTENT_PROPERTIES),
    name("u_ra_name", "Name"),
    filled("ra_dscr_msgid", "Description", "description"),
    filled("ra_disp_msgid", "DisplayName", "display name"),
    filled("ra_group_msgid", "GroupName", "group name", NONE_IS_0),
    filled("ra_group_id", "GroupID", "group", NONE_IS_255),
    filled("ra_dflt_value", "DefaultValue", "default"),
    number("ra_attr_id", "Id", "Id"),
    filled("ra_data_type", "DataType", "type", DATA_TYPE),
    filled("u_ra_variety_list", "VarietyRange", "varieties"),
    filled("u_ra_valid_vals", "ValidValue ValueDisplayName", "valid values"),
    filled("u_ra_sd", "PAttrSDDefinition", "element"),
    filled("ra_max_sd_idx", "PAttrSDDefinition", "highest element index", NONE_IS_65535),
    nothing("ra_reserved2"),
};

inline constexpr field_fact dattr[] = {
    layout("ra_cb_ID", MARK),
    filled("ra_props", "Properties", "properties", DYNAMIC_PROPERTIES),
    name("u_ra_name", "Name"),
    elsewhere("u_ra_vclass", "VariableClass", {}, UNUSED), /* the variable class has a list of IDs */
    constant("u_ra_next_in_vclass", {}, UNUSED),
    filled("ra_init_value", "InitialValue", "initial value"),
    filled("ra_min_value", "Range", "lower bound", BOUND),
    filled("ra_max_value", "Range", "upper bound", BOUND),
    filled("u_ra_variety_list", "VarietyRange", "varieties"),
    filled("u_ra_valid_vals", "ValidStateValue ValueDisplayName", "valid values"),
    filled("u_ra_sd", "DAttrSDDefinition", "element"),
    filled("u_ra_express", "Expression", "expression"),
    filled("u_ra_rearm_expr", "ReArmExpression", "re-arm expression"),
    constant("u_ra_ZAV_name", {}, UNUSED),
    filled("ra_data_type", "DataType", "type", DATA_TYPE),
    filled("ra_var_type", "VariableType", "variable type", VARIABLE_TYPE),
    filled("ra_dscr_msgid", "Description", "description"),
    filled("ra_disp_msgid", "DisplayName", "display name"),
    filled("ra_group_msgid", "GroupName", "group name", NONE_IS_0),
    filled("ra_group_id", "GroupID", "group", NONE_IS_255),
    number("ra_attr_id", "Id", "Id"),
    filled("ra_max_sd_idx", "DAttrSDDefinition", "highest element index", NONE_IS_65535),
    filled("ra_expr_desc", "ExpressionDescription", "expression description", NONE_IS_0),
    filled("ra_rearm_desc", "ReArmDescription", "re-arm description", NONE_IS_0),
    constant("ra_range_desc"),
    constant("ra_report_interval"),
    nothing("ra_reserved"),
};

inline constexpr field_fact action[] = {
    layout("ac_cb_ID", MARK),
    number("ac_action_id", "Id", "Id"),
    filled("ac_props", "Properties", "properties", ACTION_PROPERTIES),
    filled("ac_dscr_msgid", "Description", "description"),
    filled("ac_disp_msgid", "DisplayName", "display name"),
    filled("ac_confirm_msgid", "ConfirmationMsg", "confirmation", NONE_IS_0),
    filled("ac_timeout", "TimeOut", "time-out", NONE_IS_0),
    filled("ac_perms", "Permission", "permission", PERMISSIONS),
    name("u_ac_name", "Name"),
    filled("u_ac_variety_list", "VarietyRange", "varieties"),
    filled("u_ac_sd_input", "ActionInSDDefinition", "input element"),
    filled("u_ac_sd_resp", "ActionOutSDDefinition", "response element"),
};

inline constexpr field_fact error[] = {
    unmade("re_cb_ID", {}, MARK),
    unmade("re_error_id", "Id", SIGNED),
    unmade("re_props", "properties", BITS),
    unmade("re_dscr_msgid", "description"),
    unmade("re_disp_msgid", "display name"),
    name("u_re_name"),
    unmade("u_re_variety_list", "varieties"),
    unmade("u_re_sd_input", "input element"),
    unmade("re_perms", "permission", PERMISSIONS),
    nothing("re_reserved"),
};

inline constexpr field_fact depend[] = {
    unmade("rd_cb_ID", {}, MARK),
    unmade("rd_class_ID", "class number"),
    nothing("rd_reserved"),
};

/* ---- Lists ----------------------------------------------------------------------------------------------------- */

inline constexpr field_fact vl_entry[] = {
    filled("vl_low_val", "VarietyRange", "lowest variety"),
    filled("vl_high_val", "VarietyRange", "highest variety"),
};

inline constexpr field_fact variety_list[] = {
    layout("vl_cb_ID", MARK),
    layout("vl_count"),
    nothing("vl_values"),
};

inline constexpr field_fact vv_entry[] = {
    filled("vv_low_val", "ValidValue ValidStateValue", "lowest value"),
    filled("vv_high_val", "ValidValue ValidStateValue", "highest value"),
    filled("vv_disp_msgid", "ValueDisplayName", "display name", NONE_IS_0),
    nothing("vv_reserved"),
};

inline constexpr field_fact valid_values[] = {
    layout("vv_cb_ID", MARK),
    layout("vv_count"),
    nothing("vv_values"),
};

inline constexpr field_fact sd_field[] = {
    name("u_sd_field_name", "ElementName"),
    filled("sd_field_type", "DataType", "type", DATA_TYPE),
    filled("sd_disp_msgid", "DisplayName", "display name"),
    filled("sd_dscr_msgid", "Description", "description"),
    filled("u_sd_valid_vals", "ValidValue ValueDisplayName", "valid values"),
    constant("sd_action_id", "action", PLAIN, NO_ACTION_ID),
    constant("sd_valid_type", "valid type", PLAIN, SD_VALID_TYPE),
    nothing("sd_reserved"),
};

inline constexpr field_fact sd_def[] = {
    layout("sd_cb_ID", MARK),
    layout("sd_count"),
    nothing("sd_fields"),
};

/* ---- Other sections -------------------------------------------------------------------------------------------- */

inline constexpr field_fact mgr[] = {
    layout("rm_cb_ID", MARK),
    constant("rm_id", "number"),
    constant("rm_spare"),
    name("u_rm_RMname", "ResourceManager"),
    constant("u_rm_strings_table", {}, UNUSED),
};

inline constexpr field_fact cmmap[] = {
    layout("rcm_cb_ID", MARK),
    constant("rcm_class_ID", "class number"),
    elsewhere("rcm_rm_ID", "ResourceManager", "manager number", MANAGER), /* the only manager has the ID 0 */
    filled("u_rcm_msg_file", "MessageCatalog", "message catalog"),
    layout("u_rcm_strings", OFFSET),
    filled("rcm_dscr_msg_set", "DescriptiveMessageSet", "message set"),
    filled("rcm_first_key", "FirstKey", "first key"),
    filled("rcm_last_key", "LastKey", "last key"),
    constant("rcm_asnno_start"),
    constant("rcm_num_sctx"),
    constant("rcm_num_vctx"),
    constant("rcm_num_stats"),
    constant("rcm_num_ctx_tmplts"),
    constant("rcm_static_contexts"),
    constant("rcm_volatile_contexts"),
    constant("rcm_stats"),
    constant("rcm_ctx_tmplts"),
    nothing("rcm_reserved"),
};

inline constexpr field_fact variable_class[] = {
    layout("rvc_cb_ID", MARK),
    filled("rvc_obsv_interval", "ObservationInterval", "observation interval"),
    filled("rvc_report_interval", "ReportingInterval", "reporting interval"),
    name("u_rvc_name", "VariableClass"),
    filled("u_rvc_compat_name", "Alias", "alias"),
    layout("rvc_var_count"),
    layout("u_rvc_string_tbl", OFFSET),
    nothing("rvc_reserved"),
};

inline constexpr field_fact hash_block[] = {
    layout("u_rch_next_hash", OFFSET),
    unmade("rch_prim_hash_value", "hash value"),
    unmade("rch_class_id", "class number"),
    layout("u_rch_rsrc_class", OFFSET),
};

inline constexpr field_fact class_hash[] = {
    unmade("rch_cb_ID", {}, MARK),
    layout("u_rch_table", OFFSET),
    layout("rch_num_hash_blocks"),
    nothing("rc_hash_blocks"),
};

/* ---- Values that are stored among the strings ------------------------------------------------------------------ */

inline constexpr field_fact array[] = {
    layout("element_count"),
    nothing("pad"),
    nothing("elements"),
};

inline constexpr field_fact structured_data[] = {
    layout("element_count"),
    nothing("pad"),
    nothing("elements"),
};

inline constexpr field_fact structured_data_element[] = {
    unmade("data_type", "type", DATA_TYPE), /* the element's stanza fills it, as it does sd_field_type */
    nothing("pad"),
    unmade("value"),
};

} // namespace facts

} // namespace cdb

#endif
