/* build.h: one run of the subcommand that builds databases from sources. */
#ifndef CDGEN_CDEF_BUILD_BUILD_H
#define CDGEN_CDEF_BUILD_BUILD_H

#include "build/across.h"
#include "build/plan.h"
#include "cdef/build/progress.h"
#include "cdef/support/finding_options.h"

#include <memory>
#include <string>
#include <vector>

namespace cdef::build_command {

constexpr unsigned MOST_JOBS = 1024;

struct run_options {
    orb_timeval32_t time;
    const finding_options &findings;
    std::vector<finding_rules> rules; /* for each unit */
    bool sync;
    bool with_depfile; /* true: names that its readers take for others are reported */
};

/* The result for one source. */
struct outcome {
    std::vector<check::finding> findings;
    check::totals count;
    build::class_facts facts;
    std::string unreadable;             /* why the source could not be read; empty if it could */
    std::vector<std::string> unwritten; /* why databases could not be written */
    size_t written = 0;                 /* databases */
    size_t unchanged = 0;
};

class build_run {
public:
    build_run(const std::vector<build::unit> &units, run_options options);

    /* Compiles a source and writes its databases; several threads may do so at once. */
    outcome make(size_t index) const;
    /* Shows the findings in a source. Must be called in order, by one thread. */
    void show(size_t index, outcome &&made);
    /* Shows a summary of many sources. Returns the exit status. */
    int finish();

private:
    void make_databases(size_t index, outcome &made) const;

    const std::vector<build::unit> &units;
    run_options options;
    build::class_family family;
    std::unique_ptr<report::writer> writer;
    progress line;
    size_t databases = 0, written = 0, unchanged = 0;
    bool all_pass = true; /* true: no source has errors */
    bool no_fault = true; /* true: all files could be read and written */
};

} // namespace cdef::build_command

#endif
