/**
 * @file
 * The records of a class definition database, as they are in the file.
 *
 * These are plain declarations for programs that map a database. The header compiles alone, as C11 and as C++20.
 * docs/format.md describes the file as a whole. All numbers are in the byte order of the machine that the file was made
 * for. Sections are aligned to 4 bytes only, which is less than some fields need: copy records out of the file, or read
 * them field by field.
 */
#ifndef CDGEN_CDB_H
#define CDGEN_CDB_H

#include "vx.h"

typedef vx_uint16_t cdb_uint16_t;                       /**< 16 bits, unsigned */
typedef vx_uint32_t cdb_uint32_t;                       /**< 32 bits, unsigned */
typedef vx_int32_t cdb_int32_t;                         /**< 32 bits, two's complement */
typedef vx_resource_class_id_t orb_resource_class_id_t; /**< a class number */

/**
 * A reference. In a file the first word is the offset, from the base that the field's comment names, and the second is
 * to be ignored; CDB_NONE in the first word means that the reference leads to nothing. The bytes leave room for a
 * pointer, for programs that keep the record in memory; they are bytes so that the record's alignment does not depend
 * on the pointer.
 */
typedef union cdb_ref {
    cdb_uint32_t offset[2];   /**< in a file: the offset in bytes, then a word to ignore */
    unsigned char pointer[8]; /**< in memory: room for a pointer */
} cdb_ref_t;
VX_ASSERT_SIZE(cdb_ref_t, 8);

#define CDB_NONE 0xFFFFFFFFu   /**< the first word of a reference that is none */
#define CDB_FORMAT 0x666D7431u /**< the characters f, m, t, 1, the first one in the highest byte */

/** The first word of every record: the characters C, D, B and one for the kind, the first one in the highest byte. */
#define CDB_ID(kind) (0x43444200u | (unsigned char)(kind))
#define CDB_ID_CLASS CDB_ID('1')          /**< a class */
#define CDB_ID_CMMAP CDB_ID('2')          /**< a map */
#define CDB_ID_MGR CDB_ID('3')            /**< a manager */
#define CDB_ID_VARIABLE_CLASS CDB_ID('4') /**< a variable class */
#define CDB_ID_VALID_VALUES CDB_ID('5')   /**< a list of valid values */
#define CDB_ID_PATTR_C CDB_ID('7')        /**< a persistent class attribute */
#define CDB_ID_DATTR_C CDB_ID('8')        /**< a dynamic class attribute */
#define CDB_ID_PATTR CDB_ID('9')          /**< a persistent resource attribute */
#define CDB_ID_DATTR CDB_ID('a')          /**< a dynamic resource attribute */
#define CDB_ID_ACTION CDB_ID('b')         /**< a resource action: here the letters run the other way */
#define CDB_ID_ACTION_C CDB_ID('c')       /**< a class action */
#define CDB_ID_SD_DEF CDB_ID('f')         /**< a definition of structured data */
#define CDB_ID_VARIETY_LIST CDB_ID('g')   /**< a variety list */

/** The type of a data section. Types 0 to 2 are not used, and 7 is never written. Stored as 32 bits. */
typedef enum cdb_dsect_type VX_ENUM_32 {
    CDB_DSECT_UNUSED = 0,
    CDB_DSECT_EMPTY = 1,
    CDB_DSECT_TBL_CNTRS = 2,
    CDB_DSECT_RSRC_MGR = 3,
    CDB_DSECT_VAR_CLASS = 4,
    CDB_DSECT_CLASS = 5,
    CDB_DSECT_CMMAP = 6,
    CDB_DSECT_CLASS_HASH = 7
} cdb_dsect_type_t;
VX_ASSERT_SIZE(cdb_dsect_type_t, 4);

/** The ID of a dynamic attribute in a variable class: its ra_attr_id; for a class attribute with VAR_ID_CLASS_ATTR set.
 */
typedef cdb_uint32_t var_id_t;
#define VAR_ID_CLASS_ATTR 0x8000u /**< set in the variable ID of a class attribute */

/** A point in time since 1970-01-01 00:00 UTC. */
typedef struct orb_timeval32 {
    cdb_uint32_t tv_sec;  /**< seconds */
    cdb_uint32_t tv_usec; /**< microseconds */
} orb_timeval32_t;
VX_ASSERT_SIZE(orb_timeval32_t, 8);
VX_ASSERT_OFFSET(orb_timeval32_t, tv_sec, 0);
VX_ASSERT_OFFSET(orb_timeval32_t, tv_usec, 4);

