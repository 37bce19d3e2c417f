/* dump.cpp: the subcommand that shows what is in a database. */

#include "cdef/dump/dump.h"
#include "cdef/cdef.h"
#include "cdef/support/failure.h"

#include <CLI/CLI.hpp>

#include <memory>

namespace cdef {

namespace {

struct dump_options {
    std::string file;
    bool as_json = false;
    bool as_hex = false;
    bool with_offsets = false;
};

void run(const dump_options &options) {
    input in(options.file);
    if (options.as_hex)
        return dump::show_hex(in);
    readability found = require_readable(in);
    if (options.as_json)
        dump::show_json(in, found, options.with_offsets);
    else
        dump::show_listing(in, found, options.with_offsets);
}

} // namespace

void add_dump(CLI::App &app, int &status) {
    auto options = std::make_shared<dump_options>();
    CLI::App *command = app.add_subcommand("dump", "Shows what is in a database");
    command->add_option("FILE", options->file, "Database to show; - is standard input")->required();
    auto *json = command->add_flag("--json", options->as_json, "Write JSON");
    auto *hex = command->add_flag("--hex", options->as_hex, "Show every byte and what it is, even of a damaged file");
    command->add_flag("--offsets", options->with_offsets, "Also show the offset of each record and list")
        ->excludes(hex);
    json->excludes(hex);
    command->footer("Exit status: 0 if the database is shown, 2 if it cannot be shown.");
    command->callback([options, &status] {
        run(*options);
        status = OK;
    });
}

} // namespace cdef
