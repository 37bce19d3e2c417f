/* number.h: numbers as text. */
#ifndef CDGEN_TEXT_NUMBER_H
#define CDGEN_TEXT_NUMBER_H

#include <cstdint>
#include <string>

namespace text {

/* The shortest text that reads back as the same number: "0.1", "-0", "1e+300", "-inf", "nan". A NaN whose payload is
 * not 0 shows it: "nan(0x1)". */
std::string shortest(float number);
std::string shortest(double number);

/* The four bytes of a number, the highest first, as a version is written: "1.2.3.4". */
std::string dotted(std::uint32_t number);

} // namespace text

#endif
