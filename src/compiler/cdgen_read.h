/* cdgen_read.h: takes lines as headers or attributes of stanzas. */
#ifndef CDGEN_CDGEN_READ_H
#define CDGEN_CDGEN_READ_H

#include "compiler/cdgen_attr.h"

/* Takes a header, if the line does not begin with a blank, or an attribute line. Writes a NUL at the text's end and may
 * modify it. */
void take_line(cdgen &cx, attr_text text);

#endif