/** The header, at offset 0 of the file. The anchors follow it directly. */
typedef struct orb_cdb_header {
    cdb_uint32_t cdb_hdr_length;       /**< size of the file less 4: the bytes from offset 4 to the end */
    cdb_uint32_t cdb_hdr_checksum;     /**< the length XORed with the (length - 4) / 4 words from offset 8 */
    cdb_uint32_t cdb_hdr_format;       /**< CDB_FORMAT */
    cdb_uint32_t cdb_hdr_seqno;        /**< 0 */
    orb_timeval32_t cdb_hdr_timestamp; /**< when the file was built; 0, 0 when the builder was asked for none */
    cdb_uint32_t cdb_hdr_dsect_count;  /**< number of anchors */
    cdb_uint16_t cdb_hdr_max_rm_id;    /**< largest rm_id */
    cdb_uint16_t cdb_hdr_max_class_id; /**< largest rc_class_id */
    cdb_uint16_t
        cdb_hdr_rsrc_class_size; /**< bytes of a class record, 224: a file with other sizes is of another format */
    cdb_uint16_t cdb_hdr_rsrc_cmmap_size;          /**< bytes of a map record, 60 */
    cdb_uint16_t cdb_hdr_rsrc_mgr_size;            /**< bytes of a manager record, 24 */
    cdb_uint16_t cdb_hdr_rsrc_variable_class_size; /**< bytes of a variable class record, 40 */
    cdb_uint16_t cdb_hdr_rsrc_pattr_size;          /**< bytes of a persistent attribute, 72 */
    cdb_uint16_t cdb_hdr_rsrc_dattr_size;          /**< bytes of a dynamic attribute, 136 */
    cdb_uint16_t cdb_hdr_rsrc_action_size;         /**< bytes of an action, 56 */
    cdb_uint16_t cdb_hdr_rsrc_error_size;          /**< bytes of an error, 48 */
    cdb_uint16_t cdb_hdr_rsrc_depend_size;         /**< bytes of a dependency, 8 */
    cdb_uint16_t cdb_hdr_spares[15];               /**< 0 */
} orb_cdb_header_t;
VX_ASSERT_SIZE(orb_cdb_header_t, 80);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_length, 0);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_checksum, 4);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_format, 8);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_seqno, 12);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_timestamp, 16);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_dsect_count, 24);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_max_rm_id, 28);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_max_class_id, 30);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_rsrc_class_size, 32);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_rsrc_cmmap_size, 34);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_rsrc_mgr_size, 36);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_rsrc_variable_class_size, 38);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_rsrc_pattr_size, 40);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_rsrc_dattr_size, 42);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_rsrc_action_size, 44);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_rsrc_error_size, 46);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_rsrc_depend_size, 48);
VX_ASSERT_OFFSET(orb_cdb_header_t, cdb_hdr_spares, 50);

/** Where a data section is in the file. */
typedef struct cdb_dsect_anchor {
    cdb_dsect_type_t cda_type; /**< what the section holds */
    cdb_uint32_t cda_offset;   /**< bytes from the start of the file */
    cdb_uint32_t cda_length;   /**< bytes */
    cdb_uint32_t cda_revision; /**< 0 */
} cdb_dsect_anchor_t;
VX_ASSERT_SIZE(cdb_dsect_anchor_t, 16);
VX_ASSERT_OFFSET(cdb_dsect_anchor_t, cda_type, 0);
VX_ASSERT_OFFSET(cdb_dsect_anchor_t, cda_offset, 4);
VX_ASSERT_OFFSET(cdb_dsect_anchor_t, cda_length, 8);
VX_ASSERT_OFFSET(cdb_dsect_anchor_t, cda_revision, 12);

/**
 * A resource class, the root of a class section. Its tables follow it in the order of the references marked with an
 * asterisk; errors and dependencies follow the actions; then come variety lists, definitions of structured byte
 * strings, SD definitions, valid values and strings. The offset of a table counts from the start of this record.
 */
