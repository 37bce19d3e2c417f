/* image_fixture.h: images made by hand. Numbers are put at offsets in the order of this machine and turned at offsets
 * into the other order. Nothing here knows the declarations of the records or the tables of their fields. */
#ifndef CDGEN_IMAGE_FIXTURE_H
#define CDGEN_IMAGE_FIXTURE_H

#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>
#include <string_view>
#include <vector>

namespace by_hand {

constexpr std::uint32_t NONE = 0xFFFFFFFF;

/* The offset of a number, and its bytes. */
struct number {
    std::size_t at;
    std::size_t width;
};

using numbers = std::vector<number>;

class image {
public:
    /* Every byte differs from those near it, so that a reversal anywhere shows. */
    explicit image(std::size_t size) : bytes(size) {
        for (std::size_t i = 0; i < size; ++i)
            bytes[i] = static_cast<char>(i * 37 + 11);
    }

    image &u16(std::size_t at, std::uint16_t n) {
        std::memcpy(&bytes.at(at), &n, sizeof n);
        return *this;
    }

    image &u32(std::size_t at, std::uint32_t n) {
        std::memcpy(&bytes.at(at), &n, sizeof n);
        return *this;
    }

    image &text(std::size_t at, std::string_view text) {
        std::copy(text.begin(), text.end(), bytes.begin() + static_cast<std::ptrdiff_t>(at));
        return *this;
    }

    image &turn(std::size_t at, std::size_t width) {
        std::reverse(bytes.begin() + static_cast<std::ptrdiff_t>(at),
                     bytes.begin() + static_cast<std::ptrdiff_t>(at + width));
        return *this;
    }

    /* The numbers of a record at an offset. */
    image &turn(const numbers &of_record, std::size_t record = 0) {
        for (const number &n : of_record)
            turn(record + n.at, n.width);
        return *this;
    }

    std::uint32_t word(std::size_t at) const {
        std::uint32_t n = 0;
        std::memcpy(&n, &bytes.at(at), sizeof n);
        return n;
    }

    char *at(std::size_t offset) {
        return bytes.data() + offset;
    }

