/* numbers.h: numbers in a source, as the C library reads them. Pure functions of texts. */
#ifndef CDGEN_CHECK_NUMBERS_H
#define CDGEN_CHECK_NUMBERS_H

#include "vx.h"

#include <array>
#include <cstddef>
#include <string_view>

namespace check {

/* A decimal integer, or with base 0 also an octal or a hexadecimal one; converted by strtoll. */
struct number {
    number(std::string_view given, int base);

    /* The text after the number and the blanks that follow it. */
    std::string_view rest() const;

    std::string_view text;
    vx_int64_t value = 0;
    size_t read = 0; /* characters; 0: the text does not begin with a number */
    bool overflow = false;

private:
    void convert(int base);
};

/* True if the text has only decimal digits without a leading 0 and fits for certain: up to 65535 in 16 bits, up to 9
 * digits in 32. */
bool is_plain(std::string_view text, int bits);

/* "low,high". Without a comma both are the whole text. */
struct bounds {
    explicit bounds(std::string_view text);

    bool two() const {
        return offset > 0;
    }

    std::string_view low, high;
    size_t offset = 0; /* of high */
};

bool is_numeric(vx_data_type_t type);

/* How a number is read and stored. */
enum class number_form {
    BITS16, /* any base */
    BITS32, /* any base */
    ID,     /* any base, stored as signed */
    INT32,  /* decimal, as the following ones */
    UINT32,
    UINT64,
    INDEX,        /* of an element: a UINT32 */
    VERSION_PART, /* 8 bits */
    VERSION_REST  /* what follows the four parts: not read */
};

/* A number in the value of an attribute. */
struct number_part {
    /* True if nothing can be wrong with the number. Nearly all numbers are plain. */
    bool is_plain() const;

    std::string_view text;
    size_t offset; /* in the value */
    number_form form;
};

class number_parts {
public:
    void add(const number_part &part) {
        parts[count++] = part;
    }
    const number_part *begin() const {
        return parts.data();
    }
    const number_part *end() const {
        return parts.data() + count;
    }

private:
    static constexpr size_t MOST = 5; /* a version, and what follows it */

    std::array<number_part, MOST> parts; /* of which count are in use */
    size_t count = 0;
};

/* The numbers in a value of an attribute type, in a stanza of a data type, except those that the compiler itself
 * checks. */
number_parts numbers_in(int attr_type, vx_data_type_t type, std::string_view value);

/* True if "low,high" are the wrong way round. Varieties are UInt32 in any base; others are decimal. */
bool is_low_above_high(bool variety, vx_data_type_t type, std::string_view value);

} // namespace check

#endif
