/* ranges.h: sets of numbers, given as ranges. */
#ifndef CDGEN_COMPARE_RANGES_H
#define CDGEN_COMPARE_RANGES_H

#include "compare/node.h"

#include <vector>

namespace compare {

/* Numbers of one type in the order of their values. */
using ordinal = std::uint64_t;

/* No value if the cell does not hold a number, and for a NaN. */
std::optional<ordinal> ordinal_of(const cdb::value &value);

struct range {
    ordinal low;
    ordinal high;
};

/* The union of several ranges of numbers. */
class range_set {
public:
    /* Adjacent ranges of whole numbers are joined: 1 to 4 and 5 to 9 are 1 to 9. */
    range_set(std::vector<range> ranges, bool are_whole_numbers);

    /* True if it contains all numbers of a range. */
    bool has(const range &r) const;

private:
    std::vector<range> merged; /* sorted, apart from each other */
};

} // namespace compare

#endif
