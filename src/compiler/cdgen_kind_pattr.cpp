/* cdgen_kind_pattr.cpp: persistent attributes of resources and of classes. */

#include "compiler/cdgen_kind.h"
#include "format/names.h"

namespace {

/* The differences between the two kinds. */
struct pattr_kind {
    stanza_id id;
    rsrc_pattr_t staging_records::*record;
    vx_uint16_t valid_value_lists::*vv_found; /* true: the stanza already has its list of valid values */
    cdb_ref_t rsrc_class_t::*records;
    vx_uint32_t cb_id;
    message_id no_class;
    bool valid_vals_absent_at_open; /* deliberate: the resource kind marks them at its completion only */
    bool uses_default_values;       /* deliberate: the class kind's DefaultValue lines are never used */
};

constexpr pattr_kind resource_kind = {.id = SC_PERSISTENT_RESOURCE_ATTRIBUTE,
                                      .record = &staging_records::cb_rsrc_pattr,
                                      .vv_found = &valid_value_lists::pattr_vv_found,
                                      .records = &rsrc_class_t::u_rc_pattrs,
                                      .cb_id = CDB_ID_PATTR,
                                      .no_class = MSG_NO_CLASS_FOR_PATTR,
                                      .valid_vals_absent_at_open = false,
                                      .uses_default_values = true};
constexpr pattr_kind class_kind = {.id = SC_PERSISTENT_CLASS_ATTRIBUTE,
                                   .record = &staging_records::cb_rsrc_pattrC,
                                   .vv_found = &valid_value_lists::pattrC_vv_found,
                                   .records = &rsrc_class_t::u_rc_pattrsC,
                                   .cb_id = CDB_ID_PATTR_C,
                                   .no_class = MSG_NO_CLASS_FOR_PATTR_C,
                                   .valid_vals_absent_at_open = true,
                                   .uses_default_values = false};

/* Structured data get their default from the SD stanzas that follow. */
void settle_default(cdgen &cx, const pattr_kind &kind, rsrc_pattr_t &attr) {
    if (scalar_vx(attr.ra_data_type) == VX_SD_PTR)
        return;
    tbl *strings = staged_tbl(cx.staged.cb_rsrc_class.u_rc_strings);
    const dflt_tbl &dflt = cx.framing.stanzas[kind.id].dflt;
    tbl_anchor array;
    if (kind.uses_default_values && has_values(dflt))
        dump_dflt(cx, strings, &dflt, &attr.ra_dflt_value, attr.ra_data_type);
    else if (copy_this_type(cx, &attr.ra_dflt_value, nullptr, attr.ra_data_type, DFLT_DEFAULT, strings, &array, 1) != 0)
        source_error(cx, MSG_NO_DEFAULT);
}

void open_pattr(cdgen &cx, const pattr_kind &kind) {
    rsrc_pattr_t &attr = cx.staged.*kind.record;
    attr = {};
    attr.ra_cb_ID = kind.cb_id;
    attr.u_ra_variety_list.offset[0] = mk_vty_sec(cx);
    mark_absent(attr.u_ra_sd);
    if (kind.valid_vals_absent_at_open)
        mark_absent(attr.u_ra_valid_vals);
    attr.ra_max_sd_idx = NO_SD_INDEX;
    cx.valid_values.vvdisp.reset();
    cx.valid_values.*kind.vv_found = 0;
}

void complete_pattr(cdgen &cx, const pattr_kind &kind) {
    completing(kind.id, [&] {
        rsrc_pattr_t &attr = cx.staged.*kind.record;
        require_class(cx, kind.no_class);
        require_complete(cx, kind.id);
        settle_valid_vals(attr, cx.valid_values.*kind.vv_found);
        settle_default(cx, kind, attr);
        if ((attr.ra_props & (REQD_FOR_DEFINE | OPT_FOR_DEFINE)) == 0)
            attr.ra_props |= INVAL_FOR_DEFINE;
        settle_group(attr, cx.framing.stanzas[kind.id]);
        append_record(cx, staged_tbl(cx.staged.cb_rsrc_class.*kind.records), attr);
        attr.ra_cb_ID = 0;
    });
}

void start_pattr(cdgen &cx, const pattr_kind &kind) {
    require_class(cx, kind.no_class);
    if ((cx.staged.*kind.record).ra_cb_ID != 0)
        complete_pattr(cx, kind);
    open_pattr(cx, kind);
}

} // namespace

void init_pattr_tbl(cdgen &cx) {
    start_pattr(cx, resource_kind);
}

void cmplt_pattr_tbl(cdgen &cx) {
    complete_pattr(cx, resource_kind);
}

void init_pattrC_tbl(cdgen &cx) {
    start_pattr(cx, class_kind);
}

void cmplt_pattrC_tbl(cdgen &cx) {
    complete_pattr(cx, class_kind);
}
