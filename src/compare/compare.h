/* compare.h: how two databases differ in meaning: nothing of where records are in the file, of its byte order, or of
 * when it was made; and for whom a difference matters. */
#ifndef CDGEN_COMPARE_COMPARE_H
#define CDGEN_COMPARE_COMPARE_H

#include "compare/judge.h"

#include <functional>

namespace compare {

enum class change : std::uint8_t {
    REMOVED,
    ADDED,
    RENAMED, /* an attribute or action has its number and type, but another name */
    CHANGED
};

/* It refers to what the comparison has in hand: take what is needed of it at once. */
struct difference {
    change what;
    std::span<const node *const> path; /* from the database to the node that differs, as it is named now; a node that is
                                          gone, or renamed, as it was named before */
    const node *renamed_to = nullptr;  /* RENAMED only */
    const fact *before = nullptr;      /* CHANGED only */
    const fact *after = nullptr;       /* CHANGED only */
    breaches broken = {};
};

using taker = std::function<void(const difference &)>;

/* Hands over each difference when it is found, in the order of the older database. Of each record, new parts come after
 * those that were there before. Takes time in proportion to the databases, and memory only where parts have changed
 * places. What the taker throws ends it. */
void compare(const origin &before, const origin &after, const taker &take);

} // namespace compare

#endif
