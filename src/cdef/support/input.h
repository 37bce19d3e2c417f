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

/* Whether a file is a text rather than a database, however damaged: it has no format word, and no byte of its beginning
 * is zero. */
bool is_text(const std::vector<std::byte> &contents);

/* Whether a file has the format word of a database. False for what cannot be read at a place, such as a pipe: nothing
 * is taken from it. "-" is standard input. */
bool is_database(const std::string &path);

/* What verification says of a database that can be read. */
struct readability {
    cdb::ownership owners;
    std::vector<cdb::finding> errors; /* the first of each of the rules that it breaks all the same */

    std::optional<cdb::finding> first_of(std::string_view code) const;
};

/* Throws failure unless the database's records and values can be relied on: its only errors may be a wrong checksum
 * and filling that is not zero. */
readability require_readable(const input &in);

/* The same, and reports on standard error which of these two errors it has, each once: for subcommands whose output
 * does not show it. */
readability require_readable_aloud(const input &in);

} // namespace cdef

#endif
