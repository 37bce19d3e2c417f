/* facts.h: what fields of databases state, as data that programs take: numbers, names, texts. */
#ifndef CDGEN_CDEF_FACTS_H
#define CDGEN_CDEF_FACTS_H

#include "cdb_view.h"
#include "format/facts.h"

#include <span>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

namespace cdef::facts {

struct none {};

/* One of our own words: the name of a type, a version, a time. */
struct word {
    std::string text;
};

/* A set of words, perhaps empty. */
struct words {
    std::vector<std::string> list;
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

using fact = std::variant<none, std::int64_t, std::uint64_t, float, double, bits, word, words, any_text, binary,
                          vx_resource_handle_t, named, checksum>;

/* What a number means as far as it can be told from the number alone. */
fact fact_of(cdb::meaning as, std::uint32_t number);

/* A value that is stored in its cell, or is none. It has no elements. */
fact fact_of(const cdb::value &value);

/* On one line, in ASCII only. docs/dump.md says which fact has which form. */
std::string json_of(const fact &f);

} // namespace cdef::facts

#endif
