/* failure.h: how a subcommand fails, and its exit status. */
#ifndef CDGEN_CDEF_FAILURE_H
#define CDGEN_CDEF_FAILURE_H

#include "cdef/support/status.h"

#include <stdexcept>
#include <string>

namespace cdef {

/* Ends a subcommand. The program reports it and returns FAILED. */
struct failure : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/* Prints "cdef: " and the message to standard error. A subcommand for many files reports one that it cannot read,
 * continues with the others, and returns FAILED. */
void print_error(const std::string &message);

} // namespace cdef

#endif
