/* fields.h: how the numbers in fields read, for the tree of meanings. */
#ifndef CDGEN_COMPARE_FIELDS_H
#define CDGEN_COMPARE_FIELDS_H

#include "format/facts.h"

#include <string>

namespace compare {

/* Names joined with "+"; bits without a name in hexadecimal; "none". */
std::string text_of_bits(std::uint32_t bits, std::span<const props_t> known);

/* The number of a field that means this. The database is sound. */
std::string text_of_number(std::uint32_t number, cdb::meaning as);

} // namespace compare

#endif
