/* facts.h: the fields of databases as facts: numbers, names and texts. */
#ifndef CDGEN_CDEF_FACTS_H
#define CDGEN_CDEF_FACTS_H

#include "cdb_view.h"
#include "format/facts.h"
#include "text/hex.h"

#include <span>
#include <string>
#include <string_view>
#include <variant>

namespace cdef::facts {

struct none {};

/* A word from this program: the name of a type, a version, a time. */
struct word {
    std::string text;
};

/* A set of bits, each of which may have a name: properties or permissions. */
struct named_bits {
    cdb::meaning as;
    std::uint32_t set;
};

/* Text from the file: any bytes. */
struct any_text {
    std::string_view bytes;
};

struct binary {
    std::span<const std::byte> bytes;
};

/* A number that reads best in hexadecimal. */
struct bits {
    std::uint32_t number;
};

/* A number that refers to something with a name; kind is empty if the number is unknown. */
struct named {
    std::uint32_t number;
    std::string_view kind;
    std::string_view name;
};

/* found and expected are empty if it is correct. */
struct checksum {
    std::string found;
    std::string expected;
};

using fact = std::variant<none, std::int64_t, std::uint64_t, float, double, bits, word, named_bits, any_text, binary,
                          vx_resource_handle_t, named, checksum>;

/* The meaning of a number, as far as the number alone shows it. */
fact fact_of(cdb::meaning as, std::uint32_t number);

/* A value that is stored in its cell, or no value. It has no elements. */
fact fact_of(const cdb::value &value);

/* On one line, in ASCII only. docs/dump.md says which fact has which form. */
void append_json(std::string &to, const fact &f);

/* The name of one of the bits; empty if it has no name. The text is never freed. */
std::string_view name_of_bit(cdb::meaning as, std::uint32_t bit);

/* Passes the names of the bits to take(std::string_view), the lowest bit first. Bits without a name follow as one
 * hexadecimal number. */
template <class Take> void take_names(const named_bits &bits, Take take) {
    std::uint32_t unknown = 0;
    for (std::uint32_t rest = bits.set; rest != 0; rest &= rest - 1) {
        std::uint32_t bit = rest & -rest;
        if (std::string_view name = name_of_bit(bits.as, bit); !name.empty())
            take(name);
        else
            unknown |= bit;
    }
    if (unknown != 0)
        take(text::hex(unknown));
}

} // namespace cdef::facts

#endif