typedef struct rsrc_class {
    cdb_uint32_t rc_cb_ID;               /**< CDB_ID_CLASS */
    cdb_uint32_t rc_props;               /**< property bits */
    cdb_ref_t u_rc_name;                 /**< string table: class name */
    cdb_ref_t u_rc_alias;                /**< string table; none */
    cdb_ref_t u_rc_pattrsC;              /**< * persistent class attributes; always 224 */
    cdb_ref_t u_rc_dattrsC;              /**< * dynamic class attributes */
    cdb_ref_t u_rc_pattrs;               /**< * persistent resource attributes */
    cdb_ref_t u_rc_dattrs;               /**< * dynamic resource attributes */
    cdb_ref_t u_rc_def_input;            /**< SD table: input of define, or none */
    cdb_ref_t u_rc_undef_input;          /**< SD table: input of undefine, or none */
    cdb_ref_t u_rc_online_input;         /**< SD table: input of online, or none */
    cdb_ref_t u_rc_offline_input;        /**< SD table: input of offline, or none */
    cdb_ref_t u_rc_reset_input;          /**< SD table: input of reset, or none */
    cdb_ref_t u_rc_actionsC;             /**< * class actions */
    cdb_ref_t u_rc_actions;              /**< * resource actions */
    cdb_ref_t u_rc_errors;               /**< 0: nothing is located through it */
    cdb_ref_t u_rc_depends;              /**< 0: likewise */
    cdb_ref_t u_rc_variety_lists;        /**< * variety lists */
    cdb_ref_t u_rc_sbs_defs;             /**< 0: likewise */
    cdb_ref_t u_rc_sd_defs;              /**< * SD definitions */
    cdb_ref_t u_rc_valid_vals;           /**< * valid-value lists */
    cdb_ref_t u_rc_strings;              /**< * string table */
    cdb_uint16_t rc_num_pattrsC;         /**< number of persistent class attributes */
    cdb_uint16_t rc_num_dattrsC;         /**< number of dynamic class attributes */
    cdb_uint16_t rc_num_pattrs;          /**< number of persistent resource attributes */
    cdb_uint16_t rc_num_dattrs;          /**< number of dynamic resource attributes */
    cdb_uint16_t rc_num_actionsC;        /**< number of class actions */
    cdb_uint16_t rc_num_actions;         /**< number of resource actions */
    cdb_uint16_t rc_num_errors;          /**< number of errors: 0 */
    cdb_uint16_t rc_num_depends;         /**< number of dependencies: 0 */
    cdb_uint32_t rc_varlist_size;        /**< bytes of the variety-list table */
    cdb_uint32_t rc_sbs_size;            /**< 0 */
    cdb_uint32_t rc_sd_size;             /**< bytes of the SD-definition table */
    cdb_uint32_t rc_valval_size;         /**< bytes of the valid-values table */
    cdb_uint32_t rc_perm_temp;           /**< resource permission bits */
    cdb_uint32_t rc_perm_tempC;          /**< class permission bits */
    orb_resource_class_id_t rc_class_id; /**< class number */
    cdb_uint16_t rc_dscr_msgid;          /**< message number of the description */
    cdb_uint16_t rc_disp_msgid;          /**< message number of the display name */
    cdb_uint16_t rc_locator;             /**< ID of the persistent attribute that locates a resource; 0xFFFF: none */
    cdb_uint32_t rc_version;             /**< a.b.c.d: a << 24 | b << 16 | c << 8 | d */
    cdb_uint16_t rc_spare[2];            /**< 0 */
} rsrc_class_t;
VX_ASSERT_SIZE(rsrc_class_t, 224);
VX_ASSERT_OFFSET(rsrc_class_t, rc_cb_ID, 0);
VX_ASSERT_OFFSET(rsrc_class_t, rc_props, 4);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_name, 8);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_alias, 16);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_pattrsC, 24);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_dattrsC, 32);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_pattrs, 40);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_dattrs, 48);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_def_input, 56);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_undef_input, 64);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_online_input, 72);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_offline_input, 80);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_reset_input, 88);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_actionsC, 96);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_actions, 104);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_errors, 112);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_depends, 120);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_variety_lists, 128);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_sbs_defs, 136);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_sd_defs, 144);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_valid_vals, 152);
VX_ASSERT_OFFSET(rsrc_class_t, u_rc_strings, 160);
VX_ASSERT_OFFSET(rsrc_class_t, rc_num_pattrsC, 168);
VX_ASSERT_OFFSET(rsrc_class_t, rc_num_dattrsC, 170);
VX_ASSERT_OFFSET(rsrc_class_t, rc_num_pattrs, 172);
VX_ASSERT_OFFSET(rsrc_class_t, rc_num_dattrs, 174);
VX_ASSERT_OFFSET(rsrc_class_t, rc_num_actionsC, 176);
VX_ASSERT_OFFSET(rsrc_class_t, rc_num_actions, 178);
VX_ASSERT_OFFSET(rsrc_class_t, rc_num_errors, 180);
VX_ASSERT_OFFSET(rsrc_class_t, rc_num_depends, 182);
VX_ASSERT_OFFSET(rsrc_class_t, rc_varlist_size, 184);
VX_ASSERT_OFFSET(rsrc_class_t, rc_sbs_size, 188);
VX_ASSERT_OFFSET(rsrc_class_t, rc_sd_size, 192);
VX_ASSERT_OFFSET(rsrc_class_t, rc_valval_size, 196);
VX_ASSERT_OFFSET(rsrc_class_t, rc_perm_temp, 200);
VX_ASSERT_OFFSET(rsrc_class_t, rc_perm_tempC, 204);
VX_ASSERT_OFFSET(rsrc_class_t, rc_class_id, 208);
VX_ASSERT_OFFSET(rsrc_class_t, rc_dscr_msgid, 210);
VX_ASSERT_OFFSET(rsrc_class_t, rc_disp_msgid, 212);
VX_ASSERT_OFFSET(rsrc_class_t, rc_locator, 214);
VX_ASSERT_OFFSET(rsrc_class_t, rc_version, 216);
VX_ASSERT_OFFSET(rsrc_class_t, rc_spare, 220);

