/* json_text.h: JSON as the programs print it. */
#ifndef CDGEN_REPORT_JSON_TEXT_H
#define CDGEN_REPORT_JSON_TEXT_H

#include <nlohmann/json_fwd.hpp>

#include <string>

namespace report {

/* Indented, ASCII only, with a newline after it. Bytes that are not UTF-8 (a file's name may have some) become U+FFFD.
 */
std::string json_text(const nlohmann::ordered_json &data);

/* The same on one line, without the newline. All texts are UTF-8. */
std::string json_line(const nlohmann::ordered_json &data);

} // namespace report

#endif
