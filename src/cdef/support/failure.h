/* failure.h: how a subcommand fails, and what its exit status says. */
#ifndef CDGEN_CDEF_FAILURE_H
#define CDGEN_CDEF_FAILURE_H

#include <stdexcept>
#include <string>

namespace cdef {

/* Exit statuses. Each subcommand says what 0 and 1 mean; FAILED is the same for all: a file cannot be read or written,
 * it makes no sense, or the program was called wrongly. */
constexpr int OK = 0;
constexpr int FOUND = 1;
constexpr int FAILED = 2;

/* Ends a subcommand. The program reports it and returns FAILED. */
struct failure : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/* Prints "cdef: " and the message to standard error. A subcommand for many files reports one that it cannot read,
 * continues with the others, and returns FAILED. */
void print_error(const std::string &message);

} // namespace cdef

#endif
