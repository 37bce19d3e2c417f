/* facts.h: what fields of databases state, as data that programs take: numbers, names, texts. */
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

/* One of our own words: the name of a type, a version, a time. */
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

/* A number that stands for something with a name; kind is empty if it stands for nothing known. */
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

/* What a number means as far as it can be told from the number alone. */
fact fact_of(cdb::meaning as, std::uint32_t number);

/* A value that is stored in its cell, or is none. It has no elements. */
fact fact_of(const cdb::value &value);

/* On one line, in ASCII only. docs/dump.md says which fact has which form. */
void append_json(std::string &to, const fact &f);

/* The name of one of the bits; empty if it has none. The text is never freed. */
std::string_view name_of_bit(cdb::meaning as, std::uint32_t bit);

/* Passes the names of the bits to take(std::string_view), the lowest bit first. What has no name follows as one number
 * in hexadecimal. */
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
