/* cdgen_kind_sd.cpp: structured-data definitions, sections of the class's list tables, and collected defaults. */

#include "compiler/cdgen_kind.h"

namespace {

constexpr message_id NO_CLASS = MSG_NO_CLASS_FOR_SD;

/* An empty list with room for its first entry. */
template <class List> vx_uint32_t make_list(cdgen &cx, tbl *t, vx_uint32_t List::*id, vx_uint32_t value) {
    auto *list = static_cast<List *>(alloc_tble(cx, t, sizeof(List)));
    list->*id = value;
    return static_cast<vx_uint32_t>(reinterpret_cast<char *>(list) - t->tbl_base);
}

/* Makes room for one more element of the section at an offset. The header has room for the first one. Nothing else goes
 * into the table while a run is open, so its elements are adjacent. */
size_t next_sd_field(cdgen &cx, tbl *sd_defs, size_t section) {
    if (record_at<sd_def_t>(sd_defs, section)->sd_count == 0)
        return section + offsetof(sd_def_t, sd_fields);
    auto *field = static_cast<char *>(alloc_tble(cx, sd_defs, sizeof(sd_field_t)));
    return static_cast<size_t>(field - sd_defs->tbl_base);
}

/* Files the staged element into the section of its run. */
void file_element(cdgen &cx) {
    if (!cx.sd.element.is_complete())
        source_error(cx, MSG_INCOMPLETE_STANZA);
    cx.sd.element.forget();
    tbl *sd_defs = staged_tbl(cx.staged.cb_rsrc_class.u_rc_sd_defs);
    if (sd_defs == nullptr)
        source_error(cx, MSG_NO_SD_TABLE);
    size_t section = cx.sd.section()->offset[0];
    sd_field_t field = cx.staged.cb_sd_def.sd_fields[0];
    field.sd_action_id = NO_ACTION_ID;
    field.sd_valid_type = SD_VALID_TYPE;
    if (!cx.sd.element.sd_vv_found)
        mark_absent(field.u_sd_valid_vals);
    cx.sd.element.sd_vv_found = 0;
    size_t slot = next_sd_field(cx, sd_defs, section);
    *record_at<sd_field_t>(sd_defs, slot) = field;
    ++record_at<sd_def_t>(sd_defs, section)->sd_count;
}

/* The attribute's value is one of the defaults of the run's element types. */
void dump_sd_default(cdgen &cx, const srtable_ctrl *scp) {
    dflt_tbl &dflt = cx.framing.stanzas[static_cast<size_t>(scp - sc_tables.data())].dflt;
    dflt.num_elems = cx.sd.elements();
    dump_dflt(cx, staged_tbl(cx.staged.cb_rsrc_class.u_rc_strings), &dflt, cx.sd.value(),
              dflt.tbl->sd_type == VX_SD_PTR ? VX_SD_PTR : VX_SD_PTR_ARRAY);
}

/* Adds one element's default to the structured value. */
void dump_sd_element(cdgen &cx, tbl *str_tbl, const dflt_tbl *vtbl, size_t i, vx_value_t *lval, vx_data_type_t dt,
                     sd_anchors *anchors) {
    auto type =
        static_cast<vx_data_type_t>(record_at<vx_value_t>(&vtbl->tbl->cells, i * sizeof(vx_value_t))->val_uint32);
    int mode = cx.sd.attribute_type() == 0 ? DFLT_DEFAULT : INIT_DEFAULT;
    anchors->array.reset();
    auto count = static_cast<vx_uint32_t>(vtbl->num_elems);
    if (copy_this_sd_type(cx, lval, type, mode, str_tbl, anchors, count, dt) != 0)
        source_error(cx, mode == DFLT_DEFAULT ? MSG_NO_ELEMENT_DEFAULT : MSG_NO_ELEMENT_INITIAL);
}

constexpr size_t VALUES_AT_ONCE = 4096; /* how many are serialised before their memory is given back */

/* Gives back the memory of the values before this one. Returns of how many cells. */
size_t give_back_before(dflt_values &values, const vx_value_t &value, vx_data_type_t dt) {
    const char *first = values.cells.tbl_base;
    if (number_width(scalar_vx(dt)) == 0)
        values.texts.give_back_before(value.ptr_char);
    values.cells.release_before(reinterpret_cast<const char *>(&value));
    return static_cast<size_t>(values.cells.tbl_base - first) / sizeof(vx_value_t);
}

/* Serialises all values. Those of a long list are given back meanwhile, because nothing needs them again. */
void dump_values(cdgen &cx, tbl *str_tbl, const dflt_tbl *vtbl, vx_value_t *lval, vx_data_type_t dt) {
    tbl_anchor array;
    auto count = static_cast<vx_uint32_t>(vtbl->num_elems);
    for (size_t i = 0, given_back = 0; i < vtbl->num_elems; ++i) {
        const auto *value = record_at<vx_value_t>(&vtbl->tbl->cells, (i - given_back) * sizeof(vx_value_t));
        if (i % VALUES_AT_ONCE == VALUES_AT_ONCE - 1)
            given_back += give_back_before(*vtbl->tbl, *value, dt);
        if (!copy_number(*lval, *value, dt) &&
            copy_this_type(cx, lval, value, dt, TYPE_SAME, str_tbl, &array, count) != 0)
            source_error(cx, MSG_DEFAULT_NOT_COPIED);
    }
}

} // namespace

vx_uint32_t mk_sd_sec(cdgen &cx) {
    return make_list(cx, staged_tbl(cx.staged.cb_rsrc_class.u_rc_sd_defs), &sd_def_t::sd_cb_ID, CDB_ID_SD_DEF);
}

vx_uint32_t mk_vv_sec(cdgen &cx) {
    return make_list(cx, staged_tbl(cx.staged.cb_rsrc_class.u_rc_valid_vals), &valid_values_t::vv_cb_ID,
                     CDB_ID_VALID_VALUES);
}

vx_uint32_t mk_vty_sec(cdgen &cx) {
    return make_list(cx, staged_tbl(cx.staged.cb_rsrc_class.u_rc_variety_lists), &variety_list_t::vl_cb_ID,
                     CDB_ID_VARIETY_LIST);
}

void init_sd_tbl(cdgen &cx) {
    require_class(cx, NO_CLASS);
    if (cx.staged.cb_sd_def.sd_cb_ID != 0)
        completing(SC_PATTR_SD_DEFINITION, [&] { file_element(cx); });
    cx.staged.cb_sd_def = {};
    cx.staged.cb_sd_def.sd_cb_ID = CDB_ID_SD_DEF;
    cx.valid_values.vvdisp.reset();
    cx.sd.element.sd_vv_found = 0;
}

void cmplt_sd_tbl(cdgen &cx, const srtable_ctrl *scp) {
    require_class(cx, NO_CLASS);
    init_sd_tbl(cx); /* files the last element */
    if (cx.sd.makes_value())
        completing(SC_PATTR_SD_DEFINITION, [&] { dump_sd_default(cx, scp); });
    cx.sd.end();
    cx.staged.cb_sd_def.sd_cb_ID = 0;
}

void dump_dflt(cdgen &cx, tbl *str_tbl, const dflt_tbl *vtbl, vx_value_t *lval, vx_data_type_t dt) {
    if (scalar_vx(dt) != VX_SD_PTR)
        return dump_values(cx, str_tbl, vtbl, lval, dt);
    sd_anchors anchors;
    for (size_t i = 0; i < vtbl->num_elems; ++i)
        dump_sd_element(cx, str_tbl, vtbl, i, lval, dt, &anchors);
}
