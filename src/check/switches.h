/* switches.h: warnings that people turn on and off by their names. */
#ifndef CDGEN_CHECK_SWITCHES_H
#define CDGEN_CHECK_SWITCHES_H

#include "check/check.h"

#include <string>
#include <vector>

namespace check {

/* Turns warnings on or off, which are given by name or code, or as "all". Unknown names have no effect. */
void switch_warnings(warning_set &set, const std::vector<std::string> &names, bool on);

} // namespace check

#endif
