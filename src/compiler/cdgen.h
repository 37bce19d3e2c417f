/* cdgen.h: the compiler. Data goes one way: source line -> attribute -> staging record -> staging table -> image. */
#ifndef CDGEN_CDGEN_H
#define CDGEN_CDGEN_H

#include "compiler/cdgen_context.h"
#include "compiler/cdgen_kinds.h"
#include "compiler/cdgen_values.h"

/* Runs the whole program on a command line, in a context of its own; returns the exit status. */
int cdgen_main(int argc, char **argv);

/* Compiles the options' cdefsrc into their cdefname; throws fatal_exit. */
void compile(cdgen &cx);

/* Reads and takes all lines of a source, which it closes. */
void cache_input_data(cdgen &cx, const char *filename);

#endif
