/**
 * @file
 * The fields of every record of a class definition database as data, one table for each record: where a field is,
 * what it holds, and how it changes when a file is reversed to the other byte order. Reversal, inspection and
 * verification loop over these tables. C++20.
 *
 * Each table covers its record without gap or overlap, which is checked while compiling.
 */
#ifndef CDGEN_CDB_FIELDS_H
#define CDGEN_CDB_FIELDS_H

#if __cplusplus < 202002L
#error "cdb_fields.h needs C++20"
#else

#include "cdb.h"

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>
#include <type_traits>
#include <utility>

namespace cdb {

/** What a field holds, which decides how it is reversed. */
enum class field_kind : std::uint8_t {
    number,    /**< a number, or count of them: reversed whole */
    reference, /**< a cdb_ref_t: its first word is reversed */
    value,     /**< a vx_value_t: reversed by its data type, with what it refers to */
    reserved,  /**< 0, and left as it is */
    entries    /**< the first entry of a list; entries have a table of their own */
};

/**
 * The table that a reference's offset counts from: a table of the class, or for managers, maps and variable classes, of
 * the section.
 */
enum class target : std::uint8_t { none, strings, variety_lists, valid_vals, sd_defs, section };

/** Used as the type_at of a value whose data type is in the record that refers to this one. */
inline constexpr std::uint16_t TYPE_OF_OWNER = 0xFFFF;

/** One field of a record. */
struct field {
    std::string_view name;                 /**< as in cdb.h; of a member of a member with a point between them */
    std::uint16_t offset;                  /**< bytes from the start of the record */
    std::uint16_t width;                   /**< bytes of one element */
    std::uint16_t count;                   /**< number of elements; 1 unless it is an array */
    field_kind kind;                       /**< what it holds */
    target to = target::none;              /**< for references */
    std::uint16_t type_at = TYPE_OF_OWNER; /**< for values: offset of the field that holds the data type */
    bool stays = false;                    /**< true: not reversed, whatever its kind */
    bool optional = false;                 /**< true: the reference may be none */
};

/** The row, marked as not reversed. */
consteval field stays(field row) {
    row.stays = true;
    return row;
}

/** The row, marked as a reference that may lead to nothing. */
consteval field or_none(field row) {
    row.optional = true;
    return row;
}

/** True if the fields cover a record of this size in bytes, in order, without gap or overlap. */
consteval bool tiles(std::span<const field> fields, std::size_t size) {
    std::size_t at = 0;
    for (const field &f : fields) {
        if (f.offset != at)
            return false;
        at += std::size_t{f.width} * f.count;
    }
    return at == size;
}

/** The row of a member, from its declaration. */
#define CDB_ROW(record, member, ...)                                                                                   \
    ::cdb::field {                                                                                                     \
#member, offsetof(record, member),                                                                             \
            sizeof(std::remove_all_extents_t <std::remove_reference_t <decltype(std::declval <record &>().member)>>),  \
            sizeof(std::declval <record &>().member) /                                                                 \
                sizeof(                                                                                                \
                    std::remove_all_extents_t <std::remove_reference_t <decltype(std::declval <record &>().member)>>), \
            __VA_ARGS__                                                                                                \
    }
/** The row of a member that is not a reference or a value. */
#define CDB_FIELD(record, member, kind) CDB_ROW(record, member, ::cdb::field_kind::kind)
/** The row of a reference; its target is the table that it leads into. */
#define CDB_REF(record, member, to) CDB_ROW(record, member, ::cdb::field_kind::reference, ::cdb::target::to)
/** The row of a value; its type is in the named field. */
#define CDB_VALUE(record, member, type_at)                                                                             \
    CDB_ROW(record, member, ::cdb::field_kind::value, ::cdb::target::strings, type_at)

/** The fields of orb_cdb_header_t. */
inline constexpr field cdb_header_fields[] = {
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_length, number),
    stays(CDB_FIELD(orb_cdb_header_t, cdb_hdr_checksum, number)), /* computed again over the reversed file */
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_format, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_seqno, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_timestamp.tv_sec, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_timestamp.tv_usec, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_dsect_count, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_max_rm_id, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_max_class_id, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_rsrc_class_size, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_rsrc_cmmap_size, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_rsrc_mgr_size, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_rsrc_variable_class_size, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_rsrc_pattr_size, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_rsrc_dattr_size, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_rsrc_action_size, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_rsrc_error_size, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_rsrc_depend_size, number),
    CDB_FIELD(orb_cdb_header_t, cdb_hdr_spares, reserved),
};
static_assert(tiles(cdb_header_fields, sizeof(orb_cdb_header_t)));

