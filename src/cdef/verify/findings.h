/* findings.h: findings as text and as JSON. */
#ifndef CDGEN_CDEF_VERIFY_FINDINGS_H
#define CDGEN_CDEF_VERIFY_FINDINGS_H

#include "cdb_view.h"

#include <nlohmann/json_fwd.hpp>

#include <string>

namespace cdef::verify {

/* "section 2, rsrc_pattr_t 5, u_ra_name": as much of it as is known. */
std::string place_of(const cdb::finding &f);

/* One line, as compilers write them, with a newline. file: its name, with any bytes. */
std::string line_of(const std::string &file, const cdb::finding &f);

nlohmann::ordered_json json_of(const cdb::finding &f);

} // namespace cdef::verify

#endif
