/* source.cpp: the subcommand that writes a source from a database. */

#include "cdef/cdef.h"
#include "cdef/source/compose.h"
#include "cdef/source/error.h"
#include "cdef/support/command.h"
#include "cdef/support/failure.h"
#include "cdef/support/input.h"
#include "cdef/support/output.h"
#include "text/shown.h"

#include <memory>
#include <unistd.h>

namespace cdef {

namespace {

/* A source contains texts unchanged. A terminal would act on some of their characters. */
bool is_harmless(std::string_view text) {
    while (!text.empty()) {
        bool is_blank = text.front() == '\n' || text.front() == '\t';
        std::size_t length = is_blank ? 1 : text::printable_length(text);
        if (length == 0)
            return false;
        text.remove_prefix(length);
    }
    return true;
}

void require_harmless(std::string_view text, const std::string &path) {
    if (!is_harmless(text))
        throw failure(path + ": the source contains characters that could control a terminal: write it to a file");
}

int run(const std::string &path) {
    input in(path);
    cdb::ownership owners = require_readable_aloud(in).owners;
    try {
        source::proven_source proven(in.db, owners);
        if (isatty(STDOUT_FILENO) != 0)
            proven.compose([&](std::string_view part) { require_harmless(part, path); });
        proven.compose(print);
    } catch (const source::no_source_error &e) {
        throw failure(path + ": " + e.what());
    }
    return OK;
}

} // namespace

void add_source(program &app) {
    auto path = std::make_shared<std::string>();
    command made = app.add("source", "Writes a source that compiles to a database with the same meaning",
                           [path] { return run(*path); });
    made.add("FILE", *path, "Database to turn into a source; - is standard input").required();
}

} // namespace cdef
