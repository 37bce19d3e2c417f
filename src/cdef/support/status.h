/* status.h: the meanings of the subcommands' exit statuses. docs/cdef.md has the same table. */
#ifndef CDGEN_CDEF_STATUS_H
#define CDGEN_CDEF_STATUS_H

#include <array>
#include <string>
#include <string_view>

namespace cdef {

constexpr int OK = 0;
constexpr int FOUND = 1;
constexpr int FAILED = 2;

struct meanings {
    std::string_view subcommand;
    std::string_view ok;
    std::string_view found; /* empty: the status does not occur */
    std::string_view failed;
};

/* FAILED also means a wrong command line, or output that cannot be written. */
inline constexpr std::array<meanings, 11> statuses = {{
    {"verify", "no errors", "errors, or warnings with --werror", "a file cannot be read, or is a text file"},
    {"dump", "the database is shown", "",
     "the file cannot be read or, without --hex, has errors other than a wrong checksum or reserved bytes"},
    {"diff", "no difference (with --compat: B can take the place of A)", "differences (with --compat: it cannot)",
     "a database cannot be read or has errors other than a wrong checksum or reserved bytes, or the output would be "
     "too large"},
    {"source", "the source is written", "", "the database cannot be read, or no source reproduces it"},
    {"check", "no errors", "errors, or warnings with --werror", "a source cannot be read, or is a database"},
    {"format", "done (with --check or --diff: nothing would change)", "with --check or --diff: a source would change",
     "a source cannot be read or written, or has errors"},
    {"build", "all databases are made or up to date",
     "errors, or warnings with --werror; the databases of the other sources are made",
     "a file cannot be read or written; the other databases are made"},
    {"gate", "nothing breaks", "something breaks, a source has errors, or with --werror there are warnings",
     "a file or an older version cannot be read"},
    {"new", "the source is written", "",
     "the source exists or cannot be written, or no source can give a class this name"},
    {"explain", "the codes are explained", "", "there is no such code"},
    {"lsp", "the client has sent shutdown and then exit",
     "the client has sent exit without shutdown, the client or standard input has ended, or the header of a message is "
     "wrong",
     "standard input cannot be read"},
}};

/* "Exit status: 0: ...; 1: ...; 2: ...", the end of a subcommand's help. */
inline std::string status_help(std::string_view subcommand) {
    std::string text;
    for (const meanings &row : statuses) {
        if (row.subcommand != subcommand)
            continue;
        text.append("Exit status: 0: ").append(row.ok);
        if (!row.found.empty())
            text.append("; 1: ").append(row.found);
        text.append("; 2: ").append(row.failed);
    }
    return text;
}

} // namespace cdef

#endif