/** The fields of cdb_dsect_anchor_t. */
inline constexpr field cdb_dsect_anchor_fields[] = {
    CDB_FIELD(cdb_dsect_anchor_t, cda_type, number),
    CDB_FIELD(cdb_dsect_anchor_t, cda_offset, number),
    CDB_FIELD(cdb_dsect_anchor_t, cda_length, number),
    CDB_FIELD(cdb_dsect_anchor_t, cda_revision, number),
};
static_assert(tiles(cdb_dsect_anchor_fields, sizeof(cdb_dsect_anchor_t)));

/** The fields of rsrc_class_t. */
inline constexpr field class_fields[] = {
    CDB_FIELD(rsrc_class_t, rc_cb_ID, number),
    CDB_FIELD(rsrc_class_t, rc_props, number),
    CDB_REF(rsrc_class_t, u_rc_name, strings),
    or_none(CDB_REF(rsrc_class_t, u_rc_alias, strings)),
    CDB_REF(rsrc_class_t, u_rc_pattrsC, section),
    CDB_REF(rsrc_class_t, u_rc_dattrsC, section),
    CDB_REF(rsrc_class_t, u_rc_pattrs, section),
    CDB_REF(rsrc_class_t, u_rc_dattrs, section),
    or_none(CDB_REF(rsrc_class_t, u_rc_def_input, sd_defs)),
    or_none(CDB_REF(rsrc_class_t, u_rc_undef_input, sd_defs)),
    or_none(CDB_REF(rsrc_class_t, u_rc_online_input, sd_defs)),
    or_none(CDB_REF(rsrc_class_t, u_rc_offline_input, sd_defs)),
    or_none(CDB_REF(rsrc_class_t, u_rc_reset_input, sd_defs)),
    CDB_REF(rsrc_class_t, u_rc_actionsC, section),
    CDB_REF(rsrc_class_t, u_rc_actions, section),
    CDB_REF(rsrc_class_t, u_rc_errors, section),
    CDB_REF(rsrc_class_t, u_rc_depends, section),
    CDB_REF(rsrc_class_t, u_rc_variety_lists, section),
    CDB_REF(rsrc_class_t, u_rc_sbs_defs, section),
    CDB_REF(rsrc_class_t, u_rc_sd_defs, section),
    CDB_REF(rsrc_class_t, u_rc_valid_vals, section),
    CDB_REF(rsrc_class_t, u_rc_strings, section),
    CDB_FIELD(rsrc_class_t, rc_num_pattrsC, number),
    CDB_FIELD(rsrc_class_t, rc_num_dattrsC, number),
    CDB_FIELD(rsrc_class_t, rc_num_pattrs, number),
    CDB_FIELD(rsrc_class_t, rc_num_dattrs, number),
    CDB_FIELD(rsrc_class_t, rc_num_actionsC, number),
    CDB_FIELD(rsrc_class_t, rc_num_actions, number),
    CDB_FIELD(rsrc_class_t, rc_num_errors, number),
    CDB_FIELD(rsrc_class_t, rc_num_depends, number),
    CDB_FIELD(rsrc_class_t, rc_varlist_size, number),
    CDB_FIELD(rsrc_class_t, rc_sbs_size, number),
    CDB_FIELD(rsrc_class_t, rc_sd_size, number),
    CDB_FIELD(rsrc_class_t, rc_valval_size, number),
    CDB_FIELD(rsrc_class_t, rc_perm_temp, number),
    CDB_FIELD(rsrc_class_t, rc_perm_tempC, number),
    CDB_FIELD(rsrc_class_t, rc_class_id, number),
    CDB_FIELD(rsrc_class_t, rc_dscr_msgid, number),
    CDB_FIELD(rsrc_class_t, rc_disp_msgid, number),
    CDB_FIELD(rsrc_class_t, rc_locator, number),
    CDB_FIELD(rsrc_class_t, rc_version, number),
    CDB_FIELD(rsrc_class_t, rc_spare, reserved),
};
static_assert(tiles(class_fields, sizeof(rsrc_class_t)));

