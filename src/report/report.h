/* report.h: findings in sources, as text, JSON and SARIF. */
#ifndef CDGEN_REPORT_REPORT_H
#define CDGEN_REPORT_REPORT_H

#include "check/check.h"

#include <span>
#include <string>
#include <vector>

namespace report {

/* What was found in one source. */
struct checked_source {
    std::string file;
    std::vector<check::finding> findings;
    check::totals count;
};

/* As compilers write it: a line for the finding and each note, and the line of the source with a mark. Nothing of a
 * source, or of its name, can steer a terminal. */
std::string as_text(const std::string &file, const check::finding &found);

/* A document for all sources. */
std::string as_json(std::span<const checked_source> checked);

/* The same as SARIF 2.1.0. */
std::string as_sarif(std::span<const checked_source> checked);

} // namespace report

#endif
