/* proof.h: proves that a source gives the database that it was made from. */
#ifndef CDGEN_CDEF_SOURCE_PROOF_H
#define CDGEN_CDEF_SOURCE_PROOF_H

#include "reader/ownership.h"

#include <string>
#include <string_view>

namespace cdef::source {

/* Compiles the source in memory and compares the result with the database. Throws no_source_error if it does not
 * compile, or if the result has another meaning. output: the name of the output file, after which a class without a
 * Name is named. */
void require_equal(std::string_view text, const std::string &output, const cdb::database &db,
                   const cdb::ownership &owners);

} // namespace cdef::source

#endif