/** The fields of rsrc_pattr_t. */
inline constexpr field pattr_fields[] = {
    CDB_FIELD(rsrc_pattr_t, ra_cb_ID, number),
    CDB_FIELD(rsrc_pattr_t, ra_props, number),
    CDB_REF(rsrc_pattr_t, u_ra_name, strings),
    CDB_FIELD(rsrc_pattr_t, ra_dscr_msgid, number),
    CDB_FIELD(rsrc_pattr_t, ra_disp_msgid, number),
    CDB_FIELD(rsrc_pattr_t, ra_group_msgid, number),
    CDB_FIELD(rsrc_pattr_t, ra_group_id, number),
    CDB_VALUE(rsrc_pattr_t, ra_dflt_value, offsetof(rsrc_pattr_t, ra_data_type)),
    CDB_FIELD(rsrc_pattr_t, ra_attr_id, number),
    CDB_FIELD(rsrc_pattr_t, ra_data_type, number),
    CDB_REF(rsrc_pattr_t, u_ra_variety_list, variety_lists),
    or_none(CDB_REF(rsrc_pattr_t, u_ra_valid_vals, valid_vals)),
    or_none(CDB_REF(rsrc_pattr_t, u_ra_sd, sd_defs)),
    CDB_FIELD(rsrc_pattr_t, ra_max_sd_idx, number),
    CDB_FIELD(rsrc_pattr_t, ra_reserved2, reserved),
};
static_assert(tiles(pattr_fields, sizeof(rsrc_pattr_t)));

/** The fields of rsrc_dattr_t. */
inline constexpr field dattr_fields[] = {
    CDB_FIELD(rsrc_dattr_t, ra_cb_ID, number),
    CDB_FIELD(rsrc_dattr_t, ra_props, number),
    CDB_REF(rsrc_dattr_t, u_ra_name, strings),
    CDB_REF(rsrc_dattr_t, u_ra_vclass, strings),
    CDB_REF(rsrc_dattr_t, u_ra_next_in_vclass, none),
    CDB_VALUE(rsrc_dattr_t, ra_init_value, offsetof(rsrc_dattr_t, ra_data_type)),
    CDB_VALUE(rsrc_dattr_t, ra_min_value, offsetof(rsrc_dattr_t, ra_data_type)),
    CDB_VALUE(rsrc_dattr_t, ra_max_value, offsetof(rsrc_dattr_t, ra_data_type)),
    CDB_REF(rsrc_dattr_t, u_ra_variety_list, variety_lists),
    or_none(CDB_REF(rsrc_dattr_t, u_ra_valid_vals, valid_vals)),
    or_none(CDB_REF(rsrc_dattr_t, u_ra_sd, sd_defs)),
    or_none(CDB_REF(rsrc_dattr_t, u_ra_express, strings)),
    or_none(CDB_REF(rsrc_dattr_t, u_ra_rearm_expr, strings)),
    CDB_REF(rsrc_dattr_t, u_ra_ZAV_name, strings),
    CDB_FIELD(rsrc_dattr_t, ra_data_type, number),
    CDB_FIELD(rsrc_dattr_t, ra_var_type, number),
    CDB_FIELD(rsrc_dattr_t, ra_dscr_msgid, number),
    CDB_FIELD(rsrc_dattr_t, ra_disp_msgid, number),
    CDB_FIELD(rsrc_dattr_t, ra_group_msgid, number),
    CDB_FIELD(rsrc_dattr_t, ra_group_id, number),
    CDB_FIELD(rsrc_dattr_t, ra_attr_id, number),
    CDB_FIELD(rsrc_dattr_t, ra_max_sd_idx, number),
    CDB_FIELD(rsrc_dattr_t, ra_expr_desc, number),
    CDB_FIELD(rsrc_dattr_t, ra_rearm_desc, number),
    CDB_FIELD(rsrc_dattr_t, ra_range_desc, number),
    stays(CDB_FIELD(rsrc_dattr_t, ra_report_interval, number)), /**< deliberate */
    CDB_FIELD(rsrc_dattr_t, ra_reserved, reserved),
};
static_assert(tiles(dattr_fields, sizeof(rsrc_dattr_t)));