/** A persistent attribute. */
typedef struct rsrc_pattr {
    cdb_uint32_t ra_cb_ID;        /**< CDB_ID_PATTR or CDB_ID_PATTR_C */
    cdb_uint32_t ra_props;        /**< property bits */
    cdb_ref_t u_ra_name;          /**< string table */
    cdb_uint16_t ra_dscr_msgid;   /**< message number of the description */
    cdb_uint16_t ra_disp_msgid;   /**< message number of the display name */
    cdb_uint16_t ra_group_msgid;  /**< message number of the group's name; 0: none */
    cdb_uint16_t ra_group_id;     /**< 255: no group */
    vx_value_t ra_dflt_value;     /**< default, of type ra_data_type */
    cdb_int32_t ra_attr_id;       /**< attribute number */
    vx_data_type_t ra_data_type;  /**< type of the values */
    cdb_ref_t u_ra_variety_list;  /**< variety-list table */
    cdb_ref_t u_ra_valid_vals;    /**< valid-values table, or none */
    cdb_ref_t u_ra_sd;            /**< SD table, or none */
    cdb_uint16_t ra_max_sd_idx;   /**< index of the last SD element; 0xFFFF: none */
    cdb_uint16_t ra_reserved2[3]; /**< 0 */
} rsrc_pattr_t;
VX_ASSERT_SIZE(rsrc_pattr_t, 72);
VX_ASSERT_OFFSET(rsrc_pattr_t, ra_cb_ID, 0);
VX_ASSERT_OFFSET(rsrc_pattr_t, ra_props, 4);
VX_ASSERT_OFFSET(rsrc_pattr_t, u_ra_name, 8);
VX_ASSERT_OFFSET(rsrc_pattr_t, ra_dscr_msgid, 16);
VX_ASSERT_OFFSET(rsrc_pattr_t, ra_disp_msgid, 18);
VX_ASSERT_OFFSET(rsrc_pattr_t, ra_group_msgid, 20);
VX_ASSERT_OFFSET(rsrc_pattr_t, ra_group_id, 22);
VX_ASSERT_OFFSET(rsrc_pattr_t, ra_dflt_value, 24);
VX_ASSERT_OFFSET(rsrc_pattr_t, ra_attr_id, 32);
VX_ASSERT_OFFSET(rsrc_pattr_t, ra_data_type, 36);
VX_ASSERT_OFFSET(rsrc_pattr_t, u_ra_variety_list, 40);
VX_ASSERT_OFFSET(rsrc_pattr_t, u_ra_valid_vals, 48);
VX_ASSERT_OFFSET(rsrc_pattr_t, u_ra_sd, 56);
VX_ASSERT_OFFSET(rsrc_pattr_t, ra_max_sd_idx, 64);
VX_ASSERT_OFFSET(rsrc_pattr_t, ra_reserved2, 66);

/** A dynamic attribute. */
typedef struct rsrc_dattr {
    cdb_uint32_t ra_cb_ID;         /**< CDB_ID_DATTR or CDB_ID_DATTR_C */
    cdb_uint32_t ra_props;         /**< property bits */
    cdb_ref_t u_ra_name;           /**< string table */
    cdb_ref_t u_ra_vclass;         /**< 0 in a file; while staged the name of the variable class, in the string table */
    cdb_ref_t u_ra_next_in_vclass; /**< 0 */
    vx_value_t ra_init_value;      /**< initial value, of type ra_data_type */
    vx_value_t ra_min_value;       /**< lower bound, of type ra_data_type */
    vx_value_t ra_max_value;       /**< upper bound, of type ra_data_type */
    cdb_ref_t u_ra_variety_list;   /**< variety-list table */
    cdb_ref_t u_ra_valid_vals;     /**< valid-values table, or none */
    cdb_ref_t u_ra_sd;             /**< SD table, or none */
    cdb_ref_t u_ra_express;        /**< string table, or none */
    cdb_ref_t u_ra_rearm_expr;     /**< string table, or none */
    cdb_ref_t u_ra_ZAV_name;       /**< 0 */
    vx_data_type_t ra_data_type;   /**< type of the values */
    orb_variable_type_t ra_var_type; /**< how it varies */
    cdb_uint16_t ra_dscr_msgid;      /**< message number of the description */
    cdb_uint16_t ra_disp_msgid;      /**< message number of the display name */
    cdb_uint16_t ra_group_msgid;     /**< message number of the group's name; 0: none */
    cdb_uint16_t ra_group_id;        /**< 255: no group */
    cdb_int32_t ra_attr_id;          /**< attribute number */
    cdb_uint16_t ra_max_sd_idx;      /**< index of the last SD element; 0xFFFF: none */
    cdb_uint16_t ra_expr_desc;       /**< message number; 0: none */
    cdb_uint16_t ra_rearm_desc;      /**< message number; 0: none */
    cdb_uint16_t ra_range_desc;      /**< 0 */
    cdb_uint16_t ra_report_interval; /**< 0; stays as it is when a file is reversed */
    cdb_uint16_t ra_reserved;        /**< 0 */
} rsrc_dattr_t;
VX_ASSERT_SIZE(rsrc_dattr_t, 136);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_cb_ID, 0);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_props, 4);
VX_ASSERT_OFFSET(rsrc_dattr_t, u_ra_name, 8);
VX_ASSERT_OFFSET(rsrc_dattr_t, u_ra_vclass, 16);
VX_ASSERT_OFFSET(rsrc_dattr_t, u_ra_next_in_vclass, 24);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_init_value, 32);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_min_value, 40);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_max_value, 48);
VX_ASSERT_OFFSET(rsrc_dattr_t, u_ra_variety_list, 56);
VX_ASSERT_OFFSET(rsrc_dattr_t, u_ra_valid_vals, 64);
VX_ASSERT_OFFSET(rsrc_dattr_t, u_ra_sd, 72);
VX_ASSERT_OFFSET(rsrc_dattr_t, u_ra_express, 80);
VX_ASSERT_OFFSET(rsrc_dattr_t, u_ra_rearm_expr, 88);
VX_ASSERT_OFFSET(rsrc_dattr_t, u_ra_ZAV_name, 96);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_data_type, 104);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_var_type, 108);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_dscr_msgid, 112);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_disp_msgid, 114);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_group_msgid, 116);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_group_id, 118);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_attr_id, 120);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_max_sd_idx, 124);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_expr_desc, 126);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_rearm_desc, 128);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_range_desc, 130);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_report_interval, 132);
VX_ASSERT_OFFSET(rsrc_dattr_t, ra_reserved, 134);

