/* findings.h: what has been found so far. */
#ifndef CDGEN_CHECK_FINDINGS_H
#define CDGEN_CHECK_FINDINGS_H

#include "check/check.h"
#include "language/messages.h"

#include <array>
#include <string>
#include <string_view>
#include <vector>

namespace check {

class findings {
public:
    /* The finding is to be completed before the next one is added. */
    finding &error(const message &known, const place &at, std::string_view source, std::string text);
    finding &warn(const warning &known, const place &at, std::string_view source, std::string text, note more);
    /* Takes back the warnings of a line, which an error now explains. */
    void retract(warning_id id, int line);

    size_t errors() const {
        return count.errors;
    }

    /* Gives all findings away, in their order, and says how many there were. */
    totals hand_over(const sink &to);

private:
    struct entry {
        finding found;
        bool retracted = false;
    };

    std::vector<entry> entries;                                /* in the order in which they were met */
    std::array<std::vector<size_t>, WARNING_COUNT> of_warning; /* positions in entries; lines ascend */
    totals count;
};

} // namespace check

#endif
