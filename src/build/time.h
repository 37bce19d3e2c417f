/* time.h: which time a database gets. */
#ifndef CDGEN_BUILD_TIME_H
#define CDGEN_BUILD_TIME_H

#include "cdb.h"

#include <optional>
#include <stdexcept>
#include <string>

namespace build {

/* What was asked for makes no sense. The text is for the user. */
struct wrong_request : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/* What people and build systems say about the time. */
struct time_wishes {
    std::optional<std::string> option = {};      /* "none", "now" or seconds since 1970 */
    std::optional<std::string> environment = {}; /* SOURCE_DATE_EPOCH; counts without an option */
    bool forced_empty = false;                   /* VX_CDB_FORCE_EMPTY_TIMESTAMP is there; counts before all */
};

/* The time to be written; 0 is none. Throws wrong_request. */
orb_timeval32_t time_of(const time_wishes &wishes, orb_timeval32_t now);

} // namespace build

#endif
