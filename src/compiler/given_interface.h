/* given_interface.h: functions that are laid down and that nothing in the program calls. */
#ifndef CDGEN_GIVEN_INTERFACE_H
#define CDGEN_GIVEN_INTERFACE_H

#include "compiler/cdgen_context.h"

/* Copies len bytes and zeroes on to the next multiple of 8, for which dst must have room. */
void memcpy_8_rounded(char *dst, const char *src, int len);

/* An empty structured value in a table of default values, for an SD type. */
vx_uint32_t mk_sd_data_tbl(cdgen &cx, vx_data_type_t sd_type, tbl *dflt_tp);

/* Takes a variable class's list of variable IDs out of the pairs. */
void del_tbl_entry(cdgen &cx, const rsrc_variable_class_t *rvcp);

/* Non-null when the kind's name says that it defines structured data. */
const char *is_SD_stanza(int table_id);

/* What the kind's structured data belong to. */
sd_type_t SD_stanza_type(int table_id);

/* The table for the elements of the kind's stanzas; null if it has none. */
tbl *sc_sd_tbl(cdgen &cx, const srtable_ctrl &kind);

/* Takes one attribute line, il, without comment and newline, apart in place. */
void save_attr(cdgen &cx, char *il, int table_id);

#endif
