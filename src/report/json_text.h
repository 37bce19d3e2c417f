/* json_text.h: JSON as the programs print it. */
#ifndef CDGEN_REPORT_JSON_TEXT_H
#define CDGEN_REPORT_JSON_TEXT_H

#include <nlohmann/json_fwd.hpp>

#include <string>

namespace report {

/* On one line, ASCII only, without a newline. Bytes that are not UTF-8 (a file's name may have some) become U+FFFD. */
std::string json_line(const nlohmann::ordered_json &data);

} // namespace report

#endif