/** An action. */
typedef struct rsrc_action {
    cdb_uint32_t ac_cb_ID;         /**< CDB_ID_ACTION or CDB_ID_ACTION_C */
    cdb_int32_t ac_action_id;      /**< action number */
    cdb_uint32_t ac_props;         /**< property bits */
    cdb_uint16_t ac_dscr_msgid;    /**< message number of the description */
    cdb_uint16_t ac_disp_msgid;    /**< message number of the display name */
    cdb_uint16_t ac_confirm_msgid; /**< message number of the confirmation; 0: none */
    cdb_uint16_t ac_timeout;       /**< 0: none */
    cdb_uint32_t ac_perms;         /**< permission bit */
    cdb_ref_t u_ac_name;           /**< string table */
    cdb_ref_t u_ac_variety_list;   /**< variety-list table */
    cdb_ref_t u_ac_sd_input;       /**< SD table, or none */
    cdb_ref_t u_ac_sd_resp;        /**< SD table, or none */
} rsrc_action_t;
VX_ASSERT_SIZE(rsrc_action_t, 56);
VX_ASSERT_OFFSET(rsrc_action_t, ac_cb_ID, 0);
VX_ASSERT_OFFSET(rsrc_action_t, ac_action_id, 4);
VX_ASSERT_OFFSET(rsrc_action_t, ac_props, 8);
VX_ASSERT_OFFSET(rsrc_action_t, ac_dscr_msgid, 12);
VX_ASSERT_OFFSET(rsrc_action_t, ac_disp_msgid, 14);
VX_ASSERT_OFFSET(rsrc_action_t, ac_confirm_msgid, 16);
VX_ASSERT_OFFSET(rsrc_action_t, ac_timeout, 18);
VX_ASSERT_OFFSET(rsrc_action_t, ac_perms, 20);
VX_ASSERT_OFFSET(rsrc_action_t, u_ac_name, 24);
VX_ASSERT_OFFSET(rsrc_action_t, u_ac_variety_list, 32);
VX_ASSERT_OFFSET(rsrc_action_t, u_ac_sd_input, 40);
VX_ASSERT_OFFSET(rsrc_action_t, u_ac_sd_resp, 48);

/** An error; defined for readers, never written. */
typedef struct rsrc_error {
    cdb_uint32_t re_cb_ID;       /**< identifier */
    cdb_int32_t re_error_id;     /**< error number */
    cdb_uint32_t re_props;       /**< property bits */
    cdb_uint16_t re_dscr_msgid;  /**< message number of the description */
    cdb_uint16_t re_disp_msgid;  /**< message number of the display name */
    cdb_ref_t u_re_name;         /**< string table */
    cdb_ref_t u_re_variety_list; /**< variety-list table */
    cdb_ref_t u_re_sd_input;     /**< SD table, or none */
    cdb_uint32_t re_perms;       /**< permission bits */
    cdb_uint16_t re_reserved[2]; /**< 0 */
} rsrc_error_t;
VX_ASSERT_SIZE(rsrc_error_t, 48);
VX_ASSERT_OFFSET(rsrc_error_t, re_cb_ID, 0);
VX_ASSERT_OFFSET(rsrc_error_t, re_error_id, 4);
VX_ASSERT_OFFSET(rsrc_error_t, re_props, 8);
VX_ASSERT_OFFSET(rsrc_error_t, re_dscr_msgid, 12);
VX_ASSERT_OFFSET(rsrc_error_t, re_disp_msgid, 14);
VX_ASSERT_OFFSET(rsrc_error_t, u_re_name, 16);
VX_ASSERT_OFFSET(rsrc_error_t, u_re_variety_list, 24);
VX_ASSERT_OFFSET(rsrc_error_t, u_re_sd_input, 32);
VX_ASSERT_OFFSET(rsrc_error_t, re_perms, 40);
VX_ASSERT_OFFSET(rsrc_error_t, re_reserved, 44);

/** A dependency on another class; defined for readers, never written. */
typedef struct rsrc_depend {
    cdb_uint32_t rd_cb_ID;               /**< identifier */
    orb_resource_class_id_t rd_class_ID; /**< number of the other class */
    cdb_uint16_t rd_reserved;            /**< 0 */
} rsrc_depend_t;
VX_ASSERT_SIZE(rsrc_depend_t, 8);
VX_ASSERT_OFFSET(rsrc_depend_t, rd_cb_ID, 0);
VX_ASSERT_OFFSET(rsrc_depend_t, rd_class_ID, 4);
VX_ASSERT_OFFSET(rsrc_depend_t, rd_reserved, 6);

