/* given_interface.h: functions of the fixed interface that nothing in the program calls. */
#ifndef CDGEN_GIVEN_INTERFACE_H
#define CDGEN_GIVEN_INTERFACE_H

#include "compiler/cdgen_context.h"
#include "format/names.h"

/* Copies len bytes and zeroes on to the next multiple of 8, for which dst must have room. Part of the fixed interface;
 * nothing calls it. */
void memcpy_8_rounded(char *dst, const char *src, int len);

/* Appends an empty structured value of an SD type to a table of default values. Part of the fixed interface; nothing
 * calls it. */
vx_uint32_t mk_sd_data_tbl(cdgen &cx, vx_data_type_t sd_type, tbl *dflt_tp);

/* Removes a variable class's list of variable IDs from the pairs. Part of the fixed interface; nothing calls it. */
void del_tbl_entry(cdgen &cx, const rsrc_variable_class_t *rvcp);

/* Non-null when the kind's name says that it defines structured data. Part of the fixed interface; nothing calls it:
 * the catalogue has the owner of each kind's structured data. */
const char *is_SD_stanza(int table_id);

/* Non-null when the kind's name says that it defines structured data of an attribute. Part of the fixed interface;
 * nothing calls it: sd_owner::is_attribute() answers. */
const char *is_attr_SD(int table_id);

/* The owner of the kind's structured data. Part of the fixed interface; nothing calls it. */
sd_type_t SD_stanza_type(int table_id);

/* The table for the elements of the kind's stanzas; null if it has none. Part of the fixed interface; nothing calls it.
 */
tbl *sc_sd_tbl(cdgen &cx, const srtable_ctrl &kind);

/* The result of data_type_named for a name; VX_UNKNOWN for null. Part of the fixed interface; nothing calls it. */
vx_data_type_t strToVxDt(const char *s);

/* Returns 0 and the result of variable_type_named for a name, or returns 1 and leaves *t alone. Part of the fixed
 * interface; nothing calls it. */
int strToVar(const char *s, orb_variable_type_t *t);

/* Takes one attribute line, il, without comment and newline, which is modified in place. Part of the fixed interface;
 * nothing calls it. */
void save_attr(cdgen &cx, char *il, int table_id);

/* The text inside a pair of double quotes, as the other strip_quotes finds it; null for null. Part of the fixed
 * interface; nothing calls it. */
char *strip_quotes(char *s);

/* The other set_props, which is given the length of the list. Part of the fixed interface; nothing calls it. */
void set_props(vx_uint32_t *dest, const props_t *props, int len, char *vnoq);

/* Ends the text at its first comma and returns what follows; null without a comma. Part of the fixed interface; nothing
 * calls it. */
char *getNextArrVal(char *line);

#endif