/** The fields of rsrc_action_t. */
inline constexpr field action_fields[] = {
    CDB_FIELD(rsrc_action_t, ac_cb_ID, number),
    CDB_FIELD(rsrc_action_t, ac_action_id, number),
    CDB_FIELD(rsrc_action_t, ac_props, number),
    CDB_FIELD(rsrc_action_t, ac_dscr_msgid, number),
    CDB_FIELD(rsrc_action_t, ac_disp_msgid, number),
    CDB_FIELD(rsrc_action_t, ac_confirm_msgid, number),
    CDB_FIELD(rsrc_action_t, ac_timeout, number),
    CDB_FIELD(rsrc_action_t, ac_perms, number),
    CDB_REF(rsrc_action_t, u_ac_name, strings),
    CDB_REF(rsrc_action_t, u_ac_variety_list, variety_lists),
    or_none(CDB_REF(rsrc_action_t, u_ac_sd_input, sd_defs)),
    or_none(CDB_REF(rsrc_action_t, u_ac_sd_resp, sd_defs)),
};
static_assert(tiles(action_fields, sizeof(rsrc_action_t)));

/** The fields of rsrc_error_t. */
inline constexpr field error_fields[] = {
    CDB_FIELD(rsrc_error_t, re_cb_ID, number),
    CDB_FIELD(rsrc_error_t, re_error_id, number),
    CDB_FIELD(rsrc_error_t, re_props, number),
    CDB_FIELD(rsrc_error_t, re_dscr_msgid, number),
    CDB_FIELD(rsrc_error_t, re_disp_msgid, number),
    CDB_REF(rsrc_error_t, u_re_name, strings),
    CDB_REF(rsrc_error_t, u_re_variety_list, variety_lists),
    or_none(CDB_REF(rsrc_error_t, u_re_sd_input, sd_defs)),
    CDB_FIELD(rsrc_error_t, re_perms, number),
    CDB_FIELD(rsrc_error_t, re_reserved, reserved),
};
static_assert(tiles(error_fields, sizeof(rsrc_error_t)));

/** The fields of rsrc_depend_t. */
inline constexpr field depend_fields[] = {
    CDB_FIELD(rsrc_depend_t, rd_cb_ID, number),
    CDB_FIELD(rsrc_depend_t, rd_class_ID, number),
    CDB_FIELD(rsrc_depend_t, rd_reserved, reserved),
};
static_assert(tiles(depend_fields, sizeof(rsrc_depend_t)));

/** The fields of vl_entry_t. */
inline constexpr field vl_entry_fields[] = {
    CDB_FIELD(vl_entry_t, vl_low_val, number),
    CDB_FIELD(vl_entry_t, vl_high_val, number),
};
static_assert(tiles(vl_entry_fields, sizeof(vl_entry_t)));

/** The fields of variety_list_t. */
inline constexpr field variety_list_fields[] = {
    CDB_FIELD(variety_list_t, vl_cb_ID, number),
    CDB_FIELD(variety_list_t, vl_count, number),
    CDB_FIELD(variety_list_t, vl_values, entries),
};
static_assert(tiles(variety_list_fields, sizeof(variety_list_t)));

