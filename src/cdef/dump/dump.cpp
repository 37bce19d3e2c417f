/* dump.cpp: the subcommand that shows what is in a database. */

#include "cdef/dump/dump.h"
#include "cdef/cdef.h"
#include "cdef/support/command.h"
#include "cdef/support/failure.h"
#include "cdef/support/forms.h"
#include "cdef/support/output.h"

#include <memory>
#include <unistd.h>

namespace cdef {

namespace {

struct dump_options {
    std::string file;
    std::string form;
    std::string colour;
    bool with_offsets = false;
};

void run(const dump_options &options) {
    if (options.form == "hex" && options.with_offsets)
        throw failure("--offsets is not for the form hex, which shows all offsets");
    input in(options.file);
    if (options.form == "hex")
        return dump::show_hex(in);
    readability found = require_readable(in);
    if (options.form == "json")
        dump::show_json(in, found, options.with_offsets);
    else
        dump::show_listing(in, found, options.with_offsets, wants_colour(options.colour, STDOUT_FILENO));
}

} // namespace

void add_dump(program &app) {
    auto options = std::make_shared<dump_options>();
    command made = app.add("dump", "Shows what is in a database", [options] {
        run(*options);
        return OK;
    });
    made.add("FILE", options->file, "Database to show; - is standard input").required();
    add_forms(made, options->form, {"text", "json", "hex"},
              "Form of the output; hex shows every byte and its meaning, even of a damaged file");
    add_colour(made, options->colour);
    made.add_flag("--offsets", options->with_offsets, "Also show the offset of each record and list");
}

} // namespace cdef
