/* number.h: numbers of floating point as text. */
#ifndef CDGEN_TEXT_NUMBER_H
#define CDGEN_TEXT_NUMBER_H

#include <string>

namespace text {

/* The shortest text that reads back as the same number: "0.1", "-0", "1e+300", "-inf", "nan". A NaN whose payload is
 * not 0 shows it: "nan(0x1)". */
std::string shortest(float number);
std::string shortest(double number);

} // namespace text

#endif
