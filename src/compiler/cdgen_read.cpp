/* cdgen_read.cpp: the framing of stanzas, and the loop that takes a source line by line. */

#include "compiler/cdgen_read.h"

#include "compiler/cdgen.h"
#include "compiler/cdgen_stanzas.h"

namespace {

bool class_is_open(const cdgen &cx) {
    return cx.staged.cb_rsrc_class.rc_cb_ID != 0;
}

/* The owner of a run of a class or an action, which refers to its SD section. An open class action is preferred to a
 * resource action. */
cdb_ref_t *owner_field(cdgen &cx, const sd_owner &owner) {
    if (owner.of_class != nullptr)
        return &(cx.staged.cb_rsrc_class.*owner.of_class);
    if (owner.of_action == nullptr)
        return nullptr;
    rsrc_action_t &action =
        cx.staged.cb_rsrc_actionC.ac_cb_ID != 0 ? cx.staged.cb_rsrc_actionC : cx.staged.cb_rsrc_action;
    return &(action.*owner.of_action);
}

/* The first stanza of a run makes the SD section and lets its owner refer to it. */
void begin_sd_run(cdgen &cx, bool of_attribute) {
    if (!of_attribute && !class_is_open(cx))
        source_error(cx, MSG_NO_CLASS_FOR_SD);
    cx.sd.belong_to(owner_field(cx, *cx.framing.scp->sc_sd_owner));
    if (cx.sd.has_section())
        cx.sd.begin(mk_sd_sec(cx));
    if (of_attribute && !cx.sd.makes_value())
        source_error(cx, MSG_NO_SD_ATTRIBUTE);
}

stanza_state &state_of(cdgen &cx, const srtable_ctrl *scp) {
    return cx.framing.stanzas[static_cast<size_t>(scp - sc_tables.data())];
}

/* The values of the stanza before have been used. */
void forget_values(cdgen &cx, dflt_tbl &dflt) {
    if (dflt.tbl.use_count() == 1)
        cx.framing.spare_dflt = std::move(dflt.tbl);
    dflt = {};
}

void begin_sd_stanza(cdgen &cx) {
    bool of_attribute = cx.framing.scp->sc_sd_owner->is_attribute();
    stanza_state &state = state_of(cx, cx.framing.scp);
    if (cx.staged.cb_sd_def.sd_cb_ID != 0 && cx.framing.prev_scp != cx.framing.scp)
        cmplt_sd_tbl(cx, cx.framing.prev_scp);
    if (of_attribute && cx.sd.makes_value())
        state.dflt = state_of(cx, cx.framing.prev_scp).dflt;
    if (cx.staged.cb_sd_def.sd_cb_ID == 0) {
        if (!of_attribute)
            cx.sd.forget_owner();
        begin_sd_run(cx, of_attribute);
        if (!of_attribute)
            forget_values(cx, state.dflt);
    }
    sc_init_tbl (*cx.framing.scp)(cx);
    state.restart();
}

/* Attribute records stay open: their own kind's next stanza, or the end of input, completes them. */
void begin_plain_stanza(cdgen &cx) {
    if (cx.staged.cb_sd_def.sd_cb_ID != 0)
        cmplt_sd_tbl(cx, cx.framing.prev_scp);
    if (cx.staged.cb_rsrc_action.ac_cb_ID != 0)
        cmplt_action_tbl(cx);
    if (cx.staged.cb_rsrc_actionC.ac_cb_ID != 0)
        cmplt_actionC_tbl(cx);
    sc_init_tbl (*cx.framing.scp)(cx);
    forget_values(cx, cx.framing.state->dflt);
    cx.framing.state->restart();
    cx.sd.forget_owner();
}

void begin_stanza(cdgen &cx, attr_text text) {
    cx.framing.table_id = set_table_id({text.name, static_cast<size_t>(text.end - text.name)});
    if (cx.framing.table_id < 0) {
        *text.end = '\0';
        source_error(cx, MSG_UNKNOWN_STANZA, text.name);
    }
    cx.framing.prev_scp = cx.framing.scp;
    make_current(cx, sc_tables[static_cast<size_t>(cx.framing.table_id)]);
    cx.framing.curr_sd_scp = cx.framing.scp;
    if (cx.framing.scp->sc_sd_owner != nullptr)
        begin_sd_stanza(cx);
    else
        begin_plain_stanza(cx);
}

} // namespace

void take_line(cdgen &cx, attr_text text) {
    if (text.name == text.line)
        begin_stanza(cx, text);
    else if (cx.framing.state == nullptr)
        source_error(cx, MSG_NO_STANZA);
    else
        save_attr_line(cx, text.line, text.name, text.end);
}

namespace {

/* Closes the source however its reading ends. */
struct closing {
    explicit closing(source_file &file) : source(file) {}
    closing(const closing &) = delete;
    closing &operator=(const closing &) = delete;
    ~closing() {
        source.close();
    }

    source_file &source;
};

} // namespace

void cache_input_data(cdgen &cx, const char *filename) {
    closing at_end(cx.source.cdb_fp);
    open_source(cx, filename);
    for (;;) {
        source_line line = next_line(cx);
        if (line.begin == nullptr)
            break;
        attr_text text = find_text(line);
        if (text.end != nullptr)
            take_line(cx, text);
    }
}
