/* cdef_json.cpp: JSON as the subcommands print it. */

#include "cdef.h"

#include <nlohmann/json.hpp>

namespace cdef {

std::string json_text(const nlohmann::ordered_json &data) {
    constexpr int INDENT = 2;
    return data.dump(INDENT, ' ', false, nlohmann::ordered_json::error_handler_t::replace) + "\n";
}

} // namespace cdef
