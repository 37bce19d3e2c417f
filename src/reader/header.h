/* header.h: checks the file as a whole. */
#ifndef CDGEN_READER_HEADER_H
#define CDGEN_READER_HEADER_H

#include "reader/report.h"

namespace cdb {

/* The place that findings about the file as a whole name. */
inline const location whole_file = {.section = std::nullopt, .record = "orb_cdb_header_t"};

/* Checks length, format word, checksum and record sizes. Returns false if the rest of the file cannot be checked,
 * because it is too short for a header or has no format word. */
bool check_header(reporter &out, const database &db);

/* The checksum that a file should have, in the file's byte order. The file must have at least a header. */
std::uint32_t sum_of(const database &db);

/* Checks the largest IDs that the header holds. */
void check_largest_ids(reporter &out, const database &db);

} // namespace cdb

#endif