/** The fields of vv_entry_t. */
inline constexpr field vv_entry_fields[] = {
    CDB_VALUE(vv_entry_t, vv_low_val, TYPE_OF_OWNER),
    CDB_VALUE(vv_entry_t, vv_high_val, TYPE_OF_OWNER),
    CDB_FIELD(vv_entry_t, vv_disp_msgid, number),
    CDB_FIELD(vv_entry_t, vv_reserved, reserved),
};
static_assert(tiles(vv_entry_fields, sizeof(vv_entry_t)));

/** The fields of valid_values_t. */
inline constexpr field valid_values_fields[] = {
    CDB_FIELD(valid_values_t, vv_cb_ID, number),
    CDB_FIELD(valid_values_t, vv_count, number),
    CDB_FIELD(valid_values_t, vv_values, entries),
};
static_assert(tiles(valid_values_fields, sizeof(valid_values_t)));

/** The fields of sd_field_t. */
inline constexpr field sd_field_fields[] = {
    CDB_REF(sd_field_t, u_sd_field_name, strings),
    CDB_FIELD(sd_field_t, sd_field_type, number),
    CDB_FIELD(sd_field_t, sd_disp_msgid, number),
    CDB_FIELD(sd_field_t, sd_dscr_msgid, number),
    or_none(CDB_REF(sd_field_t, u_sd_valid_vals, valid_vals)),
    CDB_FIELD(sd_field_t, sd_action_id, number),
    CDB_FIELD(sd_field_t, sd_valid_type, number),
    CDB_FIELD(sd_field_t, sd_reserved, reserved),
};
static_assert(tiles(sd_field_fields, sizeof(sd_field_t)));

/** The fields of sd_def_t. */
inline constexpr field sd_def_fields[] = {
    CDB_FIELD(sd_def_t, sd_cb_ID, number),
    CDB_FIELD(sd_def_t, sd_count, number),
    CDB_FIELD(sd_def_t, sd_fields, entries),
};
static_assert(tiles(sd_def_fields, sizeof(sd_def_t)));

/** The fields of sbs_field_t. */
inline constexpr field sbs_field_fields[] = {
    CDB_REF(sbs_field_t, u_sb_field_name, strings),      CDB_FIELD(sbs_field_t, sb_field_type, number),
    CDB_FIELD(sbs_field_t, sb_disp_msgid, number),       CDB_FIELD(sbs_field_t, sb_dscr_msgid, number),
    CDB_VALUE(sbs_field_t, sb_min_value, TYPE_OF_OWNER), CDB_VALUE(sbs_field_t, sb_max_value, TYPE_OF_OWNER),
};
static_assert(tiles(sbs_field_fields, sizeof(sbs_field_t)));

/** The fields of sbs_def_t. */
inline constexpr field sbs_def_fields[] = {
    CDB_FIELD(sbs_def_t, sb_cb_ID, number),
    CDB_FIELD(sbs_def_t, sb_count, number),
    CDB_FIELD(sbs_def_t, sb_reserved, reserved),
    CDB_FIELD(sbs_def_t, sbs_fields, entries),
};
static_assert(tiles(sbs_def_fields, sizeof(sbs_def_t)));

/** The fields of rsrc_mgr_t. */
inline constexpr field mgr_fields[] = {
    CDB_FIELD(rsrc_mgr_t, rm_cb_ID, number),
    CDB_FIELD(rsrc_mgr_t, rm_id, number),
    CDB_FIELD(rsrc_mgr_t, rm_spare, number),
    CDB_REF(rsrc_mgr_t, u_rm_RMname, strings),
    stays(CDB_REF(rsrc_mgr_t, u_rm_strings_table, none)), /**< deliberate */
};
static_assert(tiles(mgr_fields, sizeof(rsrc_mgr_t)));

