/* cdgen_attr.h: from the attribute line parser to the value handlers. */
#ifndef CDGEN_CDGEN_ATTR_H
#define CDGEN_CDGEN_ATTR_H

#include "cdgen.h"

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

/* What save_attr does, for a line that is known to end, with a NUL, at end. */
void save_attr_line(cdgen &cx, char *il, char *end, int table_id);

/* Converts the value and stores it, by the attribute's type. */
void store_value(const attr_line &line);

#endif
