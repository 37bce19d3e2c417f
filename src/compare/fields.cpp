/* fields.cpp: how the fields of records are called and how their numbers read. One that has no label here
 * shows under its own name. */

#include "compare/fields.h"

#include "text/append.h"

namespace cdef {

namespace {

constexpr field_label labels[] = {
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
    {"re_error_id", "Id", form::identifier},
    {"re_dscr_msgid", "description"},
    {"re_disp_msgid", "display name"},
    {"re_perms", "permission", form::permission},
    {"rd_class_ID", "class number"},
    {"rch_prim_hash_value", "hash value"},
    {"rch_class_id", "class number"},
    {"u_rm_strings_table", "u_rm_strings_table", form::reference},
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
    /* SD definitions: what their elements are called. */
    {"u_rc_def_input", "define input element"},
    {"u_rc_undef_input", "undefine input element"},
    {"u_rc_online_input", "online input element"},
    {"u_rc_offline_input", "offline input element"},
    {"u_rc_reset_input", "reset input element"},
    {"u_ra_sd", "element"},
    {"u_ac_sd_input", "input element"},
    {"u_ac_sd_resp", "response element"},
    {"u_re_sd_input", "input element"},
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
    "rcm_cb_ID",
    "u_rcm_strings",
    "rvc_cb_ID",
    "rvc_var_count",
    "u_rvc_string_tbl",
    "u_rch_next_hash",
    "u_rch_rsrc_class",
};

/* By these things are found. */
constexpr std::string_view names[] = {"u_rc_name",       "u_ra_name",   "u_ac_name", "u_re_name",
                                      "u_sd_field_name", "u_rm_RMname", "u_rvc_name"};

bool contains(std::span<const std::string_view> rows, std::string_view field) {
    return std::find(rows.begin(), rows.end(), field) != rows.end();
}

std::string text_of_permission(std::uint32_t mask) {
    for (const valid_perms_t &known : perm_list)
        if (known.mask == mask)
            return {known.permission};
    return text_of_bits(mask, {});
}

} // namespace

bool is_layout(std::string_view field) {
    return contains(layout, field);
}

bool is_name(const cdb::field &f) {
    return contains(names, f.name);
}

field_label label_of(const cdb::field &f) {
    for (const field_label &row : labels)
        if (row.field == f.name)
            return row;
    return {f.name, f.name};
}

std::string text_of_bits(std::uint32_t bits, std::span<const props_t> known) {
    std::string text;
    for (const props_t &property : known) {
        if ((bits & property.p) != property.p)
            continue;
        text += (text.empty() ? "" : "+") + std::string(property.s);
        bits &= ~property.p;
    }
    if (bits != 0)
        text::appendf(text, text.empty() ? "0x%x" : "+0x%x", bits);
    if (text.empty())
        text = "none";
    return text;
}

std::string text_of_number(std::uint32_t number, form as) {
    std::string text;
    switch (as) {
    case form::number:
        break;
    case form::identifier:
        return std::to_string(static_cast<std::int32_t>(number));
    case form::bits:
        return text_of_bits(number, {});
    case form::version:
        text::appendf(text, "%u.%u.%u.%u", number >> 24, number >> 16 & 255, number >> 8 & 255, number & 255);
        return text;
    case form::data_type:
        return std::string(cdb::name_of(static_cast<vx_data_type_t>(number)));
    case form::variable_type:
        return vxVarStr[number]; /* an unknown one is an error */
    case form::permission:
        return text_of_permission(number);
    case form::element_index:
    case form::locator:
        if (number == 0xFFFF)
            return "none";
        break;
    case form::reference:
        if (number == CDB_NONE)
            return "0";
        break;
    }
    return std::to_string(number);
}

} // namespace cdef
