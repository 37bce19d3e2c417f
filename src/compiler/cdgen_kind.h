/* cdgen_kind.h: the steps that the stanza kinds' completions share. */
#ifndef CDGEN_CDGEN_KIND_H
#define CDGEN_CDGEN_KIND_H

#include "compiler/cdgen_context.h"
#include "compiler/cdgen_kinds.h"
#include "format/constants.h"
#include "language/catalogue_rows.h"

/* Makes a reference "none" in a staged record. */
inline void mark_absent(cdb_ref_t &ref) {
    ref = {{CDB_NONE, 0}};
}

inline bool was_given(const stanza_state &state, vx_uint32_t bit) {
    return (state.opt_mask & bit) == bit;
}

inline void require_class(cdgen &cx, message_id message) {
    if (cx.staged.cb_rsrc_class.rc_cb_ID == 0)
        source_error(cx, message);
}

inline void require_complete(cdgen &cx, stanza_id id) {
    if (cx.framing.stanzas[id].req_mask != sc_tables[id].req_mask_cmplt)
        source_error(cx, MSG_INCOMPLETE_STANZA);
}

/* Appends a copy of a staging record to a table of such records. */
template <class Record> Record *append_record(cdgen &cx, tbl *t, const Record &record) {
    return static_cast<Record *>(memcpy(alloc_tble(cx, t, sizeof record), &record, sizeof record));
}

/* Steps that persistent and dynamic attributes have in common. */
template <class Attribute> void settle_valid_vals(Attribute &attr, vx_uint16_t &found) {
    if (!found)
        mark_absent(attr.u_ra_valid_vals);
    found = 0;
}

template <class Attribute> void settle_group(Attribute &attr, const stanza_state &state) {
    if (!was_given(state, language::bit_of("GroupID")))
        attr.ra_group_id = NO_GROUP;
    if (!was_given(state, language::bit_of("GroupName")))
        attr.ra_group_msgid = 0;
}

/* Called before a dynamic resource attribute is filed. It may have the range of a class attribute of another type, and
 * so a number where it would refer to a value. */
void note_stray_range(cdgen &cx, const rsrc_dattr_t &attr, cdb_ref_t rsrc_class_t::*records);

inline bool has_values(const dflt_tbl &dflt) {
    return dflt.tbl != nullptr && dflt.num_elems > 0;
}

#endif