/** The fields of rsrc_cmmap_t. */
inline constexpr field cmmap_fields[] = {
    CDB_FIELD(rsrc_cmmap_t, rcm_cb_ID, number),
    CDB_FIELD(rsrc_cmmap_t, rcm_class_ID, number),
    CDB_FIELD(rsrc_cmmap_t, rcm_rm_ID, number),
    CDB_REF(rsrc_cmmap_t, u_rcm_msg_file, strings),
    CDB_REF(rsrc_cmmap_t, u_rcm_strings, section),
    CDB_FIELD(rsrc_cmmap_t, rcm_dscr_msg_set, number),
    CDB_FIELD(rsrc_cmmap_t, rcm_first_key, number),
    CDB_FIELD(rsrc_cmmap_t, rcm_last_key, number),
    CDB_FIELD(rsrc_cmmap_t, rcm_asnno_start, number),
    CDB_FIELD(rsrc_cmmap_t, rcm_num_sctx, number),
    CDB_FIELD(rsrc_cmmap_t, rcm_num_vctx, number),
    CDB_FIELD(rsrc_cmmap_t, rcm_num_stats, number),
    CDB_FIELD(rsrc_cmmap_t, rcm_num_ctx_tmplts, number),
    CDB_FIELD(rsrc_cmmap_t, rcm_static_contexts, number),
    CDB_FIELD(rsrc_cmmap_t, rcm_volatile_contexts, number),
    CDB_FIELD(rsrc_cmmap_t, rcm_stats, number),
    CDB_FIELD(rsrc_cmmap_t, rcm_ctx_tmplts, number),
    CDB_FIELD(rsrc_cmmap_t, rcm_reserved, reserved),
};
static_assert(tiles(cmmap_fields, sizeof(rsrc_cmmap_t)));

/** The fields of rsrc_variable_class_t. */
inline constexpr field variable_class_fields[] = {
    CDB_FIELD(rsrc_variable_class_t, rvc_cb_ID, number),
    CDB_FIELD(rsrc_variable_class_t, rvc_obsv_interval, number),
    CDB_FIELD(rsrc_variable_class_t, rvc_report_interval, number),
    CDB_REF(rsrc_variable_class_t, u_rvc_name, strings),
    or_none(CDB_REF(rsrc_variable_class_t, u_rvc_compat_name, strings)),
    CDB_FIELD(rsrc_variable_class_t, rvc_var_count, number),
    CDB_REF(rsrc_variable_class_t, u_rvc_string_tbl, none),
    CDB_FIELD(rsrc_variable_class_t, rvc_reserved, reserved),
};
static_assert(tiles(variable_class_fields, sizeof(rsrc_variable_class_t)));

/** The fields of rc_hash_block_t. */
inline constexpr field rc_hash_block_fields[] = {
    CDB_REF(rc_hash_block_t, u_rch_next_hash, none),
    CDB_FIELD(rc_hash_block_t, rch_prim_hash_value, number),
    CDB_FIELD(rc_hash_block_t, rch_class_id, number),
    CDB_REF(rc_hash_block_t, u_rch_rsrc_class, none),
};
static_assert(tiles(rc_hash_block_fields, sizeof(rc_hash_block_t)));

/** The fields of rsrc_class_hash_t. */
inline constexpr field class_hash_fields[] = {
    CDB_FIELD(rsrc_class_hash_t, rch_cb_ID, number),
    stays(CDB_REF(rsrc_class_hash_t, u_rch_table, none)), /**< deliberate */
    CDB_FIELD(rsrc_class_hash_t, rch_num_hash_blocks, number),
    CDB_FIELD(rsrc_class_hash_t, rc_hash_blocks, entries),
};
static_assert(tiles(class_hash_fields, sizeof(rsrc_class_hash_t)));

/**
 * The fields of ctx_tmplt_t. One member of the union is an offset, so the whole union is treated as an offset. No file
 * contains this record.
 */
