/* findings.h: findings as text and as JSON. */
#ifndef CDGEN_CDEF_VERIFY_FINDINGS_H
#define CDGEN_CDEF_VERIFY_FINDINGS_H

#include "reader/diagnosis.h"
#include "report/json_writer.h"

#include <string>
#include <vector>

namespace cdef::verify {

/* "section 2, rsrc_pattr_t 5, u_ra_name", or the part of it that is known. */
std::string place_of(const cdb::finding &f);

/* "section 2, rsrc_pattr_t 5, u_ra_name at offset 8: wrong reference: found 5, expected 8" */
std::string sentence_of(const cdb::finding &f);

/* "1 finding follows from this one", or "5 findings follow from this one". */
std::string count_of(std::size_t consequences);

/* How many of the findings after a cause are its consequences. */
std::size_t consequences_of(const std::vector<cdb::diagnosed> &all, std::size_t cause);

/* One line, as compilers write them, with a newline. file: its name, with any bytes. */
std::string line_of(const std::string &file, const cdb::finding &f);

/* What was found or expected, as JSON: a number, even if the text shows it in hexadecimal, or a string. */
std::string json_value(const std::string &shown);

/* The findings without warnings. A finding that only a warning explains becomes a cause. */
std::vector<cdb::diagnosed> errors_of(std::vector<cdb::diagnosed> &&all);

/* One line that says how many findings follow from the one before it, with a newline. */
std::string note_of(const std::string &file, std::size_t consequences);

/* One line that says why causes were not looked for, with a newline. */
std::string note_of_many(const std::string &file, std::size_t count);

/* Adds a finding to a list. at: its position there. */
void add_finding(report::json_writer &to, const cdb::diagnosed &each, std::size_t at);

} // namespace cdef::verify

#endif
