/* cdgen_kind_top.cpp: class-to-manager maps, managers, variable classes and resource classes. */

#include "compiler/cdgen_kind.h"
#include "format/sections.h"

#include <cstdlib>
#include <type_traits>

namespace {

constexpr size_t STRINGS_AU = 8192;

/* Makes references "none" until a stanza sets them. (The references to side tables get their tables at once.) */
constexpr cdb_ref_t rsrc_class_t::*absent_at_open[] = {
    &rsrc_class_t::u_rc_def_input,     &rsrc_class_t::u_rc_undef_input, &rsrc_class_t::u_rc_online_input,
    &rsrc_class_t::u_rc_offline_input, &rsrc_class_t::u_rc_reset_input, &rsrc_class_t::u_rc_actionsC,
    &rsrc_class_t::u_rc_actions,       &rsrc_class_t::u_rc_errors,      &rsrc_class_t::u_rc_depends,
    &rsrc_class_t::u_rc_sd_defs,       &rsrc_class_t::u_rc_alias,       &rsrc_class_t::u_rc_name,
};

/* A class without a Name is named after the output file: its path up to ".cdef", including the directory. */
void default_class_name(cdgen &cx) {
    const char *suffix = strstr(cx.options.cdefname, ".cdef"); /* deliberately the first ".cdef", which need not be at
                                                                * the end */
    if (suffix == nullptr)
        cdgen_error_exit(MSG_INVALID_OUTPUT_NAME, nullptr, nullptr, 0, 1);
    auto length = static_cast<size_t>(suffix - cx.options.cdefname);
    std::unique_ptr<char, free_memory> name(static_cast<char *>(cfg_malloc(length + 1)));
    memcpy(name.get(), cx.options.cdefname, length);
    tbl *strings = staged_tbl(cx.staged.cb_rsrc_class.u_rc_strings);
    if (strings == nullptr)
        source_error(cx, MSG_NO_STRING_TABLE);
    cx.staged.cb_rsrc_class.u_rc_name.offset[0] = add_to_tbl(cx, strings, name.get(), length + 1);
}

/* Deliberate: an attribute that a new class finds open goes into the old one as it is, unchecked. If it has no valid
 * values its reference to them may still be 0, which is not "none", so it is noted for the reversal. */
template <class Attribute>
void flush_raw(cdgen &cx, Attribute &attr, cdb_ref_t rsrc_class_t::*records, vx_uint16_t found) {
    if (attr.ra_cb_ID == 0)
        return;
    tbl *filed = staged_tbl(cx.staged.cb_rsrc_class.*records);
    if (!found && attr.u_ra_valid_vals.offset[0] == 0)
        cx.stray.strays.push_back(
            {cx.sections.rsrc_class_count, records, filed->used() + offsetof(Attribute, u_ra_valid_vals)});
    if constexpr (std::is_same_v<Attribute, rsrc_dattr_t>)
        note_stray_range(cx, attr, records);
    append_record(cx, filed, attr);
    attr.ra_cb_ID = 0;
}

} // namespace

void init_cmmap_tbl(cdgen &cx) {
    rsrc_cmmap_t &map = cx.staged.cb_rsrc_cmmap;
    if (map.rcm_cb_ID != 0)
        cdgen_error_exit(MSG_SECOND_MAP, nullptr, nullptr, 0, 1);
    map = {};
    map.rcm_cb_ID = CDB_ID_CMMAP;
    stage_tbl(map.u_rcm_strings, make_tbl(cx, STRINGS_AU, "CMMapStrings"));
}

void cmplt_cmmap_tbl(cdgen &cx) {
    rsrc_cmmap_t &map = cx.staged.cb_rsrc_cmmap;
    if (map.rcm_first_key > map.rcm_last_key)
        source_error(cx, MSG_KEYS_REVERSED);
    append_record(cx, &cx.sections.rsrc_cmmap_tbl, map);
    ++cx.sections.rsrc_cmmap_count;
    map.rcm_cb_ID = 0;
}