inline constexpr field ctx_tmplt_fields[] = {
    CDB_ROW(ctx_tmplt_t, u_ctxt, ::cdb::field_kind::reference),
    CDB_FIELD(ctx_tmplt_t, ctxt_tbl_index, number),
    CDB_FIELD(ctx_tmplt_t, ctxt_type, number),
    CDB_FIELD(ctx_tmplt_t, ctxt_class_id, number),
    CDB_FIELD(ctx_tmplt_t, ctxt_dattr_id, number),
};
static_assert(tiles(ctx_tmplt_fields, sizeof(ctx_tmplt_t)));

/** The fields of vx_array_t. */
inline constexpr field array_fields[] = {
    CDB_FIELD(vx_array_t, element_count, number),
    CDB_FIELD(vx_array_t, pad, reserved),
    CDB_FIELD(vx_array_t, elements, entries),
};
static_assert(tiles(array_fields, sizeof(vx_array_t)));

/** The fields of vx_structured_data_t. */
inline constexpr field structured_data_fields[] = {
    CDB_FIELD(vx_structured_data_t, element_count, number),
    CDB_FIELD(vx_structured_data_t, pad, reserved),
    CDB_FIELD(vx_structured_data_t, elements, entries),
};
static_assert(tiles(structured_data_fields, sizeof(vx_structured_data_t)));

/** The fields of vx_structured_data_element_t. */
inline constexpr field structured_data_element_fields[] = {
    CDB_FIELD(vx_structured_data_element_t, data_type, number),
    CDB_FIELD(vx_structured_data_element_t, pad, reserved),
    CDB_VALUE(vx_structured_data_element_t, value, offsetof(vx_structured_data_element_t, data_type)),
};
static_assert(tiles(structured_data_element_fields, sizeof(vx_structured_data_element_t)));

/** The fields of a record of this type, in their order; empty for a type that is not a record. */
template <class Record> inline constexpr std::span<const field> fields_of = {};
/** @cond */
template <> inline constexpr std::span<const field> fields_of<orb_cdb_header_t> = cdb_header_fields;
template <> inline constexpr std::span<const field> fields_of<cdb_dsect_anchor_t> = cdb_dsect_anchor_fields;
template <> inline constexpr std::span<const field> fields_of<rsrc_class_t> = class_fields;
template <> inline constexpr std::span<const field> fields_of<rsrc_pattr_t> = pattr_fields;
template <> inline constexpr std::span<const field> fields_of<rsrc_dattr_t> = dattr_fields;
template <> inline constexpr std::span<const field> fields_of<rsrc_action_t> = action_fields;
template <> inline constexpr std::span<const field> fields_of<rsrc_error_t> = error_fields;
template <> inline constexpr std::span<const field> fields_of<rsrc_depend_t> = depend_fields;
template <> inline constexpr std::span<const field> fields_of<vl_entry_t> = vl_entry_fields;
template <> inline constexpr std::span<const field> fields_of<variety_list_t> = variety_list_fields;
template <> inline constexpr std::span<const field> fields_of<vv_entry_t> = vv_entry_fields;
template <> inline constexpr std::span<const field> fields_of<valid_values_t> = valid_values_fields;
template <> inline constexpr std::span<const field> fields_of<sd_field_t> = sd_field_fields;
template <> inline constexpr std::span<const field> fields_of<sd_def_t> = sd_def_fields;
template <> inline constexpr std::span<const field> fields_of<rsrc_mgr_t> = mgr_fields;
template <> inline constexpr std::span<const field> fields_of<rsrc_cmmap_t> = cmmap_fields;
template <> inline constexpr std::span<const field> fields_of<rsrc_variable_class_t> = variable_class_fields;
template <> inline constexpr std::span<const field> fields_of<rc_hash_block_t> = rc_hash_block_fields;
template <> inline constexpr std::span<const field> fields_of<rsrc_class_hash_t> = class_hash_fields;
template <> inline constexpr std::span<const field> fields_of<vx_array_t> = array_fields;
template <> inline constexpr std::span<const field> fields_of<vx_structured_data_t> = structured_data_fields;
template <>
inline constexpr std::span<const field> fields_of<vx_structured_data_element_t> = structured_data_element_fields;
/** @endcond */

} // namespace cdb

#endif
#endif
