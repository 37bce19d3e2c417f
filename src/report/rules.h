/* rules.h: what each code means, for errors and for warnings. */
#ifndef CDGEN_REPORT_RULES_H
#define CDGEN_REPORT_RULES_H

#include <string>
#include <string_view>
#include <vector>

namespace report {

struct rule {
    std::string_view code;
    std::string_view name; /* of a warning; empty for an error */
    std::string_view title;
    std::string_view cause;
    std::string help; /* the cause and the cure; `names of the language` are in backquotes */
    bool error;
};

/* The errors, then the warnings. */
const std::vector<rule> &all_rules();

/* The help text that is made from a cause and a cure. */
std::string help_of(std::string_view cause, std::string_view cure);

} // namespace report

#endif