void init_mgr_tbl(cdgen &cx) {
    rsrc_mgr_t &mgr = cx.staged.cb_rsrc_mgr;
    if (mgr.rm_cb_ID != 0)
        cmplt_mgr_tbl(cx);
    mgr = {};
    mgr.rm_cb_ID = CDB_ID_MGR;
    stage_tbl(mgr.u_rm_strings_table, make_tbl(cx, STRINGS_AU, "ManagerStrings"));
}

void cmplt_mgr_tbl(cdgen &cx) {
    rsrc_mgr_t *staged = append_record(cx, &cx.sections.rsrc_mgr_tbl, cx.staged.cb_rsrc_mgr);
    staged->rm_id = static_cast<vx_uint16_t>(cx.sections.rsrc_mgr_count);
    ++cx.sections.rsrc_mgr_count;
    cx.staged.cb_rsrc_mgr.rm_cb_ID = 0;
}

void init_var_class_tbl(cdgen &cx) {
    rsrc_variable_class_t &variable_class = cx.staged.cb_rsrc_variable_class;
    if (variable_class.rvc_cb_ID != 0)
        cmplt_var_class_tbl(cx);
    variable_class = {};
    variable_class.rvc_cb_ID = CDB_ID_VARIABLE_CLASS;
    mark_absent(variable_class.u_rvc_compat_name);
    stage_tbl(variable_class.u_rvc_string_tbl, make_tbl(cx, STRINGS_AU, "VarClassStrings"));
}

void cmplt_var_class_tbl(cdgen &cx) {
    file_tbl(cx, cx.store.of_variable_classes, cx.staged.cb_rsrc_variable_class.u_rvc_string_tbl);
    append_record(cx, &cx.sections.rsrc_var_class_tbl, cx.staged.cb_rsrc_variable_class);
    ++cx.sections.rsrc_var_class_count;
    cx.staged.cb_rsrc_variable_class.rvc_cb_ID = 0;
}

void init_class_tbl(cdgen &cx) {
    rsrc_class_t &rsrc_class = cx.staged.cb_rsrc_class;
    if (rsrc_class.rc_cb_ID != 0)
        cmplt_class_tbl(cx);
    rsrc_class = {};
    rsrc_class.rc_cb_ID = CDB_ID_CLASS;
    for (auto field : absent_at_open)
        mark_absent(rsrc_class.*field);
    for (const cdb::side_table &table : cdb::side_tables_as_made)
        stage_tbl(rsrc_class.*table.ref, make_tbl(cx, table.growth, table.trace_name));
}

/* ResourceClass continues with the record that ControlDefinition opened. */
void init_class_tbl_fake(cdgen &) {}

void cmplt_class_tbl(cdgen &cx) {
    rsrc_class_t &rsrc_class = cx.staged.cb_rsrc_class;
    if (rsrc_class.u_rc_name.offset[0] == CDB_NONE)
        default_class_name(cx);
    flush_raw(cx, cx.staged.cb_rsrc_pattrC, &rsrc_class_t::u_rc_pattrsC, cx.valid_values.pattrC_vv_found);
    flush_raw(cx, cx.staged.cb_rsrc_dattrC, &rsrc_class_t::u_rc_dattrsC, cx.valid_values.dattrC_vv_found);
    flush_raw(cx, cx.staged.cb_rsrc_pattr, &rsrc_class_t::u_rc_pattrs, cx.valid_values.pattr_vv_found);
    flush_raw(cx, cx.staged.cb_rsrc_dattr, &rsrc_class_t::u_rc_dattrs, cx.valid_values.dattr_vv_found);
    for (const cdb::side_table &table : cdb::side_tables_as_made)
        file_tbl(cx, cx.store.of_classes, rsrc_class.*table.ref);
    append_record(cx, &cx.sections.rsrc_class_tbl, rsrc_class);
    ++cx.sections.rsrc_class_count;
    rsrc_class.rc_cb_ID = 0;
}
