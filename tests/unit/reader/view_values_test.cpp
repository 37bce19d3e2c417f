/* The views over values: every data type, values inside values, and what leads nowhere; in both byte orders. */

#include "cdb_view.h"

#include "reader/image_files.h"

#include <fstream>
#include <unistd.h>

namespace {

using namespace image_files;

/* ---- Types ----------------------------------------------------------------------------------------------------- */

TEST(CdbViewType, NamesAreThoseOfSources) {
    const std::string_view names[] = {"UNKNOWN",     "None",        "Int32",        "UInt32",       "Int64",
                                      "UInt64",      "Float32",     "Float64",      "String",       "Binary",
                                      "RH",          "SD",          "SBS",          "Int32Array",   "UInt32Array",
                                      "Int64Array",  "UInt64Array", "Float32Array", "Float64Array", "StringArray",
                                      "BinaryArray", "RHArray",     "SDArray"};
    for (std::uint32_t code = 0; code < 23; ++code)
        EXPECT_EQ(cdb::name_of(vx_data_type_t(code)), names[code]);
    EXPECT_EQ(cdb::name_of(vx_data_type_t(23)), "");
    EXPECT_EQ(cdb::name_of(vx_data_type_t(0xFFFFFFFF)), "");
}

TEST(CdbViewType, CodesFrom0To22AreTypes) {
    EXPECT_TRUE(cdb::is_data_type(VX_UNKNOWN));
    EXPECT_TRUE(cdb::is_data_type(VX_SD_PTR_ARRAY));
    EXPECT_FALSE(cdb::is_data_type(vx_data_type_t(23)));
}

TEST(CdbViewType, AnArraysElementTypeIs11Less) {
    for (std::uint32_t code = 0; code < 30; ++code) {
        bool array = code >= 13 && code <= 22;
        EXPECT_EQ(cdb::is_array(vx_data_type_t(code)), array) << code;
        EXPECT_EQ(cdb::element_type(vx_data_type_t(code)), vx_data_type_t(array ? code - 11 : code)) << code;
        bool out_of_line = array || (code >= 8 && code <= 11);
        EXPECT_EQ(cdb::is_out_of_line(vx_data_type_t(code)), out_of_line) << code;
    }
}

/* ---- Values of every type -------------------------------------------------------------------------------------- */

cdb::value_list everything(const cdb::database &db) {
    return (*db.classes().begin()).persistent_attributes(cdb::level::of_resource)[0].default_value().elements();
}

/* Calls check with the elements of the image's default, in both byte orders, 0 to 7 bytes off an aligned place. */
template <class Check> void everywhere(Check check) {
    for (std::endian order : both_orders)
        for (std::size_t off = 0; off < 8; ++off) {
            exact_copy copy(load("values", order), off);
            SCOPED_TRACE(testing::Message() << name_of(order) << ", " << off << " bytes off");
            cdb::value_list values = everything(cdb::database(copy.bytes()));
            ASSERT_EQ(values.size(), 21u);
            check(values);
        }
}

TEST(CdbViewValue, Numbers) {
    everywhere([](const cdb::value_list &v) {
        EXPECT_EQ(v[1].integer(), -2);
        EXPECT_EQ(v[2].natural(), 4000000003u);
        EXPECT_EQ(v[3].integer(), -5000000004);
        EXPECT_EQ(v[4].natural(), 18446744073709551610u);
        EXPECT_EQ(v[5].real(), 0.375);
        EXPECT_EQ(v[6].real(), -1e100);
    });
}

TEST(CdbViewValue, TextBinaryAndHandle) {
    everywhere([](const cdb::value_list &v) {
        EXPECT_EQ(v[7].text(), "text");
        const std::byte binary[] = {std::byte{0x41}, std::byte{0}, std::byte{0x43}, std::byte{0x44}, std::byte{0x45}};
        EXPECT_TRUE(std::ranges::equal(v[8].binary(), binary));
        vx_resource_handle_t handle = v[9].handle();
        EXPECT_EQ(handle.header, 11u);
        EXPECT_EQ(handle.id.id1, 12u);
        EXPECT_EQ(handle.id.id2, 13u);
        EXPECT_EQ(handle.id.id3, 14u);
        EXPECT_EQ(handle.id.id4, 15u);
    });
}

TEST(CdbViewValue, ArraysOfNumbers) {
    everywhere([](const cdb::value_list &v) {
        ASSERT_EQ(v[11].elements().size(), 2u);
        EXPECT_EQ(v[11].elements()[0].integer(), -17);
        EXPECT_EQ(v[11].elements()[1].integer(), 18);
        EXPECT_EQ(v[12].elements()[0].natural(), 4000000019u);
        EXPECT_EQ(v[13].elements()[0].integer(), -5000000020);
        EXPECT_EQ(v[13].elements()[1].integer(), 21);
        EXPECT_EQ(v[14].elements()[0].natural(), 18446744073709551594u);
        EXPECT_EQ(v[15].elements()[1].real(), -2.25);
        EXPECT_EQ(v[16].elements()[0].real(), 1e-300);
    });
}

TEST(CdbViewValue, ArraysOfWhatIsOutOfLine) {
    everywhere([](const cdb::value_list &v) {
        ASSERT_EQ(v[17].elements().size(), 2u);
        EXPECT_EQ(v[17].elements()[0].text(), "s24");
        EXPECT_FALSE(v[17].elements()[1].present());
        ASSERT_EQ(v[18].elements()[0].binary().size(), 1u);
        EXPECT_EQ(v[18].elements()[0].binary()[0], std::byte{0x25});
        EXPECT_EQ(v[19].elements()[0].handle().header, 31u);
        EXPECT_EQ(v[19].elements()[0].handle().id.id4, 35u);
    });
}

TEST(CdbViewValue, StructuresInsideOneAnother) {
    everywhere([](const cdb::value_list &v) {
        ASSERT_EQ(v[10].elements().size(), 1u);
        EXPECT_EQ(v[10].elements()[0].integer(), -16);
        ASSERT_EQ(v[20].elements().size(), 1u);
        cdb::value_list inner = v[20].elements()[0].elements();
        ASSERT_EQ(inner.size(), 2u);
        EXPECT_EQ(inner[0].elements()[0].integer(), 36);
        EXPECT_EQ(inner[1].text(), "deep");
    });
}

TEST(CdbViewValue, ElementsKnowTheirTypes) {
    everywhere([](const cdb::value_list &v) {
        std::size_t i = 0;
        for (std::uint32_t code = 1; code <= 22; ++code)
            if (code != VX_SBS_PTR) {
                EXPECT_EQ(v[i].type(), vx_data_type_t(code));
                ++i;
            }
        EXPECT_EQ(i, v.size());
        EXPECT_EQ(v[11].elements()[0].type(), VX_INT32);
        EXPECT_EQ(v[20].elements()[0].type(), VX_SD_PTR);
    });
}

TEST(CdbViewValue, WhatAValueIsNotReadsAsNothing) {
    everywhere([](const cdb::value_list &values) {
        for (const cdb::value &v : values) {
            auto is = [&](std::initializer_list<vx_data_type_t> types) {
                return std::find(types.begin(), types.end(), v.type()) != types.end();
            };
            SCOPED_TRACE(cdb::name_of(v.type()));
            EXPECT_EQ(v.integer() != 0, is({VX_INT32, VX_INT64}));
            EXPECT_EQ(v.natural() != 0, is({VX_UINT32, VX_UINT64}));
            EXPECT_EQ(v.real() != 0, is({VX_FLOAT32, VX_FLOAT64}));
            EXPECT_EQ(!v.text().empty(), is({VX_CHAR_PTR}));
            EXPECT_EQ(!v.binary().empty(), is({VX_BINARY_PTR}));
            EXPECT_EQ(v.handle().header != 0, is({VX_RSRC_HANDLE_PTR}));
            EXPECT_EQ(!v.elements().empty(), v.type() == VX_SD_PTR || cdb::is_array(v.type()));
            EXPECT_EQ(v.present(), v.type() != VX_NONE);
        }
    });
}

TEST(CdbViewValue, NoneAndTheTypeWithoutValues) {
    for (std::endian order : both_orders) {
        std::vector<std::byte> image = load("values", order);
        auto attributes = (*cdb::database(image).classes().begin()).persistent_attributes(cdb::level::of_resource);
        EXPECT_EQ(attributes[1].default_value().type(), VX_CHAR_PTR);
        EXPECT_FALSE(attributes[1].default_value().present());
        EXPECT_EQ(attributes[1].default_value().text(), "");
        EXPECT_EQ(attributes[2].default_value().type(), VX_NONE);
        EXPECT_FALSE(attributes[2].default_value().present());
    }
}

/* ---- What leads nowhere ---------------------------------------------------------------------------------------- */

using words = std::vector<std::uint32_t>;

/* Strings made of words, and a cell whose first word is given. */
struct strings_and_cell {
    strings_and_cell(const words &strings, std::uint32_t first_word, std::size_t less = 0)
        : memory(std::as_bytes(std::span(strings)).first(strings.size() * 4 - less)), cell_word{first_word, 0} {}

