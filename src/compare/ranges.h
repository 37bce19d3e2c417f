/* ranges.h: sets of numbers that are given as ranges. */
#ifndef CDGEN_COMPARE_RANGES_H
#define CDGEN_COMPARE_RANGES_H

#include "compare/node.h"

#include <vector>

namespace compare {

/* Numbers of one type in the order of their values. */
using ordinal = std::uint64_t;

/* Nothing for a value that is not a number in its cell, and for a NaN. */
std::optional<ordinal> ordinal_of(const cdb::value &value);

struct range {
    ordinal low;
    ordinal high;
};

/* The numbers that are in any of some ranges. */
class range_set {
public:
    /* Whole numbers have no others between them, so that 1 to 4 and 5 to 9 are 1 to 9. */
    range_set(std::vector<range> ranges, bool are_whole_numbers);

    /* Whether it has all numbers of a range. */
    bool has(const range &r) const;

private:
    std::vector<range> merged; /* sorted, apart from each other */
};

} // namespace compare

#endif
