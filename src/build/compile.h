/* compile.h: compiles a source in the pass that checks it. */
#ifndef CDGEN_BUILD_COMPILE_H
#define CDGEN_BUILD_COMPILE_H

#include "build/across.h"
#include "build/plan.h"
#include "check/check.h"

#include <cstddef>
#include <vector>

namespace build {

struct compiled {
    check::totals count;
    /* The database for each output of the unit, in their order; empty if there are errors. */
    std::vector<std::vector<std::byte>> images;
    class_facts facts; /* none if there are errors */
};

/* Passes the findings to `to`, as check_file does. Throws check::cannot_check. Writes no file. */
compiled compile(const unit &what, orb_timeval32_t time, const check::warning_set &wanted, const check::sink &to);

} // namespace build

#endif
