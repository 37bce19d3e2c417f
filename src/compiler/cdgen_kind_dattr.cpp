/* cdgen_kind_dattr.cpp: dynamic attributes of resources and of classes. */

#include "compiler/cdgen_kind.h"

#include <cstdio>

namespace {

/* The differences between the two kinds. */
struct dattr_kind {
    stanza_id id;
    rsrc_dattr_t staging_records::*record;
    vx_uint16_t valid_value_lists::*vv_found; /* true: the stanza already has its list of valid values */
    cdb_ref_t rsrc_class_t::*records;
    vx_uint32_t cb_id;
    bool shows_masks; /* deliberate: only the class kind prints its masks before it is found incomplete */
};

constexpr dattr_kind resource_kind = {.id = SC_DYNAMIC_RESOURCE_ATTRIBUTE,
                                      .record = &staging_records::cb_rsrc_dattr,
                                      .vv_found = &valid_value_lists::dattr_vv_found,
                                      .records = &rsrc_class_t::u_rc_dattrs,
                                      .cb_id = CDB_ID_DATTR,
                                      .shows_masks = false};
constexpr dattr_kind class_kind = {.id = SC_DYNAMIC_CLASS_ATTRIBUTE,
                                   .record = &staging_records::cb_rsrc_dattrC,
                                   .vv_found = &valid_value_lists::dattrC_vv_found,
                                   .records = &rsrc_class_t::u_rc_dattrsC,
                                   .cb_id = CDB_ID_DATTR_C,
                                   .shows_masks = true};

constexpr message_id NO_CLASS = MSG_NO_CLASS_FOR_DATTR;

/* True for types that have no range, even if one was given. */
bool has_no_range(vx_data_type_t type) {
    return type == VX_SD_PTR || type == VX_CHAR_PTR || type == VX_BINARY_PTR || type == VX_RSRC_HANDLE_PTR;
}

void mark_absent(vx_value_t &value) {
    value.val_uint64 = 0;
    value.val_uint32 = CDB_NONE;
}

/* A default bound, in containers of its own. */
void default_bound(cdgen &cx, vx_value_t *bound, vx_data_type_t type, int mode, message_id failure) {
    tbl *strings = staged_tbl(cx.staged.cb_rsrc_class.u_rc_strings);
    sd_anchors anchors;
    int result = type == VX_SD_PTR_ARRAY ? copy_this_sd_type(cx, bound, VX_INT32, mode, strings, &anchors, 0, type)
                                         : copy_this_type(cx, bound, nullptr, type, mode, strings, &anchors.array, 1);
    if (result != 0)
        source_error(cx, failure);
}

void settle_range(cdgen &cx, rsrc_dattr_t &attr) {
    if (has_no_range(attr.ra_data_type)) {
        mark_absent(attr.ra_min_value);
        mark_absent(attr.ra_max_value);
    } else if (!cx.range.dattr_range_found) {
        if (attr.ra_cb_ID == CDB_ID_DATTR)
            cx.range.dattr_range_type = VX_UNKNOWN;
        default_bound(cx, &attr.ra_min_value, attr.ra_data_type, R_LO_DEFAULT, MSG_NO_LOWER_BOUND);
        default_bound(cx, &attr.ra_max_value, attr.ra_data_type, R_HI_DEFAULT, MSG_NO_UPPER_BOUND);
    }
    cx.range.dattr_range_found = 0;
}

/* Structured data get their initial value from the SD stanzas that follow. */
void settle_initial_value(cdgen &cx, const dattr_kind &kind, rsrc_dattr_t &attr) {
    if (scalar_vx(attr.ra_data_type) == VX_SD_PTR)
        return;
    tbl *strings = staged_tbl(cx.staged.cb_rsrc_class.u_rc_strings);
    const dflt_tbl &dflt = cx.framing.stanzas[kind.id].dflt;
    tbl_anchor array;
    if (has_values(dflt))
        dump_dflt(cx, strings, &dflt, &attr.ra_init_value, attr.ra_data_type);
    else if (copy_this_type(cx, &attr.ra_init_value, nullptr, attr.ra_data_type, INIT_DEFAULT, strings, &array, 1) != 0)
        source_error(cx, MSG_NO_INITIAL_VALUE);
}

void open_dattr(cdgen &cx, const dattr_kind &kind) {
    rsrc_dattr_t &attr = cx.staged.*kind.record;
    attr = {};
    attr.ra_cb_ID = kind.cb_id;
    attr.u_ra_variety_list.offset[0] = mk_vty_sec(cx);
    mark_absent(attr.u_ra_express);
    mark_absent(attr.u_ra_vclass);
    mark_absent(attr.u_ra_rearm_expr);
    attr.ra_max_sd_idx = NO_SD_INDEX;
    mark_absent(attr.u_ra_sd);
    if (kind.id == resource_kind.id)
        cx.range.dattr_range_type = VX_UNKNOWN;
    cx.valid_values.vvdisp.reset();
    cx.valid_values.*kind.vv_found = 0;
}

void show_masks(cdgen &cx, stanza_id id) {
    if (cx.options.explanations == nullptr || cx.framing.stanzas[id].req_mask == sc_tables[id].req_mask_cmplt)
        return;
    fprintf(cx.options.explanations, "scp->req_mask:         %x\n", cx.framing.stanzas[id].req_mask);
    fprintf(cx.options.explanations, "scp->req_mask_cmplt:   %x\n", sc_tables[id].req_mask_cmplt);
}

void complete_dattr(cdgen &cx, const dattr_kind &kind) {
    completing(kind.id, [&] {
        rsrc_dattr_t &attr = cx.staged.*kind.record;
        require_class(cx, NO_CLASS);
        if (kind.shows_masks)
            show_masks(cx, kind.id);
        require_complete(cx, kind.id);
        settle_valid_vals(attr, cx.valid_values.*kind.vv_found);
        settle_range(cx, attr);
        settle_initial_value(cx, kind, attr);
        settle_group(attr, cx.framing.stanzas[kind.id]);
        note_stray_range(cx, attr, kind.records);
        append_record(cx, staged_tbl(cx.staged.cb_rsrc_class.*kind.records), attr);
        attr.ra_cb_ID = 0;
    });
}

void start_dattr(cdgen &cx, const dattr_kind &kind) {
    require_class(cx, NO_CLASS);
    if ((cx.staged.*kind.record).ra_cb_ID != 0)
        complete_dattr(cx, kind);
    open_dattr(cx, kind);
}

bool is_array_of_numbers(vx_data_type_t type) {
    return is_vx_array(type) && scalar_vx(type) <= VX_FLOAT64;
}

} // namespace

