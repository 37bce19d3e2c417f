/* owners.cpp: the ownership in a database, for callers that need no findings. */

#include "reader/owners.h"

namespace cdb {

ownership owners_in(const database &db) {
    std::vector<std::size_t> strays;
    verify(db, [&strays](finding &&f) {
        if (std::optional<std::size_t> stray = stray_of(f))
            strays.push_back(*stray);
    });
    return {db, std::move(strays)};
}

} // namespace cdb
