/* switches.cpp: warnings that people turn on and off by their names. */

#include "check/switches.h"

namespace check {

void switch_warnings(warning_set &set, const std::vector<std::string> &names, bool on) {
    for (const std::string &name : names)
        for (const warning &known : warnings)
            if (name == "all" || name == known.name || name == known.code)
                set[known.id] = on;
}

} // namespace check
