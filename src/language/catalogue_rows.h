/* catalogue_rows.h: the rows of the catalogue, for tables that are derived from them at compile time. Code that looks a
 * name up at run time uses catalogue.h. */
#ifndef CDGEN_LANGUAGE_CATALOGUE_ROWS_H
#define CDGEN_LANGUAGE_CATALOGUE_ROWS_H

#include "language/catalogue.h"

#include <cstddef>

namespace language::rows {

inline constexpr int ONCE = 0;
inline constexpr int REPEAT = 1;

/* One attribute. The record and the member name the field that it fills. */
#define ATTR(name, type, record, field, bit, repeat)                                                                   \
    table_attrs {                                                                                                      \
        name, type, offsetof(record, field), bit, repeat                                                               \
    }

inline constexpr table_attrs control_attrs[] = {
    ATTR("FileVersion", AT_VERSION, rsrc_class_t, rc_version, 0x1, ONCE),
};

inline constexpr table_attrs cmmap_attrs[] = {
    ATTR("ResourceManager", AT_MANAGER, rsrc_cmmap_t, rcm_rm_ID, 0x1, ONCE),
    ATTR("FirstKey", AT_UINT16, rsrc_cmmap_t, rcm_first_key, 0x2, ONCE),
    ATTR("LastKey", AT_UINT16, rsrc_cmmap_t, rcm_last_key, 0x4, ONCE),
    ATTR("MessageCatalog", AT_STRING, rsrc_cmmap_t, u_rcm_msg_file, 0x8, ONCE),
    ATTR("DescriptiveMessageSet", AT_UINT16, rsrc_cmmap_t, rcm_dscr_msg_set, 0x10, ONCE),
};

inline constexpr table_attrs variable_class_attrs[] = {
    ATTR("ObservationInterval", AT_UINT16, rsrc_variable_class_t, rvc_obsv_interval, 0x2, ONCE),
    ATTR("ReportingInterval", AT_UINT16, rsrc_variable_class_t, rvc_report_interval, 0x4, ONCE),
    ATTR("VariableClass", AT_STRING, rsrc_variable_class_t, u_rvc_name, 0x1, ONCE),
    ATTR("Alias", AT_STRING, rsrc_variable_class_t, u_rvc_compat_name, OPTIONAL | 0x1, ONCE),
};

inline constexpr table_attrs class_attrs[] = {
    ATTR("Properties", AT_CLASS_PROPS, rsrc_class_t, rc_props, 0x4, ONCE),
    ATTR("ClassPermTemplate", AT_PERM_TEMPLATE, rsrc_class_t, rc_perm_tempC, 0x8, ONCE),
    ATTR("ResourcePermTemplate", AT_PERM_TEMPLATE, rsrc_class_t, rc_perm_temp, 0x10, ONCE),
    ATTR("Locator", AT_LOCATOR, rsrc_class_t, rc_locator, OPTIONAL | 0x2, ONCE),
    ATTR("Description", AT_UINT16, rsrc_class_t, rc_dscr_msgid, 0x1, ONCE),
    ATTR("DisplayName", AT_UINT16, rsrc_class_t, rc_disp_msgid, 0x2, ONCE),
    ATTR("Name", AT_STRING, rsrc_class_t, u_rc_name, OPTIONAL | 0x10, ONCE),
};

inline constexpr table_attrs pattr_attrs[] = {
    ATTR("Name", AT_STRING, rsrc_pattr_t, u_ra_name, 0x1, ONCE),
    ATTR("Description", AT_UINT16, rsrc_pattr_t, ra_dscr_msgid, 0x2, ONCE),
    ATTR("DisplayName", AT_UINT16, rsrc_pattr_t, ra_disp_msgid, 0x4, ONCE),
    ATTR("Id", AT_ID, rsrc_pattr_t, ra_attr_id, 0x8, ONCE),
    ATTR("DataType", AT_DATA_TYPE, rsrc_pattr_t, ra_data_type, 0x10, ONCE),
    ATTR("VarietyRange", AT_VARIETY, rsrc_pattr_t, u_ra_variety_list, 0x20, REPEAT),
    ATTR("GroupID", AT_UINT16, rsrc_pattr_t, ra_group_id, OPTIONAL | 0x1, ONCE),
    ATTR("GroupName", AT_UINT16, rsrc_pattr_t, ra_group_msgid, OPTIONAL | 0x2, ONCE),
    ATTR("Properties", AT_PATTR_PROPS, rsrc_pattr_t, ra_props, OPTIONAL | 0x4, ONCE),
    ATTR("ValidValue", AT_VALID_VALUE, rsrc_pattr_t, u_ra_valid_vals, OPTIONAL | 0x10, REPEAT),
    /* These three fill a field of the latest valid value, or no field. */
    ATTR("ValueDisplayName", AT_VALUE_DISPLAY, rsrc_pattr_t, u_ra_valid_vals, OPTIONAL | 0x20, REPEAT),
    ATTR("DefaultValue", AT_DEFAULT_VALUE, rsrc_pattr_t, ra_dflt_value, OPTIONAL | 0x8, REPEAT),
    ATTR("ListActionRsrc", AT_LIST_ACTION_RSRC, rsrc_pattr_t, ra_cb_ID, OPTIONAL | 0x40, ONCE),
    ATTR("ListActionClass", AT_LIST_ACTION_CLASS, rsrc_pattr_t, ra_cb_ID, OPTIONAL | 0x80, ONCE),
};

inline constexpr table_attrs dattr_attrs[] = {
    ATTR("Name", AT_STRING, rsrc_dattr_t, u_ra_name, 0x1, ONCE),
    ATTR("VariableClass", AT_STRING, rsrc_dattr_t, u_ra_vclass, OPTIONAL | 0x100, ONCE),
    ATTR("Description", AT_UINT16, rsrc_dattr_t, ra_dscr_msgid, 0x2, ONCE),
    ATTR("DisplayName", AT_UINT16, rsrc_dattr_t, ra_disp_msgid, 0x4, ONCE),
    ATTR("Id", AT_ID, rsrc_dattr_t, ra_attr_id, 0x8, ONCE),
    ATTR("DataType", AT_DATA_TYPE, rsrc_dattr_t, ra_data_type, 0x10, ONCE),
    ATTR("VariableType", AT_VARIABLE_TYPE, rsrc_dattr_t, ra_var_type, 0x40, ONCE),
    ATTR("VarietyRange", AT_VARIETY, rsrc_dattr_t, u_ra_variety_list, 0x20, REPEAT),
    ATTR("GroupID", AT_UINT16, rsrc_dattr_t, ra_group_id, OPTIONAL | 0x1, ONCE),
    ATTR("GroupName", AT_UINT16, rsrc_dattr_t, ra_group_msgid, OPTIONAL | 0x2, ONCE),
    ATTR("Properties", AT_DATTR_PROPS, rsrc_dattr_t, ra_props, OPTIONAL | 0x4, ONCE),
    ATTR("InitialValue", AT_INITIAL_VALUE, rsrc_dattr_t, ra_init_value, OPTIONAL | 0x8, ONCE),
    ATTR("ValidStateValue", AT_VALID_VALUE, rsrc_dattr_t, u_ra_valid_vals, OPTIONAL | 0x10, REPEAT),
    ATTR("ValueDisplayName", AT_VALUE_DISPLAY, rsrc_dattr_t, u_ra_valid_vals, OPTIONAL | 0x20, REPEAT),
    ATTR("Expression", AT_STRING, rsrc_dattr_t, u_ra_express, OPTIONAL | 0x400, ONCE),
    ATTR("ExpressionDescription", AT_UINT16, rsrc_dattr_t, ra_expr_desc, OPTIONAL | 0x800, ONCE),
    ATTR("ReArmExpression", AT_STRING, rsrc_dattr_t, u_ra_rearm_expr, OPTIONAL | 0x1000, ONCE),
    ATTR("ReArmDescription", AT_UINT16, rsrc_dattr_t, ra_rearm_desc, OPTIONAL | 0x2000, ONCE),
    /* Fills ra_min_value too. */
    ATTR("Range", AT_RANGE, rsrc_dattr_t, ra_max_value, OPTIONAL | 0x200, ONCE),
    ATTR("ListActionRsrc", AT_LIST_ACTION_RSRC, rsrc_dattr_t, ra_cb_ID, OPTIONAL | 0x40, ONCE),
    ATTR("ListActionClass", AT_LIST_ACTION_CLASS, rsrc_dattr_t, ra_cb_ID, OPTIONAL | 0x80, ONCE),
};

inline constexpr table_attrs action_attrs[] = {
    ATTR("Name", AT_STRING, rsrc_action_t, u_ac_name, 0x1, ONCE),
    ATTR("Description", AT_UINT16, rsrc_action_t, ac_dscr_msgid, 0x2, ONCE),
    ATTR("DisplayName", AT_UINT16, rsrc_action_t, ac_disp_msgid, 0x4, ONCE),
    ATTR("Id", AT_ID, rsrc_action_t, ac_action_id, 0x8, ONCE),
    ATTR("VarietyRange", AT_VARIETY, rsrc_action_t, u_ac_variety_list, 0x10, REPEAT),
    ATTR("Properties", AT_ACTION_PROPS, rsrc_action_t, ac_props, OPTIONAL | 0x1, ONCE),
    ATTR("Permission", AT_PERMISSION, rsrc_action_t, ac_perms, OPTIONAL | 0x4, ONCE),
    ATTR("ConfirmationMsg", AT_UINT16, rsrc_action_t, ac_confirm_msgid, OPTIONAL | 0x8, ONCE),
    ATTR("TimeOut", AT_UINT16, rsrc_action_t, ac_timeout, OPTIONAL | 0x2, ONCE),
};

#undef ATTR

/* Fields of the one element that is staged at a time. */
#define SD_ATTR(name, type, field, bit, repeat)                                                                        \
    table_attrs {                                                                                                      \
        name, type, offsetof(sd_def_t, sd_fields) + offsetof(sd_field_t, field), bit, repeat                           \
    }

inline constexpr table_attrs sd_attrs[] = {
    SD_ATTR("ElementName", AT_SD_NAME, u_sd_field_name, 0x1, ONCE),
    SD_ATTR("Description", AT_SD_DESCRIPTION, sd_dscr_msgid, 0x2, ONCE),
    SD_ATTR("DisplayName", AT_SD_DISPLAY, sd_disp_msgid, 0x4, ONCE),
    /* Checked only. */
    SD_ATTR("ElementIndex", AT_SD_INDEX, sd_reserved, 0x8, ONCE),
    SD_ATTR("DataType", AT_SD_DATA_TYPE, sd_field_type, 0x10, ONCE),
    SD_ATTR("ValidValue", AT_SD_VALID_VALUE, u_sd_valid_vals, OPTIONAL | 0x2, REPEAT),
    SD_ATTR("ValueDisplayName", AT_SD_VALUE_DISPLAY, u_sd_valid_vals, OPTIONAL | 0x4, REPEAT),
    /* Rejected. */
    SD_ATTR("DefaultValue", AT_SD_DEFAULT_VALUE, sd_reserved, OPTIONAL | 0x1, REPEAT),
};

#undef SD_ATTR

constexpr vx_uint32_t required_mask(std::span<const table_attrs> attrs) {
    vx_uint32_t mask = 0;
    for (const table_attrs &attr : attrs)
        if ((attr.req_bit & OPTIONAL) == 0)
            mask |= attr.req_bit;
    return mask;
}

/* Deliberate: no attribute sets these bits, so an ActionOut element is never complete and never accepts an optional
 * attribute. */
inline constexpr vx_uint32_t BITS_OF_NO_ATTRIBUTE = 0x20 | 0x40;
inline constexpr vx_uint32_t ACTION_OUT_MASK = required_mask(sd_attrs) | BITS_OF_NO_ATTRIBUTE;

#define ATTR_KIND(record, sd_attr_type, value)                                                                         \
    attr_kind {                                                                                                        \
        sd_attr_type, offsetof(record, value), offsetof(record, u_ra_sd), offsetof(record, ra_max_sd_idx)              \
    }

inline constexpr attr_kind pattr_kind = ATTR_KIND(rsrc_pattr_t, 0, ra_dflt_value);
inline constexpr attr_kind dattr_kind = ATTR_KIND(rsrc_dattr_t, 1, ra_init_value);
#undef ATTR_KIND

inline constexpr sd_owner pattr_owner = {SD_TYPE_PATTR, nullptr, nullptr};
inline constexpr sd_owner dattr_owner = {SD_TYPE_DATTR, nullptr, nullptr};
inline constexpr sd_owner define_owner = {SD_TYPE_DEFINE, &rsrc_class_t::u_rc_def_input, nullptr};
inline constexpr sd_owner undefine_owner = {SD_TYPE_UNDEFINE, &rsrc_class_t::u_rc_undef_input, nullptr};
inline constexpr sd_owner online_owner = {SD_TYPE_ONLINE, &rsrc_class_t::u_rc_online_input, nullptr};
inline constexpr sd_owner offline_owner = {SD_TYPE_OFFLINE, &rsrc_class_t::u_rc_offline_input, nullptr};
inline constexpr sd_owner reset_owner = {SD_TYPE_RESET, &rsrc_class_t::u_rc_reset_input, nullptr};
inline constexpr sd_owner action_in_owner = {SD_TYPE_ACT_IN, nullptr, &rsrc_action_t::u_ac_sd_input};
inline constexpr sd_owner action_out_owner = {SD_TYPE_ACT_RESP, nullptr, &rsrc_action_t::u_ac_sd_resp};

template <std::size_t Count> consteval name_index names_of(const table_attrs (&attrs)[Count]) {
    return {Count, [&](std::size_t i) { return std::string_view(attrs[i].ta_name); }};
}

template <std::size_t Count>
consteval srtable_ctrl stanza(const char *name, staged_record record, const table_attrs (&attrs)[Count],
                              staged_tables tables = TABLES_OF_CLASS) {
    return {.sc_name = name,
            .sc_record = record,
            .sc_side_tables = tables,
            .sc_attrs = attrs,
            .sc_attr_names = names_of(attrs),
            .req_mask_cmplt = required_mask(attrs),
            .dt_offset = -1,
            .sc_attr = nullptr,
            .sc_sd_owner = nullptr};
}

consteval srtable_ctrl attribute(srtable_ctrl row, const attr_kind &kind, int dt_offset) {
    row.dt_offset = dt_offset;
    row.sc_attr = &kind;
    return row;
}

consteval srtable_ctrl sd_stanza(const char *name, const sd_owner &owner,
                                 vx_uint32_t complete = required_mask(sd_attrs)) {
    srtable_ctrl row = stanza(name, STAGED_SD_DEF, sd_attrs);
    row.dt_offset = offsetof(sd_def_t, sd_fields) + offsetof(sd_field_t, sd_field_type);
    row.req_mask_cmplt = complete;
    row.sc_sd_owner = &owner;
    return row;
}

inline constexpr int PATTR_TYPE = offsetof(rsrc_pattr_t, ra_data_type);
inline constexpr int DATTR_TYPE = offsetof(rsrc_dattr_t, ra_data_type);

inline constexpr std::array<srtable_ctrl, SC_COUNT + 1> catalogue = {{
    stanza("ControlDefinition", STAGED_CLASS, control_attrs),
    stanza("ClassToManagerMapping", STAGED_CMMAP, cmmap_attrs, TABLES_OF_CMMAP),
    stanza("ResourceVariableClass", STAGED_VARIABLE_CLASS, variable_class_attrs, TABLES_OF_VARIABLE_CLASS),
    stanza("ResourceClass", STAGED_CLASS, class_attrs),
    attribute(stanza("PersistentResourceAttribute", STAGED_PATTR, pattr_attrs), pattr_kind, PATTR_TYPE),
    attribute(stanza("PersistentClassAttribute", STAGED_PATTR_C, pattr_attrs), pattr_kind, PATTR_TYPE),
    attribute(stanza("DynamicResourceAttribute", STAGED_DATTR, dattr_attrs), dattr_kind, DATTR_TYPE),
    attribute(stanza("DynamicClassAttribute", STAGED_DATTR_C, dattr_attrs), dattr_kind, DATTR_TYPE),
    stanza("ClassAction", STAGED_ACTION_C, action_attrs),
    stanza("ResourceAction", STAGED_ACTION, action_attrs),
    sd_stanza("PAttrSDDefinition", pattr_owner),
    sd_stanza("DAttrSDDefinition", dattr_owner),
    sd_stanza("DefineSDDefinition", define_owner),
    sd_stanza("UndefineSDDefinition", undefine_owner),
    sd_stanza("OnlineSDDefinition", online_owner),
    sd_stanza("OfflineSDDefinition", offline_owner),
    sd_stanza("ResetSDDefinition", reset_owner),
    sd_stanza("ActionInSDDefinition", action_in_owner),
    sd_stanza("ActionOutSDDefinition", action_out_owner, ACTION_OUT_MASK),
    {},
}};

} // namespace language::rows

namespace language {

/* The bit of an attribute, as req_bit has it. Does not compile unless a kind has the attribute, and every kind that has
 * it gives it the same bit. */
consteval vx_uint32_t bit_of(std::string_view attribute) {
    vx_uint32_t bit = 0;
    for (const srtable_ctrl &stanza : rows::catalogue)
        for (const table_attrs &attr : stanza.sc_attrs)
            if (attr.ta_name == attribute) {
                if (bit != 0 && bit != attr.req_bit)
                    throw "kinds differ in the bit of this attribute";
                bit = attr.req_bit;
            }
    if (bit == 0)
        throw "no kind has this attribute";
    return bit;
}

} // namespace language

#endif
