/* cdef.h: what the inspector's subcommands share. Each one is a file, cdef_<name>.cpp; it knows the reader and nothing
 * of the compiler; but for cdef_check*, which drives the compiler over sources. */
#ifndef CDGEN_CDEF_H
#define CDGEN_CDEF_H

#include "cdb_view.h"

#include <nlohmann/json_fwd.hpp>

#include <stdexcept>
#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace cdef {

/* Exit statuses. What 0 and 1 stand for, each subcommand says; trouble is the same for all: cannot read, cannot write,
 * not to be made sense of, wrong usage. */
constexpr int OK = 0;
constexpr int FOUND = 1;
constexpr int TROUBLE = 2;

/* Ends a subcommand; the driver tells it and returns TROUBLE. */
struct trouble : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/* Prints "cdef: " and the text to standard error. A subcommand for many files tells of one that it cannot read, goes on
 * with the others, and returns TROUBLE. */
void tell(const std::string &trouble);

/* A database read from a file; "-" is standard input. */
struct input {
    /* Throws trouble when it cannot be read. */
    explicit input(const std::string &path);
    input(const input &) = delete;
    input &operator=(const input &) = delete;

    std::string name; /* for messages */
    std::vector<std::byte> contents;
    cdb::database db;
};

/* Throws trouble unless the database's records and values can be relied on: it has no errors but, at the most, a wrong
 * checksum or filling that is not zero. Returns what is wrong with it. */
std::vector<cdb::finding> require_readable(const input &in);

/* The same, and says on standard error which of the two errors it has, each once: for subcommands whose output does not
 * show it. */
void require_readable_aloud(const input &in);

/* Appends formatted text, as printf formats it. */
[[gnu::format(printf, 2, 3)]] void appendf(std::string &to, const char *format, ...);

/* Writes to standard output; throws trouble if that fails. */
void print(const std::string &text);

/* Indented, ASCII only, with a newline behind it. Bytes that are no UTF-8 (a file's name may have some) become U+FFFD.
 */
std::string json_text(const nlohmann::ordered_json &data);

/* Terminal colours: on if standard output is a terminal and NO_COLOR is not set (or empty). */
bool wants_colour();

/* Each adds its subcommand to the program. When it runs, it sets status. */
void add_verify(CLI::App &app, int &status);
void add_source(CLI::App &app, int &status);
void add_diff(CLI::App &app, int &status);
void add_dump(CLI::App &app, int &status);
void add_check(CLI::App &app, int &status);

/* The program; returns its exit status. */
int cdef_main(int argc, char **argv);

} // namespace cdef

#endif
