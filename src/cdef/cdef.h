/* cdef.h: the program cdef and its subcommands. Each subcommand is a folder and does not know the others. */
#ifndef CDGEN_CDEF_H
#define CDGEN_CDEF_H

namespace cdef {

class program;

/* Each adds its subcommand to the program. */
void add_verify(program &to);
void add_source(program &to);
void add_diff(program &to);
void add_dump(program &to);
void add_build(program &to);
void add_check(program &to);
void add_format(program &to);
void add_gate(program &to);
void add_new(program &to);
void add_explain(program &to);
void add_lsp(program &to);

/* The program; returns its exit status. */
int cdef_main(int argc, char **argv);

} // namespace cdef

#endif
