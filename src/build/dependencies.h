/* dependencies.h: which databases depend on which files, in Make's syntax. Ninja reads it, too. */
#ifndef CDGEN_BUILD_DEPENDENCIES_H
#define CDGEN_BUILD_DEPENDENCIES_H

#include "build/plan.h"
#include "check/check.h"

#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace build {

/* A file's name as it is written in a rule. Throws wrong_request for a name that cannot be written in any rule.
 * Characters that Make and Ninja read differently are not escaped: Make cannot read = and %, but Ninja can. */
std::string rule_name(std::string_view path);

/* A rule for each unit. */
std::string dependencies_of(std::span<const unit> units);

/* Where a name is in a rule. */
enum class rule_side { target, prerequisite };

/* The program that reads a name in a rule differently, "Make" or "Ninja"; empty: both read it as it is. */
std::string_view misreader_of(std::string_view path, rule_side side);

/* The warning about the first name in a unit's rule that Make or Ninja reads differently. */
std::optional<check::finding> misread_name_in(const unit &what);

} // namespace build

#endif
