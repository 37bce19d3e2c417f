/* cdef.h: the program cdef and its subcommands. Each subcommand is a folder and does not know the others. */
#ifndef CDGEN_CDEF_H
#define CDGEN_CDEF_H

namespace CLI {
class App;
}

namespace cdef {

/* Each adds its subcommand to the program. When it runs, it sets status. */
void add_verify(CLI::App &app, int &status);
void add_source(CLI::App &app, int &status);
void add_diff(CLI::App &app, int &status);
void add_dump(CLI::App &app, int &status);
void add_build(CLI::App &app, int &status);
void add_check(CLI::App &app, int &status);
void add_format(CLI::App &app, int &status);
void add_gate(CLI::App &app, int &status);
void add_new(CLI::App &app, int &status);
void add_explain(CLI::App &app, int &status);
void add_lsp(CLI::App &app, int &status);

/* The program; returns its exit status. */
int cdef_main(int argc, char **argv);

} // namespace cdef

#endif
