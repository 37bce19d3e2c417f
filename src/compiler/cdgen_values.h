/* cdgen_values.h: data types by name, texts to values, values to cells and string tables. */
#ifndef CDGEN_CDGEN_VALUES_H
#define CDGEN_CDGEN_VALUES_H

#include "compiler/cdgen_tables.h"
#include "format/data_types.h"
#include "format/names.h"

#include <array>
#include <cstddef>
#include <cstring>
#include <optional>
#include <span>
#include <string_view>

/* What a value is written for. */
enum type_out_mode {
    TYPE_SAME = 1, /* the given value */
    TYPE_16 = 2,   /* the given integer, narrowed to 16 bits */
    TYPE_INIT = 3,
    INIT_DEFAULT = 4, /* a dynamic attribute's initial value */
    DFLT_DEFAULT = 5, /* a persistent attribute's default */
    R_LO_DEFAULT = 6, /* a range's lower bound */
    R_HI_DEFAULT = 7  /* a range's upper bound */
};

/* The code of a data type by its name in sources; VX_UNKNOWN for unknown names and for "UNKNOWN" itself. */
vx_data_type_t data_type_named(std::string_view name);
/* The code of a variable type by its name; no value for an unknown name. */
std::optional<orb_variable_type_t> variable_type_named(std::string_view name);

/* In the following functions, a text ends with a NUL; however short it is, nine bytes from its beginning on may be
 * read. Integers of 64 bits, on every machine, by the rules of the C library, base 0, 8 or 10. An overflow is
 * remembered in cx.conv_errno. */
vx_int64_t int_from_text(cdgen &cx, std::string_view text, char **end, int base);

/* Converts text into *vx_out, for an array type into one element; 0, or -1 if the text is not a value of the type.
 * Texts and binaries are stored in the pool. */
int str_to_vx(cdgen &cx, vx_value_t *vx_out, vx_data_type_t vx_type, std::string_view str_in, text_pool &pool);
/* Decode into a block of a 32-bit length and bytes, for which vx_out must have room: 0, or -1 on malformed text.
 * oct_convert knows two forms of output: 1, text with a NUL at its end; 2, such a block. */
int hex_convert(char *vx_out, const char *str_in);
int oct_convert(cdgen &cx, const char *p, int type, char *out_buf);
/* The text inside a pair of double quotes; s itself when it is not quoted; null when the quotes do not match. Writes a
 * NUL over the closing quote. The text must end, with a NUL, at *end, which becomes the end of what is returned. */
char *strip_quotes(char *s, char **end);
/* ORs the bits of the properties named in a comma-separated list, which it takes apart, into *dest. An unknown name is
 * fatal. A NUL is written at its end; seven more bytes may be read. */
void set_props(vx_uint32_t *dest, std::span<const props_t> props, char *list, size_t length);
/* Packs up to four dotted numbers into *n; always 0. */
int ver_str_convert(cdgen &cx, const char *ver_str, vx_uint32_t *n);

/* How many bytes of its cell a number of the type takes; 0 for a type that is not a number. */
constexpr size_t number_width(vx_data_type_t type) {
    constexpr std::array<unsigned char, VX_FLOAT64 + 1> widths = {0, 0, 4, 4, 8, 8, 4, 8};
    return static_cast<size_t>(type) < widths.size() ? widths[type] : 0;
}

/* Copies a number into its cell. For any other type it does nothing and returns false. */
inline bool copy_number(vx_value_t &cell, const vx_value_t &number, vx_data_type_t type) {
    size_t width = number_width(type);
    if (width == 8)
        memcpy(&cell, &number, 8);
    else if (width == 4)
        memcpy(&cell, &number, 4);
    return width > 0;
}

/* Write a value, or with no in_data the default that the mode asks for, into a record's cell and, out of line, into the
 * string table. Arrays are filled one element a call, with a capacity of array_cnt. 0, or -1 for a type and mode that
 * do not go together. */
int copy_this_type(cdgen &cx, vx_value_t *out_data, const vx_value_t *in_data, vx_data_type_t type_in, int type_out,
                   tbl *str_tbl, tbl_anchor *array_anchor, vx_uint32_t array_cnt);

/* The offsets of the parts of a structured value that is being made. */
struct sd_anchors {
    tbl_anchor array;      /* of the element's own array */
    tbl_anchor sd_array;   /* of the array of structured data */
    tbl_anchor sd_element; /* of the structured data */
};

/* Adds one element of type type_in, with its default, to a structured value of array_cnt elements whose kind sd_type is
 * VX_SD_PTR or VX_SD_PTR_ARRAY. */
int copy_this_sd_type(cdgen &cx, vx_value_t *out_data, vx_data_type_t type_in, int type_out, tbl *str_tbl,
                      sd_anchors *anchors, vx_uint32_t array_cnt, vx_data_type_t sd_type);

/* These functions make the container if the anchor is empty, storing its offset in *out_data, and count one more
 * element. Return the offset of that element: of its value cell for an array, of the whole element for structured data
 * (of the structure if sd_cnt is 0). */
vx_uint32_t init_array(cdgen &cx, tbl *str_tbl, tbl_anchor *anchor, vx_uint32_t array_cnt, vx_value_t *out_data);
vx_uint32_t init_scalar_sd(cdgen &cx, tbl *str_tbl, tbl_anchor *anchor, vx_uint32_t sd_cnt, vx_value_t *out_data);
vx_uint32_t init_array_sd(cdgen &cx, tbl *str_tbl, tbl_anchor *array_anchor, tbl_anchor *sd_anchor,
                          vx_uint32_t array_cnt, vx_uint32_t sd_cnt, vx_value_t *out_data);

#endif
