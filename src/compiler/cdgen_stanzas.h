/* cdgen_stanzas.h: where the compiler stages the stanzas of each kind. */
#ifndef CDGEN_CDGEN_STANZAS_H
#define CDGEN_CDGEN_STANZAS_H

#include "compiler/cdgen_context.h"

/* The kind's staging record. */
char *sc_cb(cdgen &cx, const srtable_ctrl &kind);

/* Makes the kind's latest stanza the current one. */
void make_current(cdgen &cx, const srtable_ctrl &kind);

/* The function that opens the kind's staging record, after completing it if it is open. */
void (*sc_init_tbl(const srtable_ctrl &kind))(cdgen &);

/* The tables for the kind's strings, varieties and valid values; null if it has none, or while the record
 * that owns them has not been opened. */
tbl *sc_str_tbl(cdgen &cx, const srtable_ctrl &kind);
tbl *sc_vty_tbl(cdgen &cx, const srtable_ctrl &kind);
tbl *sc_vv_tbl(cdgen &cx, const srtable_ctrl &kind);

/* For attribute kinds: whether the stanza already has its list of valid values. */
vx_uint16_t &vv_found(cdgen &cx, const srtable_ctrl &kind);

#endif
