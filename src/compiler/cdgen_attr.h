/* cdgen_attr.h: from the attribute line parser to the value handlers. */
#ifndef CDGEN_CDGEN_ATTR_H
#define CDGEN_CDGEN_ATTR_H

#include "compiler/cdgen_context.h"

/* A checked attribute line of the current stanza. */
struct attr_line {
    cdgen &cx;
    const table_attrs &attr;
    char *value; /* not empty; may be taken apart; has a NUL at its end only where its handler wants one */
    size_t length;
};

/* Takes one attribute line of the current stanza. These are the parts of an attr_text, which would not be passed in
 * registers as a whole; to read it from memory where it has just been written takes long. */
void save_attr_line(cdgen &cx, char *line, char *name, char *end);

/* Converts the value of a line and stores it, by the attribute's type. */
void store_value(const attr_line &line);

#endif
