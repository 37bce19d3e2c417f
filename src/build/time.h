/* time.h: determines the time in databases. */
#ifndef CDGEN_BUILD_TIME_H
#define CDGEN_BUILD_TIME_H

#include "cdb.h"

#include <optional>
#include <stdexcept>
#include <string>

namespace build {

/* The request is invalid. The text is for the user. */
struct wrong_request : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/* The option and the environment variables for the time. */
struct time_wishes {
    std::optional<std::string> option = {};      /* "none", "now" or seconds since 1970 */
    std::optional<std::string> environment = {}; /* SOURCE_DATE_EPOCH; used if there is no option */
    bool forced_empty = false;                   /* VX_CDB_FORCE_EMPTY_TIMESTAMP exists; overrides everything */
};

/* The time to write into a database; 0 stands for none. Throws wrong_request, also if the option has no effect. */
orb_timeval32_t time_of(const time_wishes &wishes, orb_timeval32_t now);

} // namespace build

#endif
