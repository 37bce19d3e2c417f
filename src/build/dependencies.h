/* dependencies.h: which databases depend on which files, in Make's syntax. Ninja reads it, too. */
#ifndef CDGEN_BUILD_DEPENDENCIES_H
#define CDGEN_BUILD_DEPENDENCIES_H

#include "build/plan.h"

#include <span>
#include <string>
#include <string_view>

namespace build {

/* A file's name as a rule has it. Throws wrong_request for one that no rule can have. What Make and Ninja read in
 * different ways stays as it is: Make cannot read = and %, which Ninja can. */
std::string rule_name(std::string_view path);

/* A rule for each unit. */
std::string dependencies_of(std::span<const unit> units);

} // namespace build

#endif
