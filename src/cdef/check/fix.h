/* fix.h: cdef check --fix: makes the corrections that are certain. */
#ifndef CDGEN_CDEF_CHECK_FIX_H
#define CDGEN_CDEF_CHECK_FIX_H

#include "check/check.h"

#include <string>

namespace cdef {

/* Corrects a source: a file is replaced, standard input ("-") is written to standard output. With dry_run nothing is
 * replaced; a diff is written to standard output. Reports on standard error how much was corrected. Returns the text
 * that the source has now. Throws check::cannot_check if it cannot be read or replaced. */
std::string fix_source(const std::string &source, const check::warning_set &wanted, bool dry_run);

} // namespace cdef

#endif
