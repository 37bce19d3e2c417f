/* cdef_direct.h: the functions that the subcommands of cdef call, without a command line and files, which take most of
 * the time for a small input. Each function fails if its results contradict each other. */
#ifndef CDGEN_FUZZ_CDEF_DIRECT_H
#define CDGEN_FUZZ_CDEF_DIRECT_H

#include <cstddef>
#include <string>
#include <vector>

namespace fuzz {

using bytes = std::vector<std::byte>;
using words = std::vector<std::string>;

/* Verifies a database, and shows it or writes its source, as the subcommand and its options say, if it can be read. */
void read_directly(const bytes &image, const words &form);

/* Compares two databases, if both can be read. */
void compare_directly(const bytes &before, const bytes &after);

/* Checks a source, and compiles it with the database in memory: the first error is the compiler's. output: the name
 * that the database would have. */
void check_directly(const bytes &source, const std::string &output, const words &form);

/* Compares two databases, if both can be read, and records the numbers of the first. */
void gate_directly(const bytes &before, const bytes &after);

/* Makes a first source of a class with this name, if a class can have it. */
void start_directly(const std::string &name);

} // namespace fuzz

#endif
