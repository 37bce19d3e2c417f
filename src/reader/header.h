/* header.h: what verification checks of the file as a whole. */
#ifndef CDGEN_READER_HEADER_H
#define CDGEN_READER_HEADER_H

#include "reader/report.h"

namespace cdb {

/* How findings that are about the file as a whole name their place. */
inline const location whole_file = {.section = std::nullopt, .record = "orb_cdb_header_t"};

/* Checks length, format word, checksum and record sizes. False if there is nothing to walk: the file is too short for a
 * header, or has no format word. */
bool check_header(reporter &out, const database &db);

/* The checksum that a file should have, as its bytes are stored. At least a header. */
std::uint32_t sum_of(const database &db);

/* Checks the largest IDs that the header holds. */
void check_largest_ids(reporter &out, const database &db);

} // namespace cdb

#endif
