/* fields.h: how the fields of records are called and how their numbers read, for the tree of meanings. */
#ifndef CDGEN_CDEF_DIFF_FIELDS_H
#define CDGEN_CDEF_DIFF_FIELDS_H

#include "compare/compare.h"
#include "format/names.h"

namespace cdef {

/* How a number reads. */
enum class form : std::uint8_t {
    number,
    identifier, /* signed */
    bits,
    version,
    data_type,
    variable_type,
    permission,
    element_index, /* 0xFFFF: none */
    locator,       /* likewise */
    reference      /* a reference that leads nowhere: 0, or its offset */
};

struct field_label {
    std::string_view field;
    std::string_view words;
    form as = form::number;
};

/* Of a field without words, its name. */
field_label label_of(const cdb::field &f);

/* By this field the thing is found. */
bool is_name(const cdb::field &f);

/* Names joined with "+"; bits without a name in hexadecimal; none. */
std::string text_of_bits(std::uint32_t bits, std::span<const props_t> known);

std::string text_of_number(std::uint32_t number, form as);

} // namespace cdef

#endif
