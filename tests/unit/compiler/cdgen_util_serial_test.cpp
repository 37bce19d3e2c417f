/* Values into cells and string tables. */

#include "compiler/util_fixture.h"

#include <cstdint>
#include <initializer_list>
#include <memory>
#include <utility>

using namespace util_test;

namespace {

constexpr int ALL_MODES[] = {TYPE_SAME, TYPE_16, TYPE_INIT, INIT_DEFAULT, DFLT_DEFAULT, R_LO_DEFAULT, R_HI_DEFAULT};

/* ---- Numbers --------------------------------------------------------------------------------------------------- */

/* What a number's cell holds by mode. */
struct number_row {
    vx_data_type_t type;
    bytes in, same, low16, zero, hundred; /* no low16: refused */

    const bytes &written(int mode) const {
        return mode == TYPE_SAME ? same : mode == TYPE_16 ? low16 : mode == R_HI_DEFAULT ? hundred : zero;
    }
};

const number_row numbers[] = {
    {VX_INT32, bytes().u32(0x81223344, 0x55667788), bytes().u32(0x81223344), bytes().u16(0x3344), bytes().u32(0),
     bytes().u32(100)},
    {VX_UINT32, bytes().u32(0x9122B344, 0x55667788), bytes().u32(0x9122B344), bytes().u16(0xB344), bytes().u32(0),
     bytes().u32(100)},
    {VX_INT64, bytes().u64(0x8122334455667788), bytes().u64(0x8122334455667788), bytes().u16(0x7788), bytes().u64(0),
     bytes().u64(100)},
    {VX_UINT64, bytes().u64(0x912233445566F788), bytes().u64(0x912233445566F788), bytes().u16(0xF788), bytes().u64(0),
     bytes().u64(100)},
    {VX_FLOAT32, bytes().f32(-2.5F).u32(0x55667788), bytes().f32(-2.5F), bytes(), bytes().f32(0), bytes().f32(100)},
    {VX_FLOAT64, bytes().f64(-2.5e100), bytes().f64(-2.5e100), bytes(), bytes().f64(0), bytes().f64(100)},
};

TEST(SerialNumbers, StandInTheCell) {
    for (const number_row &row : numbers)
        for (int mode : ALL_MODES) {
            SCOPED_TRACE(testing::Message() << "type " << row.type << ", mode " << mode);
            serial given, none;
            vx_value_t in = value_of(row.in);
            EXPECT_EQ(given.copy(&in, row.type, mode), row.written(mode).all.empty() ? -1 : 0);
            EXPECT_EQ(given.written(), cell(row.written(mode)));
            bool default_mode = mode != TYPE_SAME && mode != TYPE_16;
            EXPECT_EQ(none.copy(nullptr, row.type, mode), default_mode ? 0 : -1);
            EXPECT_EQ(none.written(), cell(default_mode ? row.written(mode) : bytes()));
        }
}

vx_data_type_t array_of(vx_data_type_t type) {
    return type_of_code(type + 11U);
}

TEST(SerialNumbers, StandInAnArraysSlot) {
    for (const number_row &row : numbers)
        for (int mode : ALL_MODES) {
            SCOPED_TRACE(testing::Message() << "array of type " << row.type << ", mode " << mode);
            serial s;
            vx_value_t in = value_of(row.in);
            bool refused = mode == TYPE_16;
            EXPECT_EQ(s.copy(&in, array_of(row.type), mode, 2), refused ? -1 : 0);
            bytes array = bytes().u32(1, 0).text(pad8(refused ? bytes() : row.written(mode))).fill(8);
            EXPECT_EQ(s.written(), cell(bytes().u32(8)) + array.all); /* a refused element counts too */
        }
}

/* ---- Texts and binaries ---------------------------------------------------------------------------------------- */

/* A value, as text or as length and data, and what is appended to the string table. */
struct text_row {
    vx_data_type_t type;
    std::string in, appended;
};

/* One piece takes whole units of eight bytes: a text its NUL along, and a binary is two, the length and the data. */
const text_row texts[] = {
    {VX_CHAR_PTR, "disk", bytes().text("disk").fill(4).all},
    {VX_CHAR_PTR, "seven77", bytes().text("seven77").fill(1).all},
    {VX_CHAR_PTR, "eight888", bytes().text("eight888").fill(8).all},
    {VX_CHAR_PTR, "", bytes().fill(8).all},
    {VX_BINARY_PTR, bytes().u32(3).text("xyz").all, bytes().u32(3).fill(4).text("xyz").fill(5).all},
    {VX_BINARY_PTR, bytes().u32(8).text("eight888").all, bytes().u32(8).fill(4).text("eight888").all},
    {VX_BINARY_PTR, bytes().u32(9).fill(9, 'z').all, bytes().u32(9).fill(4).fill(9, 'z').fill(7).all},
    {VX_BINARY_PTR, bytes().u32(4).text("a").fill(3).all, bytes().u32(4).fill(4).text("a").fill(7).all},
    {VX_BINARY_PTR, bytes().u32(0).text("unused").all, bytes().u32(0).fill(4).fill(8).all},
};

/* As a scalar, and as the first element of an array with room for two. */
void expect_appended(vx_data_type_t type, int mode, const std::string &data, const std::string &by_scalar,
                     const std::string &by_array) {
    std::string original = data;
    vx_value_t in = {.ptr_char = original.data()};
    serial scalar, array;
    EXPECT_EQ(scalar.copy(&in, type, mode), 0);
    EXPECT_EQ(scalar.written(), cell(bytes().u32(8)) + by_scalar);
    EXPECT_EQ(array.copy(&in, array_of(type), mode, 2), 0);
    EXPECT_EQ(array.written(), cell(bytes().u32(8)) + bytes().u32(1, 0, 32, 0).fill(8).text(by_array).all);
}

TEST(SerialTexts, CellAndSlotHoldTheOffset) {
    for (const text_row &row : texts)
        expect_appended(row.type, TYPE_SAME, row.in, row.appended, row.appended);
}

TEST(SerialTexts, DefaultsAreEmpty) {
    for (int mode : {INIT_DEFAULT, DFLT_DEFAULT}) {
        expect_appended(VX_CHAR_PTR, mode, "unused", std::string(8, '\0'), std::string(8, '\0'));
        expect_appended(VX_BINARY_PTR, mode, bytes().u32(2).text("un").all, std::string(8, '\0'),
                        std::string(16, '\0')); /* two pieces for an array, deliberately */
    }
}

TEST(SerialTexts, BoundsAndPlaceholdersAreAllOnes) {
    for (vx_data_type_t type : {VX_CHAR_PTR, VX_BINARY_PTR})
        for (int mode : {TYPE_INIT, R_LO_DEFAULT, R_HI_DEFAULT}) {
            SCOPED_TRACE(testing::Message() << "type " << type << ", mode " << mode);
            serial scalar, array;
            EXPECT_EQ(scalar.copy(nullptr, type, mode), 0);
            EXPECT_EQ(scalar.written(), bytes().fill(8, 0xFF).all);
            EXPECT_EQ(array.copy(nullptr, array_of(type), mode, 2), 0);
            EXPECT_EQ(array.copy(nullptr, array_of(type), mode, 2), 0);
            EXPECT_EQ(array.written(), cell(bytes().u32(8)) + bytes().u32(2, 0).fill(16, 0xFF).all);
        }
}

TEST(SerialTexts, CannotBeNarrowed) {
    std::string data = bytes().u32(3).text("xyz").all;
    vx_value_t in = {.ptr_char = data.data()};
    for (vx_data_type_t type : {VX_CHAR_PTR, VX_BINARY_PTR}) {
        serial scalar, array;
        EXPECT_EQ(scalar.copy(&in, type, TYPE_16), -1);
        EXPECT_EQ(scalar.written(), cell(bytes()));
        EXPECT_EQ(array.copy(&in, array_of(type), TYPE_16, 1), -1);
        EXPECT_EQ(array.added(), bytes().u32(1, 0).u64(0).all);
    }
}

/* ---- Handles, no value, refusals ------------------------------------------------------------------------------- */

TEST(SerialHandles, AreZeroWhateverTheValueAndTheMode) {
    vx_resource_handle_t handle = {1, {2, 3, 4, 5}};
    vx_value_t in = {.ptr_rsrc_handle = &handle}, *no_value = nullptr;
    for (int mode : ALL_MODES)
        for (const vx_value_t *given : {&in, no_value}) {
            serial scalar, array;
            EXPECT_EQ(scalar.copy(given, VX_RSRC_HANDLE_PTR, mode), 0) << mode;
            EXPECT_EQ(scalar.written(), cell(bytes().u32(8)) + std::string(24, '\0')) << mode;
            EXPECT_EQ(array.copy(given, VX_RSRC_HANDLE_PTR_ARRAY, mode, 1), 0) << mode;
            EXPECT_EQ(array.written(), cell(bytes().u32(8)) + bytes().u32(1, 0, 24, 0).fill(24).all) << mode;
        }
}

TEST(SerialNothing, IsWrittenForTheTypeWithoutAValue) {
    vx_value_t in = {.val_uint64 = 7};
    for (int mode : ALL_MODES) {
        serial s;
        EXPECT_EQ(s.copy(&in, VX_NONE, mode), 0) << mode;
        EXPECT_EQ(s.written(), cell(bytes())) << mode;
    }
}

TEST(SerialRefusals, StructuredTypesAreFatal) {
    for (auto [type, text] : {std::pair(VX_SD_PTR, "copy_this_type: this function does not handle SD type"),
                              {VX_SD_PTR_ARRAY, "copy_this_type: this function does not handle SD ARRAY type"},
                              {VX_SBS_PTR, "VX_SBS_TYPE not supported"}})
        for (int mode : ALL_MODES) {
            serial s;
            s.cx.source.linenum = 7;
            auto end = ending_of([&, refused = type] { s.copy(nullptr, refused, mode, 1); });
            EXPECT_EQ(end, (ending{text, 0, 1})) << mode;
            EXPECT_EQ(s.added(), "") << mode;
        }
}

TEST(SerialRefusals, UnknownTypes) {
    vx_value_t in = {.val_uint64 = 7};
    for (vx_uint32_t code : {0U, 23U, 24U, 40U, 0x80000000U, 0xFFFFFFFFU})
        for (int mode : ALL_MODES) {
            serial s;
            EXPECT_EQ(s.copy(&in, type_of_code(code), mode, 1), -1) << code;
            EXPECT_EQ(s.written(), cell(bytes())) << code;
        }
}

TEST(SerialRefusals, UnknownModes) {
    std::string data = bytes().u32(3).text("xyz").all;
    vx_value_t in = {.ptr_char = data.data()};
    for (int mode : {-1, 0, 8, 100})
        for (vx_uint32_t code = VX_INT32; code <= VX_BINARY_PTR; ++code) {
            SCOPED_TRACE(testing::Message() << "type " << code << ", mode " << mode);
            serial scalar, array;
            EXPECT_EQ(scalar.copy(&in, type_of_code(code), mode), -1);
            EXPECT_EQ(scalar.written(), cell(bytes()));
            EXPECT_EQ(array.copy(&in, type_of_code(code + 11), mode, 1), -1);
            EXPECT_EQ(array.added(), bytes().u32(1, 0).u64(0).all); /* counted all the same */
        }
}

TEST(SerialRefusals, NoTextToCopy) {
    for (vx_data_type_t type : {VX_CHAR_PTR, VX_BINARY_PTR}) {
        serial s;
        EXPECT_EQ(s.copy(nullptr, type, TYPE_SAME), -1);
        EXPECT_EQ(s.written(), cell(bytes()));
    }
}

const ending null_array = {"Attempt to write NULL array", 0, 1};

TEST(SerialRefusals, ArraysWithoutCapacityAreFatal) {
    serial s;
    s.cx.source.linenum = 7;
    for (vx_uint32_t code = VX_INT32_ARRAY; code < VX_SD_PTR_ARRAY; ++code)
        EXPECT_EQ(ending_of([&] { s.copy(nullptr, type_of_code(code), DFLT_DEFAULT, 0); }), null_array) << code;
    tbl_anchor a, b;
    EXPECT_EQ(ending_of([&] { init_array(s.cx, &s.strings, &a, 0, &s.out); }), null_array);
    EXPECT_EQ(ending_of([&] { init_array_sd(s.cx, &s.strings, &a, &b, 0, 1, &s.out); }), null_array);
    EXPECT_EQ(s.written(), cell(bytes()));
}

/* ---- Arrays ---------------------------------------------------------------------------------------------------- */

TEST(SerialArrays, TakeAnElementACall) {
    serial s;
    for (vx_uint32_t n : {11U, 22U, 33U}) {
        vx_value_t in = {.val_uint32 = n};
        EXPECT_EQ(s.copy(&in, VX_UINT32_ARRAY, TYPE_SAME, 3), 0);
    }
    EXPECT_EQ(s.written(), cell(bytes().u32(8)) + bytes().u32(3, 0, 11, 0, 22, 0, 33, 0).all);
}

TEST(SerialArrays, CellGetsTheOffsetOnce) {
    serial s;
    EXPECT_EQ(s.copy(nullptr, VX_INT32_ARRAY, R_HI_DEFAULT, 2), 0);
    memset(&s.out, OLD, sizeof s.out);
    EXPECT_EQ(s.copy(nullptr, VX_INT32_ARRAY, R_HI_DEFAULT, 2), 0);
    EXPECT_EQ(s.written(), cell(bytes()) + bytes().u32(2, 0, 100, 0, 100, 0).all);
}

TEST(SerialArrays, EmptyAnchorBeginsAnother) {
    serial s;
    EXPECT_EQ(s.copy(nullptr, VX_INT64_ARRAY, R_HI_DEFAULT, 1), 0);
    s.anchors.array.reset();
    EXPECT_EQ(s.copy(nullptr, VX_FLOAT64_ARRAY, R_HI_DEFAULT, 1), 0);
    EXPECT_EQ(s.written(), cell(bytes().u32(24)) + bytes().u32(1, 0).u64(100).u32(1, 0).f64(100).all);
}

TEST(SerialArrays, AreFilledWhileTheirTableGrows) {
    serial s;
    std::string expected = bytes().u32(3, 0, 40, 0, 104, 0, 168, 0).all;
    for (char letter : {'a', 'b', 'c'}) {
        std::string text(60, letter);
        vx_value_t in = {.ptr_char = text.data()};
        EXPECT_EQ(s.copy(&in, VX_CHAR_PTR_ARRAY, TYPE_SAME, 3), 0);
        expected += text + std::string(4, '\0');
    }
    EXPECT_EQ(s.added(), expected);
}

/* ---- Containers ------------------------------------------------------------------------------------------------ */

TEST(Containers, ArrayHasRoomForItsCapacity) {
    for (vx_uint32_t capacity : {1U, 2U, 5U}) {
        serial s;
        EXPECT_EQ(init_array(s.cx, &s.strings, &s.anchors.array, capacity, &s.out), 16U);
        EXPECT_EQ(s.anchors.array, 8U);
        EXPECT_EQ(s.written(), cell(bytes().u32(8)) + bytes().u32(1, 0).fill(size_t{8} * capacity).all);
        EXPECT_EQ(init_array(s.cx, &s.strings, &s.anchors.array, capacity, &s.out), 24U);
    }
}

TEST(Containers, StructureHasRoomForItsElements) {
    for (vx_uint32_t count : {1U, 2U, 5U}) {
        serial s;
        EXPECT_EQ(init_scalar_sd(s.cx, &s.strings, &s.anchors.sd_element, count, &s.out), 16U);
        EXPECT_EQ(s.anchors.sd_element, 8U);
        EXPECT_EQ(s.written(), cell(bytes().u32(8)) + bytes().u32(1, 0).fill(size_t{16} * count).all);
        EXPECT_EQ(init_scalar_sd(s.cx, &s.strings, &s.anchors.sd_element, count, &s.out), 32U);
    }
}

TEST(Containers, StructureWithoutElementsIsAlwaysAFreshOne) {
    serial s;
    EXPECT_EQ(init_scalar_sd(s.cx, &s.strings, &s.anchors.sd_element, 0, &s.out), 8U);
    EXPECT_EQ(init_scalar_sd(s.cx, &s.strings, &s.anchors.sd_element, 0, &s.out), 32U);
    EXPECT_EQ(s.anchors.sd_element, 32U);
    EXPECT_EQ(s.written(), cell(bytes().u32(32)) + std::string(48, '\0'));
}

TEST(Containers, ArrayOfStructuresHoldsOneWhateverItsCapacity) {
    serial s;
    auto *array = &s.anchors.sd_array, *structure = &s.anchors.sd_element;
    EXPECT_EQ(init_array_sd(s.cx, &s.strings, array, structure, 3, 2, &s.out), 48U);
    EXPECT_EQ(init_array_sd(s.cx, &s.strings, array, structure, 3, 2, &s.out), 64U);
    EXPECT_EQ(s.written(), cell(bytes().u32(8)) + bytes().u32(1, 0, 40).fill(20).u32(2, 0).fill(32).all);
}

/* ---- Structured data ------------------------------------------------------------------------------------------- */

/* The default of an element: its value cell, where what it refers to comes next, and that. */
struct element_row {
    vx_data_type_t type;
    int mode;
    bytes value, appended;
};

const bytes at_next = bytes().u32(32);

const element_row elements[] = {
    {VX_NONE, DFLT_DEFAULT, bytes(), bytes()},
    {VX_INT32, DFLT_DEFAULT, bytes().u32(0), bytes()},
    {VX_UINT32, R_HI_DEFAULT, bytes().u32(100), bytes()},
    {VX_INT64, R_HI_DEFAULT, bytes().u64(100), bytes()},
    {VX_UINT64, INIT_DEFAULT, bytes().u64(0), bytes()},
    {VX_FLOAT32, R_HI_DEFAULT, bytes().f32(100), bytes()},
    {VX_FLOAT64, R_LO_DEFAULT, bytes().f64(0), bytes()},
    {VX_CHAR_PTR, DFLT_DEFAULT, at_next, bytes().fill(8)},
    {VX_CHAR_PTR, R_LO_DEFAULT, bytes().fill(8, 0xFF), bytes()},
    {VX_BINARY_PTR, INIT_DEFAULT, at_next, bytes().fill(8)},
    {VX_BINARY_PTR, TYPE_INIT, bytes().fill(8, 0xFF), bytes()},
    {VX_RSRC_HANDLE_PTR, DFLT_DEFAULT, at_next, bytes().fill(24)},
    {VX_INT32_ARRAY, R_HI_DEFAULT, at_next, bytes().u32(1, 0, 100, 0)},
    {VX_UINT32_ARRAY, DFLT_DEFAULT, at_next, bytes().u32(1, 0).u64(0)},
    {VX_INT64_ARRAY, INIT_DEFAULT, at_next, bytes().u32(1, 0).u64(0)},
    {VX_UINT64_ARRAY, R_HI_DEFAULT, at_next, bytes().u32(1, 0).u64(100)},
    {VX_FLOAT32_ARRAY, R_HI_DEFAULT, at_next, bytes().u32(1, 0).f32(100).u32(0)},
    {VX_FLOAT64_ARRAY, R_HI_DEFAULT, at_next, bytes().u32(1, 0).f64(100)},
    {VX_CHAR_PTR_ARRAY, DFLT_DEFAULT, at_next, bytes().u32(1, 0, 48, 0).fill(8)},
    {VX_CHAR_PTR_ARRAY, TYPE_INIT, at_next, bytes().u32(1, 0).fill(8, 0xFF)},
    {VX_BINARY_PTR_ARRAY, INIT_DEFAULT, at_next, bytes().u32(1, 0, 48, 0).fill(16)},
    {VX_RSRC_HANDLE_PTR_ARRAY, DFLT_DEFAULT, at_next, bytes().u32(1, 0, 48, 0).fill(24)},
};

TEST(StructuredData, ElementHasItsTypesDefault) {
    for (const element_row &row : elements) {
        SCOPED_TRACE(testing::Message() << "type " << row.type << ", mode " << row.mode);
        serial s;
        EXPECT_EQ(s.copy_sd(row.type, row.mode, 1), 0);
        bytes structure = bytes().u32(1, 0, row.type, 0).text(pad8(row.value)).text(row.appended.all);
        EXPECT_EQ(s.written(), cell(bytes().u32(8)) + structure.all);
    }
}

TEST(StructuredData, ElementsFollowOneAnotherWhileTheirTableGrows) {
    serial s;
    EXPECT_EQ(s.copy_sd(VX_RSRC_HANDLE_PTR, DFLT_DEFAULT, 3), 0);
    EXPECT_EQ(s.copy_sd(VX_INT64, R_HI_DEFAULT, 3), 0);
    EXPECT_EQ(s.copy_sd(VX_CHAR_PTR_ARRAY, DFLT_DEFAULT, 3), 0);
    EXPECT_EQ(
        s.written(),
        cell(bytes().u32(8)) +
            bytes().u32(3, 0, 10, 0, 64, 0, 4, 0).u64(100).u32(19, 0, 88, 0).fill(24).u32(1, 0, 104, 0).fill(8).all);
}

TEST(StructuredData, ArrayHoldsOneStructure) {
    serial s;
    EXPECT_EQ(s.copy_sd(VX_CHAR_PTR, INIT_DEFAULT, 2, VX_SD_PTR_ARRAY), 0);
    EXPECT_EQ(s.copy_sd(VX_UINT32, R_HI_DEFAULT, 2, VX_SD_PTR_ARRAY), 0);
    EXPECT_EQ(s.written(),
              cell(bytes().u32(8)) + bytes().u32(1, 0, 24, 0, 2, 0, 8, 0, 64, 0, 3, 0, 100, 0).fill(8).all);
}

TEST(StructuredData, MayHaveNoElements) {
    serial scalar, array;
    EXPECT_EQ(scalar.copy_sd(VX_UNKNOWN, 0, 0), 0);
    EXPECT_EQ(scalar.added(), std::string(24, '\0'));
    EXPECT_EQ(array.copy_sd(VX_UNKNOWN, 0, 0, VX_SD_PTR_ARRAY), 0);
    EXPECT_EQ(array.added(), bytes().u32(1, 0, 24, 0).fill(24).all);
}

TEST(StructuredData, RefusedElementIsCountedAndTyped) {
    for (auto [type, mode] : {std::pair(VX_UNKNOWN, DFLT_DEFAULT),
                              {type_of_code(23), DFLT_DEFAULT},
                              {VX_INT32, TYPE_SAME},
                              {VX_FLOAT32, TYPE_16}}) {
        serial s;
        EXPECT_EQ(s.copy_sd(type, mode, 1), -1) << type;
        EXPECT_EQ(s.added(), bytes().u32(1, 0, type, 0).u64(0).all) << type;
    }
}

TEST(StructuredData, OtherTypesAreFatal) {
    for (vx_uint32_t code = 0; code < 25; ++code) {
        serial s;
        s.cx.source.linenum = 7;
        auto end = ending_of([&] { s.copy_sd(VX_INT32, DFLT_DEFAULT, 1, type_of_code(code)); });
        bool structured = code == VX_SD_PTR || code == VX_SD_PTR_ARRAY;
        EXPECT_EQ(end.has_value(), !structured) << code;
        EXPECT_EQ(end.value_or(ending{}).text, structured ? "" : "copy_this_sd_type: only SD types allowed") << code;
        EXPECT_EQ(end.value_or(ending{}).code, structured ? 0 : 1) << code;
    }
}

/* ---- Collected values ------------------------------------------------------------------------------------------ */

/* Serialises values as one, as the end of a stanza does. */
void dump(serial &s, vx_data_type_t type, std::initializer_list<vx_uint32_t> values) {
    dflt_tbl collected{std::make_shared<dflt_values>("DefaultValues"), values.size()};
    for (vx_uint32_t n : values) {
        vx_value_t value = {.val_uint32 = n};
        memcpy(alloc_tble(s.cx, &collected.tbl->cells, sizeof value), &value, sizeof value);
    }
    dump_dflt(s.cx, &s.strings, &collected, &s.out, type);
}

TEST(SerialCollections, FillAnArray) {
    serial s;
    dump(s, VX_INT32_ARRAY, {1, 2});
    EXPECT_EQ(s.written(), cell(bytes().u32(8)) + bytes().u32(2, 0, 1, 0, 2, 0).all);
}

TEST(SerialCollections, LastOneWinsForAScalar) {
    serial s;
    dump(s, VX_INT32, {1, 2});
    EXPECT_EQ(s.written(), cell(bytes().u32(2)));
}

TEST(SerialCollections, NoneLeaveTheCellAlone) {
    for (vx_data_type_t type : {VX_INT32, VX_INT32_ARRAY, VX_SD_PTR, VX_SD_PTR_ARRAY}) {
        serial s;
        dump(s, type, {});
        EXPECT_EQ(s.written(), cell(bytes()));
    }
}

TEST(SerialCollections, ElementTypesMakeAStructure) {
    for (int sd_attr_type : {0, 1}) {
        serial scalar, array;
        scalar.cx.sd.announce(nullptr, nullptr, nullptr, sd_attr_type);
        array.cx.sd.announce(nullptr, nullptr, nullptr, sd_attr_type);
        dump(scalar, VX_SD_PTR, {VX_INT32, VX_CHAR_PTR});
        EXPECT_EQ(scalar.added(), bytes().u32(2, 0, 2).fill(12).u32(8, 0, 48, 0).fill(8).all);
        dump(array, VX_SD_PTR_ARRAY, {VX_INT32_ARRAY, VX_UINT64_ARRAY});
        bytes expected = bytes().u32(1, 0, 24, 0, 2, 0);
        expected.u32(13, 0, 64, 0, 16, 0, 80, 0);
        EXPECT_EQ(array.added(), expected.u32(1).fill(12).u32(1).fill(12).all);
    }
}

TEST(SerialCollections, ThatCannotBeCopiedAreFatal) {
    serial s;
    s.cx.source.linenum = 7;
    auto end = [&](vx_data_type_t type) { return ending_of([&] { dump(s, type, {VX_UNKNOWN}); }); };
    EXPECT_EQ(end(VX_UNKNOWN), (ending{"dump_dflt: copy_this_type error", 7, 1}));
    EXPECT_EQ(end(VX_SD_PTR), (ending{"dump_dflt: copy_this_sd_type default error", 7, 1}));
    s.cx.sd.announce(nullptr, nullptr, nullptr, 1);
    EXPECT_EQ(end(VX_SD_PTR_ARRAY), (ending{"dump_dflt: copy_this_sd_type init error", 7, 1}));
}

/* ---- Pools of texts -------------------------------------------------------------------------------------------- */

TEST(Pools, GiveZeroedBytesAlignedForAnyValue) {
    text_pool pool;
    for (int round = 0; round < 2; ++round, pool.clear())
        for (size_t n : {1U, 3U, 8U, 13U, 1000U, 1024U, 1025U, 5000U, 7U}) {
            char *taken = pool.take(n);
            EXPECT_EQ(reinterpret_cast<std::uintptr_t>(taken) % alignof(vx_value_t), 0U) << n;
            EXPECT_EQ(bytes_at(taken, n), std::string(n, '\0')) << n;
            memset(taken, 0xEE, n);
        }
}

TEST(Pools, KeepWhatIsTakenUntilTheyAreCleared) {
    text_pool pool;
    char *all[200];
    for (unsigned char i = 0; i < 200; ++i)
        memset(all[i] = pool.take(i * 20U + 1), i, i * 20U + 1);
    for (unsigned char i = 0; i < 200; ++i)
        EXPECT_EQ(bytes_at(all[i], i * 20U + 1), bytes().fill(i * 20U + 1, i).all);
}

TEST(Pools, UseTheLatestChunkAgain) {
    text_pool pool;
    pool.clear(); /* nothing to give back */
    char *small = pool.take(8);
    pool.clear();
    EXPECT_EQ(pool.take(8), small);
    char *large = pool.take(5000);
    pool.clear();
    EXPECT_EQ(pool.take(8), large);
    EXPECT_EQ(pool.take(4992), large + 8); /* all of its room */
    EXPECT_NE(pool.take(8), large + 5000); /* and no more */
    dflt_values values("DefaultValues");
    char *text = values.texts.take(8);
    values.restart("VX_SD_PTR");
    EXPECT_EQ(values.texts.take(8), text);
}

TEST(Pools, GiveBackFromAnAddress) {
    text_pool pool;
    char *kept = pool.take(16);
    char *first = pool.take(3000); /* in the second chunk */
    memset(kept, 'k', 16);
    for (int round = 0; round < 2; ++round) {
        memset(pool.take(1'000'000), 'x', 1'000'000);
        pool.take(100'000);
        pool.give_back_from(first);
        EXPECT_EQ(pool.take(2000), first);
        EXPECT_EQ(bytes_at(first, 2000), std::string(2000, '\0'));
    }
    EXPECT_EQ(bytes_at(kept, 16), std::string(16, 'k'));
    pool.give_back_from(kept);
    EXPECT_EQ(pool.take(8), kept);
}

TEST(Pools, GiveBackBeforeAnAddress) {
    text_pool pool;
    std::vector<char *> all;
    for (size_t i = 0; i < 1000; ++i)
        memset(all.emplace_back(pool.take(1000)), static_cast<char>(i), 1000);
    for (size_t from : {400U, 400U, 999U}) {
        pool.give_back_before(all[from]);
        for (size_t i = from; i < 1000; ++i)
            EXPECT_EQ(bytes_at(all[i], 1000), std::string(1000, static_cast<char>(i)));
    }
    EXPECT_EQ(pool.take(8), all[999] + 1000);
}

TEST(Pools, SayWhenThereIsNoMemory) {
    text_pool pool;
    char *taken = pool.take(8);
    EXPECT_EQ(pool.take(static_cast<size_t>(sizeof(size_t) > 4 ? uint64_t{1} << 62 : 0xF000'0000)), nullptr);
    EXPECT_EQ(pool.take(8), taken + 8); /* and go on */
}

} // namespace
