/* fields.h: the numbers in fields as texts, for comparisons. */
#ifndef CDGEN_COMPARE_FIELDS_H
#define CDGEN_COMPARE_FIELDS_H

#include "format/facts.h"

#include <string>

namespace compare {

/* Names joined with "+"; bits without a name in hexadecimal; "none". */
std::string text_of_bits(std::uint32_t bits, std::span<const props_t> known);

/* The text for the number of a field with this meaning. The database must be sound. */
std::string text_of_number(std::uint32_t number, cdb::meaning as);

} // namespace compare

#endif
