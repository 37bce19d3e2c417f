/* owners.h: the ownership in a database, for callers that need no findings. */
#ifndef CDGEN_READER_OWNERS_H
#define CDGEN_READER_OWNERS_H

#include "reader/ownership.h"

namespace cdb {

/* Verifies the database, which need not be sound. */
ownership owners_in(const database &db);

} // namespace cdb

#endif