/** One range of varieties, both ends included. */
typedef struct vl_entry {
    cdb_uint32_t vl_low_val;  /**< first variety */
    cdb_uint32_t vl_high_val; /**< last variety */
} vl_entry_t;
VX_ASSERT_SIZE(vl_entry_t, 8);
VX_ASSERT_OFFSET(vl_entry_t, vl_low_val, 0);
VX_ASSERT_OFFSET(vl_entry_t, vl_high_val, 4);

/** A variety list: 8 + 8 * vl_count bytes. */
typedef struct variety_list {
    cdb_uint32_t vl_cb_ID;   /**< CDB_ID_VARIETY_LIST */
    cdb_uint32_t vl_count;   /**< number of entries */
    vl_entry_t vl_values[1]; /**< vl_count entries */
} variety_list_t;
VX_ASSERT_SIZE(variety_list_t, 16);
VX_ASSERT_OFFSET(variety_list_t, vl_cb_ID, 0);
VX_ASSERT_OFFSET(variety_list_t, vl_count, 4);
VX_ASSERT_OFFSET(variety_list_t, vl_values, 8);

/** One valid value (low equals high) or range of them. */
typedef struct vv_entry {
    vx_value_t vv_low_val;       /**< lowest value, of the owner's type; for an array of its element type */
    vx_value_t vv_high_val;      /**< highest value; for a single value the same again */
    cdb_uint16_t vv_disp_msgid;  /**< message number; 0: none */
    cdb_uint16_t vv_reserved[3]; /**< 0 */
} vv_entry_t;
VX_ASSERT_SIZE(vv_entry_t, 24);
VX_ASSERT_OFFSET(vv_entry_t, vv_low_val, 0);
VX_ASSERT_OFFSET(vv_entry_t, vv_high_val, 8);
VX_ASSERT_OFFSET(vv_entry_t, vv_disp_msgid, 16);
VX_ASSERT_OFFSET(vv_entry_t, vv_reserved, 18);

/** A list of valid values: 8 + 24 * vv_count bytes. */
typedef struct valid_values {
    cdb_uint32_t vv_cb_ID;   /**< CDB_ID_VALID_VALUES */
    cdb_uint32_t vv_count;   /**< number of entries */
    vv_entry_t vv_values[1]; /**< vv_count entries */
} valid_values_t;
VX_ASSERT_SIZE(valid_values_t, 32);
VX_ASSERT_OFFSET(valid_values_t, vv_cb_ID, 0);
VX_ASSERT_OFFSET(valid_values_t, vv_count, 4);
VX_ASSERT_OFFSET(valid_values_t, vv_values, 8);

/** One element of a structured-data definition. */
typedef struct sd_field {
    cdb_ref_t u_sd_field_name;    /**< string table */
    vx_data_type_t sd_field_type; /**< type of the element */
    cdb_uint16_t sd_disp_msgid;   /**< message number of the display name */
    cdb_uint16_t sd_dscr_msgid;   /**< message number of the description */
    cdb_ref_t u_sd_valid_vals;    /**< valid-values table, or none */
    cdb_uint32_t sd_action_id;    /**< 65535 */
    cdb_uint16_t sd_valid_type;   /**< 1 */
    cdb_uint16_t sd_reserved;     /**< 0 */
} sd_field_t;
VX_ASSERT_SIZE(sd_field_t, 32);
VX_ASSERT_OFFSET(sd_field_t, u_sd_field_name, 0);
VX_ASSERT_OFFSET(sd_field_t, sd_field_type, 8);
VX_ASSERT_OFFSET(sd_field_t, sd_disp_msgid, 12);
VX_ASSERT_OFFSET(sd_field_t, sd_dscr_msgid, 14);
VX_ASSERT_OFFSET(sd_field_t, u_sd_valid_vals, 16);
VX_ASSERT_OFFSET(sd_field_t, sd_action_id, 24);
VX_ASSERT_OFFSET(sd_field_t, sd_valid_type, 28);
VX_ASSERT_OFFSET(sd_field_t, sd_reserved, 30);

/** A structured-data definition: 8 + 32 * sd_count bytes. */
typedef struct sd_def {
    cdb_uint32_t sd_cb_ID;   /**< CDB_ID_SD_DEF */
    cdb_uint32_t sd_count;   /**< number of elements */
    sd_field_t sd_fields[1]; /**< sd_count elements */
} sd_def_t;
VX_ASSERT_SIZE(sd_def_t, 40);
VX_ASSERT_OFFSET(sd_def_t, sd_cb_ID, 0);
VX_ASSERT_OFFSET(sd_def_t, sd_count, 4);
VX_ASSERT_OFFSET(sd_def_t, sd_fields, 8);

