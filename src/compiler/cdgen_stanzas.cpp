/* cdgen_stanzas.cpp: the staging records and tables that the catalogue names. */

#include "compiler/cdgen_stanzas.h"

#include "compiler/cdgen_kinds.h"

namespace {

/* By staged_record: where in the staging records. */
constexpr size_t records[STAGED_COUNT] = {
    offsetof(staging_records, cb_rsrc_class),          /* STAGED_CLASS */
    offsetof(staging_records, cb_rsrc_cmmap),          /* STAGED_CMMAP */
    offsetof(staging_records, cb_rsrc_variable_class), /* STAGED_VARIABLE_CLASS */
    offsetof(staging_records, cb_rsrc_pattr),          /* STAGED_PATTR */
    offsetof(staging_records, cb_rsrc_pattrC),         /* STAGED_PATTR_C */
    offsetof(staging_records, cb_rsrc_dattr),          /* STAGED_DATTR */
    offsetof(staging_records, cb_rsrc_dattrC),         /* STAGED_DATTR_C */
    offsetof(staging_records, cb_rsrc_action),         /* STAGED_ACTION */
    offsetof(staging_records, cb_rsrc_actionC),        /* STAGED_ACTION_C */
    offsetof(staging_records, cb_sd_def),              /* STAGED_SD_DEF */
};

/* By stanza_id. */
constexpr void (*initialisers[])(cdgen &) = {
    init_class_tbl,      /* SC_CONTROL_DEFINITION */
    init_cmmap_tbl,      /* SC_CLASS_TO_MANAGER_MAPPING */
    init_var_class_tbl,  /* SC_RESOURCE_VARIABLE_CLASS */
    init_class_tbl_fake, /* SC_RESOURCE_CLASS */
    init_pattr_tbl,      /* SC_PERSISTENT_RESOURCE_ATTRIBUTE */
    init_pattrC_tbl,     /* SC_PERSISTENT_CLASS_ATTRIBUTE */
    init_dattr_tbl,      /* SC_DYNAMIC_RESOURCE_ATTRIBUTE */
    init_dattrC_tbl,     /* SC_DYNAMIC_CLASS_ATTRIBUTE */
    init_actionC_tbl,    /* SC_CLASS_ACTION */
    init_action_tbl,     /* SC_RESOURCE_ACTION */
};
static_assert(std::size(initialisers) == SC_PATTR_SD_DEFINITION, "init_sd_tbl opens all others");

} // namespace

char *sc_cb(cdgen &cx, const srtable_ctrl &kind) {
    return reinterpret_cast<char *>(&cx.staged) + records[kind.sc_record];
}

void make_current(cdgen &cx, const srtable_ctrl &kind) {
    cx.framing.scp = &kind;
    cx.framing.state = &cx.framing.stanzas[static_cast<size_t>(&kind - sc_tables.data())];
    cx.framing.record = sc_cb(cx, kind);
    cx.framing.watched = cx.options.observer != nullptr || cx.options.debugLevel >= 2;
}

void (*sc_init_tbl(const srtable_ctrl &kind))(cdgen &) {
    auto id = static_cast<size_t>(&kind - sc_tables.data());
    return id < std::size(initialisers) ? initialisers[id] : init_sd_tbl;
}

tbl *sc_str_tbl(cdgen &cx, const srtable_ctrl &kind) {
    switch (kind.sc_side_tables) {
    case TABLES_OF_CMMAP:
        return staged_tbl(cx.staged.cb_rsrc_cmmap.u_rcm_strings);
    case TABLES_OF_VARIABLE_CLASS:
        return staged_tbl(cx.staged.cb_rsrc_variable_class.u_rvc_string_tbl);
    default:
        return staged_tbl(cx.staged.cb_rsrc_class.u_rc_strings);
    }
}

tbl *sc_vty_tbl(cdgen &cx, const srtable_ctrl &kind) {
    return kind.sc_side_tables == TABLES_OF_CLASS ? staged_tbl(cx.staged.cb_rsrc_class.u_rc_variety_lists) : nullptr;
}

tbl *sc_vv_tbl(cdgen &cx, const srtable_ctrl &kind) {
    return kind.sc_side_tables == TABLES_OF_CLASS ? staged_tbl(cx.staged.cb_rsrc_class.u_rc_valid_vals) : nullptr;
}

vx_uint16_t &vv_found(cdgen &cx, const srtable_ctrl &kind) {
    switch (kind.sc_record) {
    case STAGED_PATTR:
        return cx.valid_values.pattr_vv_found;
    case STAGED_PATTR_C:
        return cx.valid_values.pattrC_vv_found;
    case STAGED_DATTR:
        return cx.valid_values.dattr_vv_found;
    default:
        return cx.valid_values.dattrC_vv_found;
    }
}
