/* cdgen_read.h: what a line does to the stanzas. */
#ifndef CDGEN_CDGEN_READ_H
#define CDGEN_CDGEN_READ_H

#include "compiler/cdgen_attr.h"

/* A header, if it has no blank in front, or an attribute line, which is taken apart. */
void take_line(cdgen &cx, const attr_text &text);

#endif
