/* judge.h: whether a class may replace an older version, as findings with places in its source. */
#ifndef CDGEN_GATE_JUDGE_H
#define CDGEN_GATE_JUDGE_H

#include "check/check.h"
#include "compare/compare.h"

#include <string_view>
#include <vector>

namespace gate {

/* Two versions of a database. */
struct versions {
    compare::origin before;
    compare::origin after;
    std::string_view source; /* that the newer one was compiled from; empty if it is not known */
};

/* Each difference that breaks rules of a level or of those before it, and the first rule that it breaks; notes have the
 * others. Throws compare::too_entangled. */
std::vector<check::finding> judge(const versions &of, compare::level up_to);

/* The finding that the newer version of a database no longer has a class. */
check::finding without_class(std::string_view name);

} // namespace gate

#endif