/** One field of a structured byte string. */
typedef struct sbs_field {
    cdb_ref_t u_sb_field_name;  /**< string table */
    cdb_uint32_t sb_field_type; /**< vx_sbs_field_data_type_t */
    cdb_uint16_t sb_disp_msgid; /**< message number of the display name */
    cdb_uint16_t sb_dscr_msgid; /**< message number of the description */
    vx_value_t sb_min_value;    /**< lowest value */
    vx_value_t sb_max_value;    /**< highest value */
} sbs_field_t;
VX_ASSERT_SIZE(sbs_field_t, 32);
VX_ASSERT_OFFSET(sbs_field_t, u_sb_field_name, 0);
VX_ASSERT_OFFSET(sbs_field_t, sb_field_type, 8);
VX_ASSERT_OFFSET(sbs_field_t, sb_disp_msgid, 12);
VX_ASSERT_OFFSET(sbs_field_t, sb_dscr_msgid, 14);
VX_ASSERT_OFFSET(sbs_field_t, sb_min_value, 16);
VX_ASSERT_OFFSET(sbs_field_t, sb_max_value, 24);

/** A structured-byte-string definition: 8 + 32 * sb_count bytes; defined for readers, never written. */
typedef struct sbs_def {
    cdb_uint32_t sb_cb_ID;     /**< identifier */
    cdb_uint16_t sb_count;     /**< number of fields */
    cdb_uint16_t sb_reserved;  /**< 0 */
    sbs_field_t sbs_fields[1]; /**< sb_count fields */
} sbs_def_t;
VX_ASSERT_SIZE(sbs_def_t, 40);
VX_ASSERT_OFFSET(sbs_def_t, sb_cb_ID, 0);
VX_ASSERT_OFFSET(sbs_def_t, sb_count, 4);
VX_ASSERT_OFFSET(sbs_def_t, sb_reserved, 6);
VX_ASSERT_OFFSET(sbs_def_t, sbs_fields, 8);

/** A resource manager. Its string table follows at offset 24 of the section, its name first. */
typedef struct rsrc_mgr {
    cdb_uint32_t rm_cb_ID;        /**< CDB_ID_MGR */
    cdb_uint16_t rm_id;           /**< from 0, in order */
    cdb_uint16_t rm_spare;        /**< 0 */
    cdb_ref_t u_rm_RMname;        /**< 0: the name is the first string */
    cdb_ref_t u_rm_strings_table; /**< 0 */
} rsrc_mgr_t;
VX_ASSERT_SIZE(rsrc_mgr_t, 24);
VX_ASSERT_OFFSET(rsrc_mgr_t, rm_cb_ID, 0);
VX_ASSERT_OFFSET(rsrc_mgr_t, rm_id, 4);
VX_ASSERT_OFFSET(rsrc_mgr_t, rm_spare, 6);
VX_ASSERT_OFFSET(rsrc_mgr_t, u_rm_RMname, 8);
VX_ASSERT_OFFSET(rsrc_mgr_t, u_rm_strings_table, 16);

/**
 * A class-to-manager map. Its string table follows. It has 60 bytes, so the section after it is 4 bytes off a multiple
 * of 8.
 */
typedef struct rsrc_cmmap {
    cdb_uint32_t rcm_cb_ID;               /**< CDB_ID_CMMAP */
    orb_resource_class_id_t rcm_class_ID; /**< 0 */
    cdb_uint16_t rcm_rm_ID;               /**< rm_id of the manager */
    cdb_ref_t u_rcm_msg_file;             /**< the map's string table: message catalog */
    cdb_ref_t u_rcm_strings;              /**< 60: offset of the string table from this record */
    cdb_uint16_t rcm_dscr_msg_set;        /**< message set of the descriptions */
    cdb_uint16_t rcm_first_key;           /**< first key of the class */
    cdb_uint16_t rcm_last_key;            /**< last key of the class */
    cdb_uint16_t rcm_asnno_start;         /**< 0 */
    cdb_uint16_t rcm_num_sctx;            /**< 0 */
    cdb_uint16_t rcm_num_vctx;            /**< 0 */
    cdb_uint16_t rcm_num_stats;           /**< 0 */
    cdb_uint16_t rcm_num_ctx_tmplts;      /**< 0 */
    cdb_uint32_t rcm_static_contexts;     /**< 0 */
    cdb_uint32_t rcm_volatile_contexts;   /**< 0 */
    cdb_uint32_t rcm_stats;               /**< 0 */
    cdb_uint32_t rcm_ctx_tmplts;          /**< 0 */
    cdb_uint16_t rcm_reserved[2];         /**< 0 */
} rsrc_cmmap_t;
VX_ASSERT_SIZE(rsrc_cmmap_t, 60);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_cb_ID, 0);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_class_ID, 4);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_rm_ID, 6);
VX_ASSERT_OFFSET(rsrc_cmmap_t, u_rcm_msg_file, 8);
VX_ASSERT_OFFSET(rsrc_cmmap_t, u_rcm_strings, 16);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_dscr_msg_set, 24);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_first_key, 26);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_last_key, 28);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_asnno_start, 30);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_num_sctx, 32);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_num_vctx, 34);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_num_stats, 36);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_num_ctx_tmplts, 38);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_static_contexts, 40);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_volatile_contexts, 44);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_stats, 48);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_ctx_tmplts, 52);
VX_ASSERT_OFFSET(rsrc_cmmap_t, rcm_reserved, 56);

