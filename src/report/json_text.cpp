/* json_text.cpp: JSON as the programs print it. */

#include "report/json_text.h"

#include <nlohmann/json.hpp>

namespace report {

namespace {

constexpr bool ASCII_ONLY = true; /* escapes everything that could control a terminal */

} // namespace

std::string json_line(const nlohmann::ordered_json &data) {
    return data.dump(-1, ' ', ASCII_ONLY, nlohmann::ordered_json::error_handler_t::replace);
}

} // namespace report