    cdb::value value(vx_data_type_t type, unsigned nesting = 0) const {
        return {cdb::bytes(std::as_bytes(std::span(cell_word)), std::endian::native), 0, type,
                cdb::bytes(memory.bytes(), std::endian::native), nesting};
    }

    exact_copy memory;
    std::array<std::uint32_t, 2> cell_word;
};

constexpr vx_data_type_t out_of_line[] = {VX_CHAR_PTR,      VX_BINARY_PTR,    VX_RSRC_HANDLE_PTR, VX_SD_PTR,
                                          VX_INT32_ARRAY,   VX_INT64_ARRAY,   VX_UINT32_ARRAY,    VX_UINT64_ARRAY,
                                          VX_FLOAT32_ARRAY, VX_FLOAT64_ARRAY, VX_SD_PTR_ARRAY};

TEST(CdbViewValue, OffsetsThatLeadNowhere) {
    for (vx_data_type_t type : out_of_line)
        for (std::uint32_t offset : {0u, 16u, 17u, 0x80000000u, 0xFFFFFFF8u, 0xFFFFFFFEu, 0xFFFFFFFFu}) {
            strings_and_cell made({0xFFFFFFFF, 0xFFFFFFFF, 1, 0xFFFFFFFF}, offset);
            cdb::value v = made.value(type);
            SCOPED_TRACE(testing::Message() << cdb::name_of(type) << " at " << offset);
            EXPECT_FALSE(v.present());
            EXPECT_FALSE(v.place());
            EXPECT_EQ(v.text(), "");
            EXPECT_TRUE(v.binary().empty());
            EXPECT_EQ(v.handle().header, 0u);
            EXPECT_TRUE(v.elements().empty());
        }
}

TEST(CdbViewValue, TheLastByteIsAPlace) {
    for (vx_data_type_t type : out_of_line)
        EXPECT_EQ(strings_and_cell({0, 0, 0, 0}, 15).value(type).place(), 15u) << cdb::name_of(type);
}

TEST(CdbViewValue, TextWithoutEndStopsWithTheStrings) {
    EXPECT_EQ(strings_and_cell({0, 0, 0x41414141, 0x41414141}, 8, 3).value(VX_CHAR_PTR).text(), "AAAAA");
    EXPECT_EQ(strings_and_cell({0, 0, 0x41414141, 0x41414141}, 15).value(VX_CHAR_PTR).text(), "A");
}

TEST(CdbViewValue, BinaryIsThereWholeOrNotAtAll) {
    auto size_of = [](std::uint32_t length, std::size_t less) {
        return strings_and_cell({0, 0, length, 0, 1, 2}, 8, less).value(VX_BINARY_PTR).binary().size();
    };
    EXPECT_EQ(size_of(8, 0), 8u);
    EXPECT_EQ(size_of(9, 0), 0u);
    EXPECT_EQ(size_of(7, 1), 7u);
    EXPECT_EQ(size_of(8, 1), 0u);
    EXPECT_EQ(size_of(0xFFFFFFFF, 0), 0u);
    EXPECT_EQ(size_of(0xFFFFFFF8, 0), 0u);
}

TEST(CdbViewValue, HandleCutOffReadsAsZerosBehindTheCut) {
    vx_resource_handle_t handle = strings_and_cell({0, 0, 1, 2, 3, 4}, 8, 1).value(VX_RSRC_HANDLE_PTR).handle();
    EXPECT_EQ(handle.header, 1u);
    EXPECT_EQ(handle.id.id2, 3u);
    EXPECT_EQ(handle.id.id3, 0u);
    EXPECT_EQ(handle.id.id4, 0u);
}

TEST(CdbViewValue, ElementsAreThoseThatFit) {
    const words two_cells = {0, 0, 2, 0, 11, 0, 12, 0};
    EXPECT_EQ(strings_and_cell(two_cells, 8).value(VX_INT32_ARRAY).elements().size(), 2u);
    EXPECT_EQ(strings_and_cell(two_cells, 8, 1).value(VX_INT32_ARRAY).elements().size(), 1u);
    EXPECT_EQ(strings_and_cell(two_cells, 8, 16).value(VX_INT32_ARRAY).elements().size(), 0u);
    EXPECT_EQ(strings_and_cell(two_cells, 8, 20).value(VX_INT32_ARRAY).elements().size(), 0u);
    const words many = {0, 0, 0xFFFFFFFF, 0, VX_INT32, 0, 12, 0, VX_INT32, 0, 13, 0};
    EXPECT_EQ(strings_and_cell(many, 8).value(VX_SD_PTR).elements().size(), 2u);
    EXPECT_EQ(strings_and_cell(many, 8).value(VX_SD_PTR).elements()[1].integer(), 13);
    EXPECT_EQ(strings_and_cell(many, 8).value(VX_INT32_ARRAY).elements().size(), 4u);
}

TEST(CdbViewValue, ElementOfNoTypeIsNothing) {
    const words strings = {0, 0, 1, 0, 23, 0, 12, 0};
    cdb::value v = strings_and_cell(strings, 8).value(VX_SD_PTR).elements()[0];
    EXPECT_EQ(v.type(), vx_data_type_t(23));
    EXPECT_FALSE(v.present());
}

/* Structured data that hold themselves: 64 times, and no more. */
TEST(CdbViewValue, NestingEnds) {
    strings_and_cell made({0, 0, 1, 0, VX_SD_PTR, 0, 8, 0}, 8);
    cdb::value v = made.value(VX_SD_PTR);
    unsigned depth = 0;
    for (; !v.elements().empty(); v = v.elements()[0])
        ASSERT_LE(++depth, 64u);
    EXPECT_EQ(depth, 64u);
    EXPECT_TRUE(made.value(VX_SD_PTR, 64).elements().empty());
    EXPECT_EQ(made.value(VX_SD_PTR, 63).elements().size(), 1u);
}

/* ---- Bytes ----------------------------------------------------------------------------------------------------- */

TEST(CdbViewBytes, OutsideEverythingIsZero) {
    const std::array<std::byte, 4> four = {std::byte{1}, std::byte{2}, std::byte{3}, std::byte{4}};
    cdb::bytes all(four, std::endian::little);
    EXPECT_EQ(all.number<std::uint16_t>(2), 0x0403);
    EXPECT_EQ(all.number<std::uint16_t>(3), 0);
    EXPECT_EQ(all.number<std::uint32_t>(SIZE_MAX), 0u);
    EXPECT_EQ(all.record<cdb_dsect_anchor_t>(0).cda_type, CDB_DSECT_UNUSED);
    EXPECT_EQ(all.part(4).size(), 0u);
    EXPECT_EQ(all.part(5).size(), 0u);
    EXPECT_EQ(all.part(1, SIZE_MAX).size(), 3u);
    EXPECT_TRUE(all.holds(4, 0));
    EXPECT_FALSE(all.holds(5, 0));
    EXPECT_FALSE(all.holds(1, SIZE_MAX));
    EXPECT_EQ(all.text(std::size_t{4}), "");
    EXPECT_EQ(all.text(SIZE_MAX), "");
    EXPECT_EQ(all.text(cdb_ref_t{{CDB_NONE, 0}}), "");
}

/* In 32 bits, these offsets are 4 bytes into the table once 8 are added. */
TEST(CdbViewBytes, OffsetsDoNotStartAgainBeyond32Bits) {
    std::vector<std::byte> table(64, std::byte{2});
    cdb::bytes all(table, std::endian::native);
    cdb::class_tables tables = {all, all, all, all, all};
    cdb_ref_t nowhere = {{0xFFFFFFFC, 0}};
    EXPECT_TRUE(cdb::varieties_at(tables, nowhere).empty());
    EXPECT_TRUE(cdb::valid_values_at(tables, nowhere, VX_INT32).empty());
    EXPECT_TRUE(cdb::sd_definition_at(tables, nowhere).empty());
    EXPECT_EQ(all.number<std::uint32_t>(0x100000000), 0U);
    EXPECT_EQ(all.part(0x100000000).size(), 0U);
    EXPECT_EQ(all.part(0, 0x100000004).size(), 64U);
    EXPECT_FALSE(all.holds(0x100000000, 0x100000000));
    EXPECT_EQ(cdb::count_inside(all, 0, 0x100000000, 8), 8U);
}

/* ---- Reading files --------------------------------------------------------------------------------------------- */

TEST(CdbViewReadFile, WholeContents) {
    for (std::size_t size :
         {std::size_t{0}, std::size_t{1}, std::size_t{65535}, std::size_t{65536}, std::size_t{65537}}) {
        std::string path = testing::TempDir() + "read_file_" + std::to_string(getpid());
        std::string contents(size, '\0');
        for (std::size_t i = 0; i < size; ++i)
            contents[i] = static_cast<char>(i * 31 + 7);
        std::ofstream(path, std::ios::binary) << contents;
        std::error_code error = std::make_error_code(std::errc::io_error);
        std::vector<std::byte> read = cdb::read_file(path.c_str(), error);
        std::remove(path.c_str());
        EXPECT_FALSE(error) << error.message();
        EXPECT_TRUE(std::ranges::equal(read, std::as_bytes(std::span(contents))));
    }
}

TEST(CdbViewReadFile, SaysWhatIsWrong) {
    std::error_code error;
    EXPECT_TRUE(cdb::read_file("/no/such/file", error).empty());
    EXPECT_EQ(error, std::errc::no_such_file_or_directory);
    EXPECT_TRUE(cdb::read_file(testing::TempDir().c_str(), error).empty());
    EXPECT_EQ(error, std::errc::is_a_directory);
}

} // namespace