/** A class of dynamic attributes that are observed together. Its string table follows, then, at 40 + the first word of
 * u_rvc_string_tbl, the array of rvc_var_count variable IDs (var_id_t). */
typedef struct rsrc_variable_class {
    cdb_uint32_t rvc_cb_ID;           /**< CDB_ID_VARIABLE_CLASS */
    cdb_uint16_t rvc_obsv_interval;   /**< time between two observations */
    cdb_uint16_t rvc_report_interval; /**< time between two reports */
    cdb_ref_t u_rvc_name;             /**< its string table */
    cdb_ref_t u_rvc_compat_name;      /**< its string table: alias, or none */
    cdb_uint32_t rvc_var_count;       /**< number of variable IDs */
    cdb_ref_t u_rvc_string_tbl;       /**< length of the string table, rounded up to 8 */
    cdb_uint16_t rvc_reserved[2];     /**< 0 */
} rsrc_variable_class_t;
VX_ASSERT_SIZE(rsrc_variable_class_t, 40);
VX_ASSERT_OFFSET(rsrc_variable_class_t, rvc_cb_ID, 0);
VX_ASSERT_OFFSET(rsrc_variable_class_t, rvc_obsv_interval, 4);
VX_ASSERT_OFFSET(rsrc_variable_class_t, rvc_report_interval, 6);
VX_ASSERT_OFFSET(rsrc_variable_class_t, u_rvc_name, 8);
VX_ASSERT_OFFSET(rsrc_variable_class_t, u_rvc_compat_name, 16);
VX_ASSERT_OFFSET(rsrc_variable_class_t, rvc_var_count, 24);
VX_ASSERT_OFFSET(rsrc_variable_class_t, u_rvc_string_tbl, 28);
VX_ASSERT_OFFSET(rsrc_variable_class_t, rvc_reserved, 36);

/** One block of the class hash. */
typedef struct rc_hash_block {
    cdb_ref_t u_rch_next_hash;        /**< next block of the chain */
    cdb_uint32_t rch_prim_hash_value; /**< hash value */
    cdb_uint32_t rch_class_id;        /**< class number */
    cdb_ref_t u_rch_rsrc_class;       /**< the class */
} rc_hash_block_t;
VX_ASSERT_SIZE(rc_hash_block_t, 24);
VX_ASSERT_OFFSET(rc_hash_block_t, u_rch_next_hash, 0);
VX_ASSERT_OFFSET(rc_hash_block_t, rch_prim_hash_value, 8);
VX_ASSERT_OFFSET(rc_hash_block_t, rch_class_id, 12);
VX_ASSERT_OFFSET(rc_hash_block_t, u_rch_rsrc_class, 16);

/** The class hash; defined for readers, never written. */
typedef struct rsrc_class_hash {
    cdb_uint32_t rch_cb_ID;            /**< identifier */
    cdb_ref_t u_rch_table[1024];       /**< heads of the chains */
    cdb_uint32_t rch_num_hash_blocks;  /**< number of blocks */
    rc_hash_block_t rc_hash_blocks[1]; /**< rch_num_hash_blocks blocks */
} rsrc_class_hash_t;
VX_ASSERT_SIZE(rsrc_class_hash_t, 8224);
VX_ASSERT_OFFSET(rsrc_class_hash_t, rch_cb_ID, 0);
VX_ASSERT_OFFSET(rsrc_class_hash_t, u_rch_table, 4);
VX_ASSERT_OFFSET(rsrc_class_hash_t, rch_num_hash_blocks, 8196);
VX_ASSERT_OFFSET(rsrc_class_hash_t, rc_hash_blocks, 8200);
/** A context template; defined for readers, never written. */
typedef struct ctx_tmplt {
    union {
        cdb_int32_t u_offset[2];      /**< an offset */
        cdb_ref_t u_ctxt_name;        /**< a name */
        cdb_uint16_t u_ctxt_pattr_id; /**< a persistent attribute's number */
    } u_ctxt;                         /**< an offset, a name or an attribute's number */
    cdb_uint16_t ctxt_tbl_index;      /**< index in its table */
    cdb_uint16_t ctxt_type;           /**< kind of the template */
    cdb_uint16_t ctxt_class_id;       /**< class number */
    cdb_uint16_t ctxt_dattr_id;       /**< a dynamic attribute's number */
} ctx_tmplt_t;
VX_ASSERT_SIZE(ctx_tmplt_t, 16);
VX_ASSERT_OFFSET(ctx_tmplt_t, ctxt_tbl_index, 8);
VX_ASSERT_OFFSET(ctx_tmplt_t, ctxt_type, 10);
VX_ASSERT_OFFSET(ctx_tmplt_t, ctxt_class_id, 12);
VX_ASSERT_OFFSET(ctx_tmplt_t, ctxt_dattr_id, 14);

#endif
