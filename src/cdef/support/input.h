/* input.h: the database that a subcommand is given. */
#ifndef CDGEN_CDEF_INPUT_H
#define CDGEN_CDEF_INPUT_H

#include "cdb_view.h"
#include "reader/ownership.h"

#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace cdef {

/* A database read from a file; "-" is standard input. */
struct input {
    /* Throws failure when it cannot be read. */
    explicit input(const std::string &path);
    /* A database that has been read. file: its name, for messages. */
    input(std::string file, std::vector<std::byte> read);
    input(const input &) = delete;
    input &operator=(const input &) = delete;

    std::string name; /* for messages */
    std::vector<std::byte> contents;
    cdb::database db;
};

/* True if a file is a text and not a database, even a damaged one: it has no format word, and no byte of its beginning
 * is zero. */
bool is_text(const std::vector<std::byte> &contents);

/* True if a file has the format word of a database. False for files without positions, such as pipes, from which
 * nothing is read. "-" is standard input. */
bool is_database(const std::string &path);

/* Throws failure for a text, and names the subcommand that checks it. */
void require_database(const input &in);

/* The result of verifying a readable database. */
struct readability {
    cdb::ownership owners;
    std::vector<cdb::finding> errors; /* the first finding of each rule that it breaks nevertheless */

    std::optional<cdb::finding> first_of(std::string_view code) const;
};

/* Throws failure for a text, and if the records and values of the database are not reliable. Only a wrong checksum and
 * padding that is not zero are accepted. */
readability require_readable(const input &in);

/* The same, and reports on standard error which of these two errors it has, each once. For subcommands whose output
 * does not show them. */
readability require_readable_aloud(const input &in);

} // namespace cdef

#endif