void note_stray_range(cdgen &cx, const rsrc_dattr_t &attr, cdb_ref_t rsrc_class_t::*records) {
    vx_data_type_t type = attr.ra_data_type;
    bool refers = has_no_range(type) || is_vx_array(type);
    bool given_array = is_array_of_numbers(cx.range.dattr_range_type);
    bool sound = is_array_of_numbers(type) && given_array;
    if (attr.ra_cb_ID != CDB_ID_DATTR || cx.range.dattr_range_type == VX_UNKNOWN || !refers || sound)
        return;
    size_t record = staged_tbl(cx.staged.cb_rsrc_class.*records)->used();
    bool to_numbers = is_vx_array(type) && given_array;
    for (size_t bound : {offsetof(rsrc_dattr_t, ra_min_value), offsetof(rsrc_dattr_t, ra_max_value)})
        cx.stray.strays.push_back({cx.sections.rsrc_class_count, records, record + bound, to_numbers});
}

void init_dattr_tbl(cdgen &cx) {
    start_dattr(cx, resource_kind);
}

void cmplt_dattr_tbl(cdgen &cx) {
    complete_dattr(cx, resource_kind);
}

void init_dattrC_tbl(cdgen &cx) {
    start_dattr(cx, class_kind);
}

void cmplt_dattrC_tbl(cdgen &cx) {
    complete_dattr(cx, class_kind);
}
