/* cdgen_closing.cpp: the steps at the end of the source. */

#include "compiler/cdgen_closing.h"

#include "compiler/cdgen_kinds.h"
#include "format/constants.h"

namespace {

/* Completes a record if it is open. */
template <auto Record, auto Identifier, void (*Complete)(cdgen &)> void complete_open(cdgen &cx) {
    if ((cx.staged.*Record).*Identifier != 0)
        Complete(cx);
}

void complete_sd_run(cdgen &cx) {
    if (cx.staged.cb_sd_def.sd_cb_ID != 0)
        cmplt_sd_tbl(cx, cx.framing.curr_sd_scp);
}

/* Frees the collected defaults, which have all been serialised, because the image needs the memory. */
void drop_values(cdgen &cx) {
    for (stanza_state &state : cx.framing.stanzas)
        state.dflt = {};
    cx.framing.spare_dflt = nullptr;
}

/* The ID of the last class's persistent resource attribute with the locator's name; an unknown name is not an error. */
vx_uint16_t locator_id(cdgen &cx) {
    tbl *strings = staged_tbl(cx.staged.cb_rsrc_class.u_rc_strings);
    for (const rsrc_pattr_t &attr : records_of<rsrc_pattr_t>(staged_tbl(cx.staged.cb_rsrc_class.u_rc_pattrs))) {
        const auto *name = static_cast<const char *>(tbl_at(strings, attr.u_ra_name.offset[0], 1));
        if (strcmp(name, cx.later._rc_locator.name) == 0)
            return static_cast<vx_uint16_t>(attr.ra_attr_id);
    }
    return NO_LOCATOR;
}

void resolve_locator(cdgen &cx) {
    bool given = cx.later._rc_locator.ptr != nullptr && cx.later._rc_locator.name[0] != '\0';
    cx.staged.cb_rsrc_class.rc_locator = given ? locator_id(cx) : NO_LOCATOR;
}

/* No stanza describes the manager: its record is made from its name. */
void make_manager(cdgen &cx) {
    if (cx.later.rm_name == nullptr)
        cdgen_error_exit(MSG_NO_MANAGER, nullptr, nullptr, 0, 1);
    init_mgr_tbl(cx);
    tbl *strings = staged_tbl(cx.staged.cb_rsrc_mgr.u_rm_strings_table);
    const char *name = cx.later.rm_name.get();
    cx.staged.cb_rsrc_mgr.u_rm_RMname = {{add_to_tbl(cx, strings, name, strlen(name) + 1), 0}};
    cmplt_mgr_tbl(cx);
}

void complete_class(cdgen &cx) {
    if (cx.staged.cb_rsrc_class.rc_cb_ID == 0)
        cdgen_error_exit(MSG_NO_CLASSES, nullptr, nullptr, 0, 1);
    cmplt_class_tbl(cx);
}

void complete_map(cdgen &cx) {
    if (cx.staged.cb_rsrc_cmmap.rcm_cb_ID == 0)
        cdgen_error_exit(MSG_NO_MAPS, nullptr, nullptr, 0, 1);
    cmplt_cmmap_tbl(cx);
}

/* Deliberate: attributes and actions come before the SD run that may belong to them. */
constexpr closing_step steps[] = {
    complete_open<&staging_records::cb_rsrc_pattr, &rsrc_pattr_t::ra_cb_ID, cmplt_pattr_tbl>,
    complete_open<&staging_records::cb_rsrc_dattr, &rsrc_dattr_t::ra_cb_ID, cmplt_dattr_tbl>,
    complete_open<&staging_records::cb_rsrc_pattrC, &rsrc_pattr_t::ra_cb_ID, cmplt_pattrC_tbl>,
    complete_open<&staging_records::cb_rsrc_dattrC, &rsrc_dattr_t::ra_cb_ID, cmplt_dattrC_tbl>,
    complete_open<&staging_records::cb_rsrc_action, &rsrc_action_t::ac_cb_ID, cmplt_action_tbl>,
    complete_open<&staging_records::cb_rsrc_actionC, &rsrc_action_t::ac_cb_ID, cmplt_actionC_tbl>,
    complete_sd_run,
    resolve_locator,
    complete_class,
    complete_open<&staging_records::cb_rsrc_variable_class, &rsrc_variable_class_t::rvc_cb_ID, cmplt_var_class_tbl>,
    complete_map,
    make_manager,
    drop_values,
    bld_var_id_tbls,
};

} // namespace

constinit const std::span<const closing_step> closing_steps = steps;