    std::vector<char> bytes;
};

/* Reports where two images differ. */
inline testing::AssertionResult same(const image &expected, const image &actual) {
    std::string places;
    if (expected.bytes.size() != actual.bytes.size())
        places += " size";
    for (std::size_t i = 0; i < std::min(expected.bytes.size(), actual.bytes.size()) && places.size() < 200; ++i)
        if (expected.bytes[i] != actual.bytes[i])
            places += ' ' + std::to_string(i);
    return places.empty() ? testing::AssertionSuccess() : testing::AssertionFailure() << "differs at" << places;
}

/* ---- Values ---------------------------------------------------------------------------------------------------- */

/* The contents of a cell of a type, and the numbers that the reversal turns. */
struct value_row {
    const char *name;
    std::uint32_t type;
    bool refers;           /* content is an offset in the block of values */
    std::uint32_t content; /* first word of the cell; the second is arbitrary */
    std::size_t width;     /* bytes of the cell that are turned */
    numbers beyond;        /* out of line, in the block of values */
};

/* A block has one value of each out-of-line form; offsets in the rows count from its start. */
constexpr std::size_t VALUES_SIZE = 176;

inline void put_values(image &to, std::size_t table, std::size_t block) {
    auto offset = static_cast<std::uint32_t>(block);
    std::size_t at = table + block;
    to.text(at + 8, std::string_view("text\0\0\0\0", 8));
    to.u32(at + 16, 3); /* a binary: length, padding, data from 24 on */
    /* 32: a resource handle of 20 bytes */
    to.u32(at + 56, 1).u32(at + 64, 2);                                /* structured data: 1 element, an Int32 at 72 */
    to.u32(at + 80, 2);                                                /* an array of two numbers at 88 and 96 */
    to.u32(at + 104, 2).u32(at + 112, offset + 8).u32(at + 120, NONE); /* of strings, one of them none */
    to.u32(at + 128, 1).u32(at + 136, offset + 16);                    /* of binaries */
    to.u32(at + 144, 1).u32(at + 152, offset + 32);                    /* of resource handles */
    to.u32(at + 160, 1).u32(at + 168, offset + 56);                    /* of structured data */
}

inline const std::vector<value_row> value_rows = {
    {"UNKNOWN", 0, true, 80, 0, {}},
    {"None", 1, true, 80, 0, {}},
    {"Int32", 2, false, 0x11223344, 4, {}},
    {"UInt32", 3, false, 0x22334455, 4, {}},
    {"Int64", 4, false, 0x33445566, 8, {}},
    {"UInt64", 5, false, 0x44556677, 8, {}},
    {"Float32", 6, false, 0x55667788, 4, {}},
    {"Float64", 7, false, 0x66778899, 8, {}},
    {"String", 8, true, 8, 4, {}},
    {"Binary", 9, true, 16, 4, {{16, 4}}},
    {"RH", 10, true, 32, 4, {}},
    {"SD", 11, true, 56, 4, {{56, 4}, {64, 4}, {72, 4}}},
    {"SBS", 12, true, 56, 0, {}},
    {"Int32Array", 13, true, 80, 4, {{80, 4}, {88, 4}, {96, 4}}},
    {"UInt32Array", 14, true, 80, 4, {{80, 4}, {88, 4}, {96, 4}}},
    {"Int64Array", 15, true, 80, 4, {{80, 4}, {88, 8}, {96, 8}}},
    {"UInt64Array", 16, true, 80, 4, {{80, 4}, {88, 8}, {96, 8}}},
    {"Float32Array", 17, true, 80, 4, {{80, 4}, {88, 4}, {96, 4}}},
    {"Float64Array", 18, true, 80, 4, {{80, 4}, {88, 8}, {96, 8}}},
    {"StringArray", 19, true, 104, 4, {{104, 4}, {112, 4}}},
    {"BinaryArray", 20, true, 128, 4, {{128, 4}, {136, 4}, {16, 4}}},
    {"RHArray", 21, true, 144, 4, {{144, 4}, {152, 4}}},
    {"SDArray", 22, true, 160, 4, {{160, 4}, {168, 4}, {56, 4}, {64, 4}, {72, 4}}},
    {"code 23", 23, true, 80, 0, {}},
    {"code 4294967295", 0xFFFFFFFF, true, 80, 0, {}},
};

/* A cell that refers into a block. */
inline void put_cell(image &to, std::size_t cell, const value_row &row, std::size_t block) {
    to.u32(cell, row.refers ? row.content + static_cast<std::uint32_t>(block) : row.content);
}

/* The row of a valid value: for an array type that of its element. */
inline const value_row &valid_value_row(std::uint32_t type) {
    constexpr std::uint32_t element_of[] = {2, 3, 4, 5, 6, 7, 8, 9, 10, 11}; /* of types 13 to 22 */
    if (type >= 13 && type <= 22)
        type = element_of[type - 13];
    return *std::find_if(value_rows.begin(), value_rows.end(),
                         [type](const value_row &row) { return row.type == type; });
}

/* ---- Records: the numbers of each that are turned -------------------------------------------------------------- */

inline const numbers variety_list_head = {{0, 4}, {4, 4}};
inline const numbers variety_entry = {{0, 4}, {4, 4}};
inline const numbers valid_values_head = {{0, 4}, {4, 4}};
inline const numbers valid_values_entry = {{16, 2}}; /* without the values at 0 and 8 */
inline const numbers sd_def_head = {{0, 4}, {4, 4}};
inline const numbers sd_element = {{0, 4}, {8, 4}, {12, 2}, {14, 2}, {16, 4}, {24, 4}, {28, 2}};

/* Each with the first word of its references, but without its values. */
inline const numbers pattr_numbers = {{0, 4},  {4, 4},  {8, 4},  {16, 2}, {18, 2}, {20, 2}, {22, 2},
                                      {32, 4}, {36, 4}, {40, 4}, {48, 4}, {56, 4}, {64, 2}};
inline const numbers dattr_numbers = {{0, 4},   {4, 4},   {8, 4},   {16, 4},  {24, 4},  {56, 4},  {64, 4},  {72, 4},
                                      {80, 4},  {88, 4},  {96, 4},  {104, 4}, {108, 4}, {112, 2}, {114, 2}, {116, 2},
                                      {118, 2}, {120, 4}, {124, 2}, {126, 2}, {128, 2}, {130, 2}};
inline const numbers action_numbers = {{0, 4},  {4, 4},  {8, 4},  {12, 2}, {14, 2}, {16, 2},
                                       {18, 2}, {20, 4}, {24, 4}, {32, 4}, {40, 4}, {48, 4}};
inline const numbers error_numbers = {{0, 4}, {4, 4}, {8, 4}, {12, 2}, {14, 2}, {16, 4}, {24, 4}, {32, 4}, {40, 4}};
inline const numbers depend_numbers = {{0, 4}, {4, 2}};
inline const numbers class_numbers = {
    {0, 4},   {4, 4},   {8, 4},   {16, 4},  {24, 4},  {32, 4},  {40, 4},  {48, 4},  {56, 4},  {64, 4},  {72, 4},
    {80, 4},  {88, 4},  {96, 4},  {104, 4}, {112, 4}, {120, 4}, {128, 4}, {136, 4}, {144, 4}, {152, 4}, {160, 4},
    {168, 2}, {170, 2}, {172, 2}, {174, 2}, {176, 2}, {178, 2}, {180, 2}, {182, 2}, {184, 4}, {188, 4}, {192, 4},
    {196, 4}, {200, 4}, {204, 4}, {208, 2}, {210, 2}, {212, 2}, {214, 2}, {216, 4}};
inline const numbers mgr_numbers = {{0, 4}, {4, 2}, {6, 2}, {8, 4}};
inline const numbers cmmap_numbers = {{0, 4},  {4, 2},  {6, 2},  {8, 4},  {16, 4}, {24, 2}, {26, 2}, {28, 2}, {30, 2},
                                      {32, 2}, {34, 2}, {36, 2}, {38, 2}, {40, 4}, {44, 4}, {48, 4}, {52, 4}};
inline const numbers var_class_numbers = {{0, 4}, {4, 2}, {6, 2}, {8, 4}, {16, 4}, {24, 4}, {28, 4}};
inline const numbers class_hash_numbers = {{0, 4}, {8196, 4}};
inline const numbers hash_block_numbers = {{0, 4}, {8, 4}, {12, 4}, {16, 4}};
inline const numbers anchor_numbers = {{0, 4}, {4, 4}, {8, 4}, {12, 4}};
inline const numbers header_numbers = {{0, 4},  {8, 4},  {12, 4}, {16, 4}, {20, 4}, {24, 4}, {28, 2}, {30, 2}, {32, 2},
                                       {34, 2}, {36, 2}, {38, 2}, {40, 2}, {42, 2}, {44, 2}, {46, 2}, {48, 2}};

/* ---- Whole images ---------------------------------------------------------------------------------------------- */

struct section_row {
    std::uint32_t type;
    std::size_t length;
};

/* Where the sections of an image start: header, anchors, and then the sections one after the other. */
inline std::size_t section_at(const std::vector<section_row> &sections, std::size_t n) {
    std::size_t at = 80 + 16 * sections.size();
    for (std::size_t i = 0; i < n; ++i)
        at += sections[i].length;
    return at;
}

/* Header and anchors in this machine's order, the sections arbitrary. */
inline image image_of(const std::vector<section_row> &sections) {
    image made(section_at(sections, sections.size()));
    made.u32(0, static_cast<std::uint32_t>(made.bytes.size() - 4)).u32(8, 0x666D7431);
    made.u32(24, static_cast<std::uint32_t>(sections.size()));
    for (std::size_t i = 0; i < sections.size(); ++i) {
        std::size_t at = 80 + 16 * i;
        made.u32(at, sections[i].type).u32(at + 4, static_cast<std::uint32_t>(section_at(sections, i)));
        made.u32(at + 8, static_cast<std::uint32_t>(sections[i].length));
    }
    return made;
}

/* Turns header and anchors and puts the checksum in: the turned length and every whole word from offset 8 on. */
inline image &turn_frame(image &expected, std::size_t anchors) {
    expected.turn(header_numbers);
    for (std::size_t i = 0; i < anchors; ++i)
        expected.turn(anchor_numbers, 80 + 16 * i);
    std::uint32_t sum = expected.word(0);
    for (std::size_t at = 8; at + 4 <= expected.bytes.size(); at += 4)
        sum ^= expected.word(at);
    return expected.u32(4, sum);
}

/* The sizes of a class's tables, which follow its record in this order. */
struct class_sizes {
    std::size_t records;
    std::size_t varieties;
    std::size_t sds;
    std::size_t lists;
    std::size_t strings;
};

inline void put_ref(image &to, std::size_t at, std::size_t offset) {
    to.u32(at, static_cast<std::uint32_t>(offset));
}

/* A class record without records and inputs. */
inline void put_class(image &to, std::size_t at, const class_sizes &sizes) {
    for (std::size_t place : {24U, 32U, 40U, 48U, 96U, 104U, 112U, 120U}) /* tables of records */
        put_ref(to, at + place, 224);
    for (std::size_t place : {56U, 64U, 72U, 80U, 88U}) /* inputs */
        to.u32(at + place, NONE);
    for (std::size_t count = 168; count < 184; count += 2)
        to.u16(at + count, 0);
    std::size_t table = 224 + sizes.records;
    put_ref(to, at + 128, table);
    put_ref(to, at + 144, table += sizes.varieties);
    put_ref(to, at + 152, table += sizes.sds);
    put_ref(to, at + 160, table + sizes.lists);
    put_ref(to, at + 184, sizes.varieties);
    put_ref(to, at + 192, sizes.sds);
    put_ref(to, at + 196, sizes.lists);
}

} // namespace by_hand

#endif
