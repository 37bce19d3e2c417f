/* json.cpp: JSON as the subcommands print it. */

#include "cdef/cdef.h"

#include <nlohmann/json.hpp>

namespace cdef {

std::string json_text(const nlohmann::ordered_json &data) {
    constexpr int INDENT = 2;
    constexpr bool ASCII_ONLY = true; /* whatever a terminal would act upon is escaped */
    return data.dump(INDENT, ' ', ASCII_ONLY, nlohmann::ordered_json::error_handler_t::replace) + "\n";
}

} // namespace cdef
