/* cdgen_kind_action.cpp: actions of resources and of classes. */

#include "compiler/cdgen_kind.h"
#include "format/names.h"

namespace {

/* The differences between the two kinds. */
struct action_kind {
    stanza_id id;
    rsrc_action_t staging_records::*record;
    cdb_ref_t rsrc_class_t::*records;
    vx_uint32_t cb_id;
};

constexpr action_kind resource_kind = {SC_RESOURCE_ACTION, &staging_records::cb_rsrc_action,
                                       &rsrc_class_t::u_rc_actions, CDB_ID_ACTION};
constexpr action_kind class_kind = {SC_CLASS_ACTION, &staging_records::cb_rsrc_actionC, &rsrc_class_t::u_rc_actionsC,
                                    CDB_ID_ACTION_C};

constexpr message_id NO_CLASS = MSG_NO_CLASS_FOR_ACTION; /* deliberately for both kinds */

void complete_action(cdgen &cx, const action_kind &kind) {
    completing(kind.id, [&] {
        rsrc_action_t &action = cx.staged.*kind.record;
        require_class(cx, NO_CLASS);
        require_complete(cx, kind.id);
        if (!was_given(cx.framing.stanzas[kind.id], language::bit_of("Permission")))
            action.ac_perms = DEFAULT_PERMISSION;
        append_record(cx, staged_tbl(cx.staged.cb_rsrc_class.*kind.records), action);
        action.ac_cb_ID = 0;
    });
}

void start_action(cdgen &cx, const action_kind &kind) {
    rsrc_action_t &action = cx.staged.*kind.record;
    require_class(cx, NO_CLASS);
    if (action.ac_cb_ID != 0)
        complete_action(cx, kind);
    action = {};
    action.ac_cb_ID = kind.cb_id;
    action.u_ac_variety_list.offset[0] = mk_vty_sec(cx);
    mark_absent(action.u_ac_sd_input);
    mark_absent(action.u_ac_sd_resp);
    cx.valid_values.vvdisp.reset();
}

} // namespace

void init_action_tbl(cdgen &cx) {
    start_action(cx, resource_kind);
}

void cmplt_action_tbl(cdgen &cx) {
    complete_action(cx, resource_kind);
}

void init_actionC_tbl(cdgen &cx) {
    start_action(cx, class_kind);
}

void cmplt_actionC_tbl(cdgen &cx) {
    complete_action(cx, class_kind);
}
