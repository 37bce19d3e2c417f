/* identity.h: what identifies records and entries. */
#ifndef CDGEN_COMPARE_IDENTITY_H
#define CDGEN_COMPARE_IDENTITY_H

#include "compare/node.h"

namespace compare {

/* The key by which parts of one family are paired: their kind, and a name, numbers or values. */
struct identity {
    node_kind kind;
    std::uint64_t number = 0;   /* of an entry that has no name */
    std::string_view name = {}; /* of a record */
    look low = {};              /* of valid values */
    look high = {};
};

identity identity_of(const node &n);

/* An order in which parts with the same key are equal. */
std::strong_ordering order_of(const identity &a, const identity &b);

std::size_t hash_of(const identity &i);

/* One of the two values of an entry in a list of valid values. cell: its offset in the entry. */
owned_value valid_value_in(const node &n, std::size_t cell);

} // namespace compare

#endif
