/* cdgen_attr.h: from the attribute line parser to the value handlers. */
#ifndef CDGEN_CDGEN_ATTR_H
#define CDGEN_CDGEN_ATTR_H

#include "compiler/cdgen_context.h"

/* A checked attribute line. */
struct attr_line {
    cdgen &cx;
    const srtable_ctrl &scp; /* the stanza's kind */
    stanza_state &state;
    char *record; /* the kind's staging record */
    const table_attrs &attr;
    char *value; /* not empty; may be taken apart */
    size_t length = strlen(value);
};

/* Takes one attribute line of a stanza of that kind, which fills that staging record. */
void save_attr_line(cdgen &cx, const attr_text &text, const srtable_ctrl &scp, stanza_state &state, char *record);

/* Converts the value and stores it, by the attribute's type. */
void store_value(const attr_line &line);

#endif
