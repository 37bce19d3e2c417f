/* compare.h: how two databases differ in meaning, and for whom a difference matters. The places of records in the file,
 * its byte order, and the time when it was made are ignored. */
#ifndef CDGEN_COMPARE_COMPARE_H
#define CDGEN_COMPARE_COMPARE_H

#include "compare/judge.h"

#include <functional>

namespace compare {

enum class change : std::uint8_t {
    REMOVED,
    ADDED,
    RENAMED, /* an attribute or action has kept its number and type, but has another name */
    CHANGED
};

/* A difference refers to temporary data of the comparison, so copy what is needed of it. */
struct difference {
    change what;
    std::span<const node *const> path; /* from the database to the node that differs, with the names in the newer
                                        * database; for a removed or renamed node, with the name in the older one */
    const node *renamed_to = nullptr;  /* RENAMED only */
    const fact *before = nullptr;      /* CHANGED only */
    const fact *after = nullptr;       /* CHANGED only */
    breaches broken = {};
};

using taker = std::function<void(const difference &)>;

/* Passes on each difference when it is found, in the order of the older database. The new parts of a record come after
 * the others. Takes time proportional to the size of the databases, and memory only where parts have moved. An
 * exception of the receiver ends the comparison. */
void compare(const origin &before, const origin &after, const taker &take);

} // namespace compare

#endif
