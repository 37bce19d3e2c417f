/* given_interface.cpp: functions of the fixed interface that nothing in the program calls. */

#include "compiler/given_interface.h"

#include "compiler/cdgen_attr.h"
#include "compiler/cdgen_stanzas.h"
#include "compiler/cdgen_values.h"

#include <cstring>

void memcpy_8_rounded(char *dst, const char *src, int len) {
    int rounded = (len + 7) & ~7;
    memcpy(dst, src, static_cast<size_t>(len));
    if (rounded > len)
        memset(dst + len, 0, static_cast<size_t>(rounded - len));
}

vx_uint32_t mk_sd_data_tbl(cdgen &cx, vx_data_type_t sd_type, tbl *dflt_tp) {
    if (scalar_vx(sd_type) != VX_SD_PTR)
        source_error(cx, MSG_NOT_AN_SD_TYPE);
    size_t size = sd_type == VX_SD_PTR ? sizeof(vx_structured_data_t) : sizeof(vx_array_t);
    auto *header = static_cast<char *>(alloc_tble(cx, dflt_tp, size));
    return static_cast<vx_uint32_t>(header - dflt_tp->tbl_base);
}

void del_tbl_entry(cdgen &cx, const rsrc_variable_class_t *rvcp) {
    for (size_t i = 0; i < cx.variable_ids.tbl_entry_used; ++i)
        if (cx.variable_ids.tbl_entries[i].rvcp == rvcp)
            cx.variable_ids.tbl_entries[i] = {};
}

const char *is_attr_SD(int table_id) {
    return strstr(sc_tables[static_cast<size_t>(table_id)].sc_name, "AttrSDDefinition");
}

const char *is_SD_stanza(int table_id) {
    return strstr(sc_tables[static_cast<size_t>(table_id)].sc_name, "SDDefinition");
}

char *strip_quotes(char *s) {
    if (s == nullptr)
        return nullptr;
    char *end = s + strlen(s);
    return strip_quotes(s, &end);
}

sd_type_t SD_stanza_type(int table_id) {
    const sd_owner *owner = sc_tables[static_cast<size_t>(table_id)].sc_sd_owner;
    return owner == nullptr ? SD_TYPE_UNKNOWN : owner->type;
}

tbl *sc_sd_tbl(cdgen &cx, const srtable_ctrl &kind) {
    return kind.sc_side_tables == TABLES_OF_CMMAP ? nullptr : staged_tbl(cx.staged.cb_rsrc_class.u_rc_sd_defs);
}

vx_data_type_t strToVxDt(const char *s) {
    return s == nullptr ? VX_UNKNOWN : data_type_named(s);
}

int strToVar(const char *s, orb_variable_type_t *t) {
    std::optional<orb_variable_type_t> known = s == nullptr ? std::nullopt : variable_type_named(s);
    if (known)
        *t = *known;
    return known ? 0 : 1;
}

namespace {

/* Another stanza is current for a while. */
class other_stanza {
public:
    explicit other_stanza(stanza_framing &of) : framing(of), scp(of.scp), state(of.state), record(of.record) {}
    other_stanza(const other_stanza &) = delete;
    other_stanza &operator=(const other_stanza &) = delete;
    ~other_stanza() {
        framing.scp = scp;
        framing.state = state;
        framing.record = record;
    }

private:
    stanza_framing &framing;
    const srtable_ctrl *scp;
    stanza_state *state;
    char *record;
};

} // namespace

void save_attr(cdgen &cx, char *il, int table_id) {
    char *name = il + strspn(il, " \t");
    other_stanza while_taken(cx.framing);
    make_current(cx, sc_tables[static_cast<size_t>(table_id)]);
    save_attr_line(cx, il, name, name + strlen(name));
}

void set_props(vx_uint32_t *dest, const props_t *props, int len, char *vnoq) {
    if (vnoq != nullptr)
        set_props(dest, {props, static_cast<size_t>(len)}, vnoq, strlen(vnoq));
}

char *getNextArrVal(char *line) {
    char *comma = line == nullptr ? nullptr : strchr(line, ',');
    if (comma == nullptr)
        return nullptr;
    *comma = '\0';
    return comma + 1;
}
