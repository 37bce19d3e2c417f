/* toml.h: the parser of TOML, configured so that no file can end the program. */
#ifndef CDGEN_CONFIG_TOML_H
#define CDGEN_CONFIG_TOML_H

#include <exception>

namespace config {

/* An assertion of the parser failed. Some invalid files cause this, such as "[=". */
struct broken_assumption : std::exception {};

[[noreturn]] inline void give_up() {
    throw broken_assumption();
}

} // namespace config

/* With NDEBUG, the compiler would take the assumptions for facts. */
#undef NDEBUG
#define TOML_ASSERT(expression) ((expression) ? static_cast<void>(0) : config::give_up())
#define TOML_HEADER_ONLY 1
#include <toml++/toml.h> // IWYU pragma: export

#endif
