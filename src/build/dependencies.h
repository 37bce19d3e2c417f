/* dependencies.h: which databases depend on which files, in Make's syntax. Ninja reads it, too. */
#ifndef CDGEN_BUILD_DEPENDENCIES_H
#define CDGEN_BUILD_DEPENDENCIES_H

#include "build/plan.h"

#include <span>
#include <string>
#include <string_view>

namespace build {

/* A file's name as it is written in a rule. Throws wrong_request for a name that cannot be written in any rule.
 * Characters that Make and Ninja read differently are not escaped: Make cannot read = and %, but Ninja can. */
std::string rule_name(std::string_view path);

/* A rule for each unit. */
std::string dependencies_of(std::span<const unit> units);

} // namespace build

#endif
