/* The reversal of fields, values and lists. */

#include "compiler/cdgen_swap.h"

#include "compiler/image_fixture.h"

namespace {

using namespace by_hand;

using bytes = std::vector<unsigned char>;

TEST(SwapAny, ReversesTwoFourAndEightBytesOnly) {
    const struct {
        size_t width;
        bytes expected;
    } rows[] = {
        {0, {1, 2, 3, 4, 5, 6, 7, 8, 9}}, {1, {1, 2, 3, 4, 5, 6, 7, 8, 9}}, {2, {2, 1, 3, 4, 5, 6, 7, 8, 9}},
        {3, {1, 2, 3, 4, 5, 6, 7, 8, 9}}, {4, {4, 3, 2, 1, 5, 6, 7, 8, 9}}, {5, {1, 2, 3, 4, 5, 6, 7, 8, 9}},
        {6, {1, 2, 3, 4, 5, 6, 7, 8, 9}}, {7, {1, 2, 3, 4, 5, 6, 7, 8, 9}}, {8, {8, 7, 6, 5, 4, 3, 2, 1, 9}},
        {9, {1, 2, 3, 4, 5, 6, 7, 8, 9}},
    };
    for (const auto &row : rows) {
        bytes field = {1, 2, 3, 4, 5, 6, 7, 8, 9};
        swap_any(reinterpret_cast<char *>(field.data()), row.width);
        EXPECT_EQ(field, row.expected) << row.width;
    }
}

TEST(SwapValue, CellIsReversedByItsType) {
    const bytes as_it_was = {0x01, 0x02, 0x03, 0x04, 0xAA, 0xBB, 0xCC, 0xDD};
    const bytes first_word = {0x04, 0x03, 0x02, 0x01, 0xAA, 0xBB, 0xCC, 0xDD};
    const bytes whole = {0xDD, 0xCC, 0xBB, 0xAA, 0x04, 0x03, 0x02, 0x01};
    const struct {
        vx_uint32_t type;
        const bytes &expected;
    } rows[] = {
        {VX_UNKNOWN, as_it_was},
        {VX_NONE, as_it_was},
        {VX_INT32, first_word},
        {VX_UINT32, first_word},
        {VX_INT64, whole},
        {VX_UINT64, whole},
        {VX_FLOAT32, first_word},
        {VX_FLOAT64, whole},
        {VX_CHAR_PTR, first_word},
        {VX_BINARY_PTR, first_word},
        {VX_RSRC_HANDLE_PTR, first_word},
        {VX_SD_PTR, first_word},
        {VX_SBS_PTR, as_it_was},
        {VX_INT32_ARRAY, first_word},
        {VX_UINT32_ARRAY, first_word},
        {VX_INT64_ARRAY, first_word},
        {VX_UINT64_ARRAY, first_word},
        {VX_FLOAT32_ARRAY, first_word},
        {VX_FLOAT64_ARRAY, first_word},
        {VX_CHAR_PTR_ARRAY, first_word},
        {VX_BINARY_PTR_ARRAY, first_word},
        {VX_RSRC_HANDLE_PTR_ARRAY, first_word},
        {VX_SD_PTR_ARRAY, first_word},
        {23, as_it_was},
        {0x80000002, as_it_was},
        {0xFFFFFFFF, as_it_was},
    };
    for (const auto &row : rows) {
        bytes cell = as_it_was;
        swap_area nothing(nullptr, 0);
        swap_value(reinterpret_cast<char *>(cell.data()), vx_data_type_t(row.type), nothing);
        EXPECT_EQ(cell, row.expected) << row.type;
    }
}

/* A cell and the string table that it refers into. */
struct cell_and_strings {
    explicit cell_and_strings(size_t size) : cell(8), strings(size) {}

    void swap(vx_uint32_t type) {
        swap_area area(strings.at(0), strings.bytes.size());
        swap_value(cell.at(0), vx_data_type_t(type), area);
    }

    image cell;
    image strings;
};

TEST(SwapValue, OutOfLineValueIsReversedWithItsCell) {
    for (size_t block : {size_t{0}, VALUES_SIZE})
        for (const value_row &row : value_rows) {
            SCOPED_TRACE(row.name);
            cell_and_strings given(2 * VALUES_SIZE);
            put_values(given.strings, 0, block);
            put_cell(given.cell, 0, row, block);
            cell_and_strings expected = given;
            expected.cell.turn(0, row.width);
            expected.strings.turn(row.beyond, block);
            given.swap(row.type);
            EXPECT_TRUE(same(expected.cell, given.cell));
            EXPECT_TRUE(same(expected.strings, given.strings));
        }
}

constexpr vx_uint32_t out_of_line_types[] = {
    VX_CHAR_PTR,       VX_BINARY_PTR,       VX_RSRC_HANDLE_PTR,       VX_SD_PTR,        VX_INT32_ARRAY,
    VX_UINT32_ARRAY,   VX_INT64_ARRAY,      VX_UINT64_ARRAY,          VX_FLOAT32_ARRAY, VX_FLOAT64_ARRAY,
    VX_CHAR_PTR_ARRAY, VX_BINARY_PTR_ARRAY, VX_RSRC_HANDLE_PTR_ARRAY, VX_SD_PTR_ARRAY};

TEST(SwapValue, NoneAndUnfilledCellsAreNotFollowed) {
    for (vx_uint32_t offset : {NONE, vx_uint32_t{0}})
        for (vx_uint32_t type : out_of_line_types) {
            SCOPED_TRACE(type);
            cell_and_strings given(64);
            given.cell.u32(0, offset);
            given.strings.u32(0, 1); /* would do as a length or a count */
            cell_and_strings expected = given;
            given.swap(type);
            EXPECT_TRUE(same(expected.cell, given.cell));
            EXPECT_TRUE(same(expected.strings, given.strings));
        }
}

/* A value that is partly outside the string table, or that is out of line. */
struct edge_row {
    const char *what;
    vx_uint32_t type;
    size_t size; /* of the string table */
    vx_uint32_t offset;
    vx_uint32_t length; /* the contents at the offset */
};

void put_edge(cell_and_strings &given, const edge_row &row) {
    given.cell.u32(0, row.offset);
    if (row.offset <= 44)
        given.strings.u32(row.offset, row.length);
}

TEST(SwapValue, ReferenceThatIsNotAllInsideIsNotFollowedButReversed) {
    const edge_row rows[] = {
        {"binary after the end", VX_BINARY_PTR, 16, 16, 3},
        {"binary whose length is cut off", VX_BINARY_PTR, 19, 16, 3},
        {"binary far outside", VX_BINARY_PTR, 48, 0x7FFFFFF8, 0},
        {"binary at the last offset", VX_BINARY_PTR, 48, 0xFFFFFFFC, 0},
        {"binary at 9", VX_BINARY_PTR, 48, 9, 3},
        {"binary at 10", VX_BINARY_PTR, 48, 10, 3},
        {"binary at 11", VX_BINARY_PTR, 48, 11, 3},
        {"array after the end", VX_INT32_ARRAY, 8, 8, 1},
        {"array whose head is cut off", VX_INT32_ARRAY, 15, 8, 0},
        {"array whose elements are cut off", VX_INT32_ARRAY, 31, 8, 2},
        {"array of more elements than 32 bits of bytes", VX_INT64_ARRAY, 48, 8, 0x20000001},
        {"array of the largest count", VX_INT64_ARRAY, 48, 8, 0xFFFFFFFF},
        {"array at 10", VX_CHAR_PTR_ARRAY, 48, 10, 1},
        {"structured data after the end", VX_SD_PTR, 8, 8, 1},
        {"structured data whose head is cut off", VX_SD_PTR, 15, 8, 0},
        {"structured data whose elements are cut off", VX_SD_PTR, 31, 8, 1},
        {"structured data of the largest count", VX_SD_PTR, 48, 8, 0xFFFFFFFF},
        {"structured data at 9", VX_SD_PTR, 48, 9, 1},
    };
    for (const edge_row &row : rows) {
        SCOPED_TRACE(row.what);
        cell_and_strings given(48);
        put_edge(given, row);
        cell_and_strings expected = given;
        expected.cell.turn(0, 4);
        swap_area area(given.strings.at(0), row.size);
        swap_value(given.cell.at(0), vx_data_type_t(row.type), area);
        EXPECT_TRUE(same(expected.cell, given.cell));
        EXPECT_TRUE(same(expected.strings, given.strings));
    }
}

TEST(SwapValue, ValueThatJustFitsIsFollowed) {
    const struct {
        edge_row edge;
        numbers turned;
    } rows[] = {
        {{"binary", VX_BINARY_PTR, 20, 16, 3}, {{16, 4}}},
        {{"binary longer than the table", VX_BINARY_PTR, 20, 16, 0xFFFFFF00}, {{16, 4}}},
        {{"binary at 12", VX_BINARY_PTR, 48, 12, 3}, {{12, 4}}},
        {{"array", VX_INT32_ARRAY, 32, 8, 2}, {{8, 4}, {16, 4}, {24, 4}}},
        {{"array at 12", VX_INT64_ARRAY, 36, 12, 2}, {{12, 4}, {20, 8}, {28, 8}}},
        {{"array without elements", VX_INT32_ARRAY, 16, 8, 0}, {}},
        {{"structured data without elements", VX_SD_PTR, 16, 8, 0}, {}},
    };
    for (const auto &row : rows) {
        SCOPED_TRACE(row.edge.what);
        cell_and_strings given(48);
        put_edge(given, row.edge);
        cell_and_strings expected = given;
        expected.cell.turn(0, 4);
        expected.strings.turn(row.turned);
        swap_area area(given.strings.at(0), row.edge.size);
        swap_value(given.cell.at(0), vx_data_type_t(row.edge.type), area);
        EXPECT_TRUE(same(expected.cell, given.cell));
        EXPECT_TRUE(same(expected.strings, given.strings));
    }
}

TEST(SwapValue, StructuredDataThatJustFitsIsFollowed) {
    cell_and_strings given(32);
    given.cell.u32(0, 8);
    given.strings.u32(8, 1).u32(16, VX_FLOAT64);
    cell_and_strings expected = given;
    expected.cell.turn(0, 4);
    expected.strings.turn({{8, 4}, {16, 4}, {24, 8}});
    given.swap(VX_SD_PTR);
    EXPECT_TRUE(same(expected.cell, given.cell));
    EXPECT_TRUE(same(expected.strings, given.strings));
}

TEST(SwapValue, SharedValueIsReversedOnce) {
    for (const value_row &row : value_rows) {
        SCOPED_TRACE(row.name);
        image cells(16), strings(VALUES_SIZE);
        put_values(strings, 0, 0);
        put_cell(cells, 0, row, 0);
        put_cell(cells, 8, row, 0);
        image expected_cells = cells, expected_strings = strings;
        expected_cells.turn(0, row.width).turn(8, row.width);
        expected_strings.turn(row.beyond);
        swap_area area(strings.at(0), VALUES_SIZE);
        swap_value(cells.at(0), vx_data_type_t(row.type), area);
        swap_value(cells.at(8), vx_data_type_t(row.type), area);
        EXPECT_TRUE(same(expected_cells, cells));
        EXPECT_TRUE(same(expected_strings, strings));
    }
}

TEST(SwapValue, ElementsOfStructuredDataAreReversedByTheirTypes) {
    constexpr size_t SD = VALUES_SIZE; /* of two elements */
    for (const value_row &row : value_rows) {
        SCOPED_TRACE(row.name);
        cell_and_strings given(2 * VALUES_SIZE);
        put_values(given.strings, 0, 0);
        given.cell.u32(0, SD);
        given.strings.u32(SD, 2).u32(SD + 8, row.type).u32(SD + 24, VX_UINT64);
        put_cell(given.strings, SD + 16, row, 0);
        cell_and_strings expected = given;
        expected.cell.turn(0, 4);
        expected.strings.turn({{SD, 4}, {SD + 8, 4}, {SD + 16, row.width}, {SD + 24, 4}, {SD + 32, 8}});
        expected.strings.turn(row.beyond);
        given.swap(VX_SD_PTR);
        EXPECT_TRUE(same(expected.cell, given.cell));
        EXPECT_TRUE(same(expected.strings, given.strings));
    }
}

TEST(SwapValue, ValuesInsideValuesAreFollowed) {
    cell_and_strings given(112);
    given.cell.u32(0, 8);
    given.strings.u32(8, 1).u32(16, 24); /* an array of one structured value */
    given.strings.u32(24, 2);            /* with two elements: */
    given.strings.u32(32, VX_BINARY_PTR_ARRAY).u32(40, 64).u32(48, VX_INT64_ARRAY).u32(56, 80);
    given.strings.u32(64, 1).u32(72, 96); /* an array of one binary, which has 5 bytes, */
    given.strings.u32(96, 5);
    given.strings.u32(80, 1); /* and an array of one number */
    cell_and_strings expected = given;
    expected.cell.turn(0, 4);
    expected.strings.turn({{8, 4}, {16, 4}, {24, 4}, {32, 4}, {40, 4}, {48, 4}, {56, 4}});
    expected.strings.turn({{64, 4}, {72, 4}, {96, 4}, {80, 4}, {88, 8}});
    given.swap(VX_SD_PTR_ARRAY);
    EXPECT_TRUE(same(expected.cell, given.cell));
    EXPECT_TRUE(same(expected.strings, given.strings));
}

TEST(SwapValue, StructuredDataInsideItselfIsReversedOnce) {
    cell_and_strings given(32);
    given.cell.u32(0, 8);
    given.strings.u32(8, 1).u32(16, VX_SD_PTR).u32(24, 8);
    cell_and_strings expected = given;
    expected.cell.turn(0, 4);
    expected.strings.turn({{8, 4}, {16, 4}, {24, 4}});
    given.swap(VX_SD_PTR);
    EXPECT_TRUE(same(expected.cell, given.cell));
    EXPECT_TRUE(same(expected.strings, given.strings));
}

/* Structured data, each the one element of the one before, at 8, 32, 56... */
cell_and_strings chain(size_t links) {
    cell_and_strings made(8 + 24 * links);
    made.cell.u32(0, 8);
    for (size_t at = 8; at < 8 + 24 * links; at += 24)
        made.strings.u32(at, 1).u32(at + 8, VX_SD_PTR).u32(at + 16, static_cast<vx_uint32_t>(at + 24));
    return made;
}

TEST(SwapValue, NestingIsFollowed64DeepAndNoFarther) {
    for (size_t links : {size_t{3}, size_t{64}, size_t{65}, size_t{50000}}) {
        SCOPED_TRACE(links);
        cell_and_strings given = chain(links), expected = given;
        expected.cell.turn(0, 4);
        for (size_t at = 8; at < 8 + 24 * std::min<size_t>(links, 64); at += 24)
            expected.strings.turn({{0, 4}, {8, 4}, {16, 4}}, at);
        given.swap(VX_SD_PTR);
        EXPECT_TRUE(same(expected.cell, given.cell));
        EXPECT_TRUE(same(expected.strings, given.strings));
    }
}

TEST(SwapValue, ValuesSideBySideAreNotNested) {
    constexpr size_t COUNT = 100; /* more than may be inside each other */
    cell_and_strings given(8 + 8 + 8 * COUNT + 8 * COUNT);
    size_t binaries = 16 + 8 * COUNT;
    given.cell.u32(0, 8);
    given.strings.u32(8, COUNT);
    for (size_t i = 0; i < COUNT; ++i)
        given.strings.u32(16 + 8 * i, static_cast<vx_uint32_t>(binaries + 8 * i));
    cell_and_strings expected = given;
    expected.cell.turn(0, 4);
    expected.strings.turn(8, 4);
    for (size_t i = 0; i < COUNT; ++i)
        expected.strings.turn({{16 + 8 * i, 4}, {binaries + 8 * i, 4}});
    given.swap(VX_BINARY_PTR_ARRAY);
    EXPECT_TRUE(same(expected.strings, given.strings));
}

/* ---- Lists ----------------------------------------------------------------------------------------------------- */

TEST(SwapVarList, HeadAndEachEntryAreReversed) {
    for (vx_uint32_t count : {0u, 1u, 3u}) {
        SCOPED_TRACE(count);
        image list(40);
        list.u32(4, count);
        image expected = list;
        expected.turn(variety_list_head);
        for (size_t i = 0; i < count; ++i)
            expected.turn(variety_entry, 8 + 8 * i);
        swap_var_list(list.at(0));
        EXPECT_TRUE(same(expected, list));
    }
}

TEST(SwapValidVals, ValuesAreReversedByTheOwnersTypeForArraysByTheElements) {
    for (const value_row &row : value_rows) {
        SCOPED_TRACE(row.name);
        const value_row &value = valid_value_row(row.type);
        image list(56), strings(2 * VALUES_SIZE);
        put_values(strings, 0, 0);
        put_values(strings, 0, VALUES_SIZE);
        list.u32(4, 1);
        put_cell(list, 8, value, 0);
        put_cell(list, 16, value, VALUES_SIZE);
        image expected = list, expected_strings = strings;
        expected.turn(valid_values_head).turn(valid_values_entry, 8).turn(8, value.width).turn(16, value.width);
        expected_strings.turn(value.beyond).turn(value.beyond, VALUES_SIZE);
        swap_area area(strings.at(0), strings.bytes.size());
        swap_valid_vals(list.at(0), vx_data_type_t(row.type), area);
        EXPECT_TRUE(same(expected, list));
        EXPECT_TRUE(same(expected_strings, strings));
    }
}

TEST(SwapValidVals, EachEntryIsReversedAndNothingBehindThem) {
    for (vx_uint32_t count : {0u, 1u, 3u}) {
        SCOPED_TRACE(count);
        image list(8 + 24 * 4);
        list.u32(4, count);
        image expected = list;
        expected.turn(valid_values_head);
        for (size_t i = 0; i < count; ++i)
            expected.turn({{0, 8}, {8, 8}, {16, 2}}, 8 + 24 * i);
        swap_area nothing(nullptr, 0);
        swap_valid_vals(list.at(0), VX_INT64_ARRAY, nothing);
        EXPECT_TRUE(same(expected, list));
    }
}

/* ---- Structured-data definitions ------------------------------------------------------------------------------- */

void put_sd_element(image &to, size_t at, vx_uint32_t type, vx_uint32_t valid_vals) {
    to.u32(at + 8, type).u32(at + 16, valid_vals);
}

TEST(SwapSdDef, HeadAndEachElementAreReversed) {
    for (vx_uint32_t count : {0u, 1u, 3u}) {
        SCOPED_TRACE(count);
        image sd(8 + 32 * 4);
        sd.u32(4, count);
        for (size_t i = 0; i < count; ++i)
            put_sd_element(sd, 8 + 32 * i, VX_INT32, NONE);
        image expected = sd;
        expected.turn(sd_def_head);
        for (size_t i = 0; i < count; ++i)
            expected.turn(sd_element, 8 + 32 * i);
        swap_area nothing(nullptr, 0);
        swap_sd_def(sd.at(0), nothing, nothing);
        EXPECT_TRUE(same(expected, sd));
    }
}

TEST(SwapSdDef, ValidValuesAreReversedByTheElementsType) {
    for (const value_row &row : value_rows) {
        SCOPED_TRACE(row.name);
        const value_row &value = valid_value_row(row.type);
        image sd(72), lists(64), strings(VALUES_SIZE);
        put_values(strings, 0, 0);
        sd.u32(4, 2);
        put_sd_element(sd, 8, row.type, 32);
        put_sd_element(sd, 40, VX_INT64, 0); /* the first list is one like any other */
        lists.u32(4, 1).u32(36, 1);
        put_cell(lists, 40, value, 0);
        put_cell(lists, 48, value, 0);
        image expected = sd, expected_lists = lists, expected_strings = strings;
        expected.turn(sd_def_head).turn(sd_element, 8).turn(sd_element, 40);
        expected_lists.turn(valid_values_head).turn({{8, 8}, {16, 8}, {24, 2}});
        expected_lists.turn(valid_values_head, 32).turn({{40, value.width}, {48, value.width}, {56, 2}});
        expected_strings.turn(value.beyond);
        swap_area vvbase(lists.at(0), 64), sbase(strings.at(0), VALUES_SIZE);
        swap_sd_def(sd.at(0), vvbase, sbase);
        EXPECT_TRUE(same(expected, sd));
        EXPECT_TRUE(same(expected_lists, lists));
        EXPECT_TRUE(same(expected_strings, strings));
    }
}

TEST(SwapSdDef, SharedValidValuesAreReversedOnce) {
    image sd(72), lists(32);
    sd.u32(4, 2);
    put_sd_element(sd, 8, VX_INT32, 0);
    put_sd_element(sd, 40, VX_INT32, 0);
    lists.u32(4, 1);
    image expected = lists;
    expected.turn({{0, 4}, {4, 4}, {8, 4}, {16, 4}, {24, 2}});
    swap_area vvbase(lists.at(0), 32), nothing(nullptr, 0);
    swap_sd_def(sd.at(0), vvbase, nothing);
    EXPECT_TRUE(same(expected, lists));
}

TEST(SwapSdDef, ValidValuesThatAreNotAllInsideAreNotFollowedButTheReferenceIsReversed) {
    const struct {
        const char *what;
        size_t size; /* of the valid-values table */
        vx_uint32_t offset;
        vx_uint32_t count;
    } rows[] = {
        {"after the end", 32, 32, 1},    {"head cut off", 39, 32, 0},        {"entry cut off", 63, 32, 1},
        {"largest count", 64, 32, NONE}, {"far outside", 64, 0x40000000, 0}, {"at 6", 64, 6, 1},
    };
    for (const auto &row : rows) {
        SCOPED_TRACE(row.what);
        image sd(40), lists(64);
        sd.u32(4, 1);
        put_sd_element(sd, 8, VX_INT64, row.offset);
        if (row.offset < 60)
            lists.u32(row.offset + 4, row.count);
        image expected = sd, expected_lists = lists;
        expected.turn(sd_def_head).turn(sd_element, 8);
        swap_area vvbase(lists.at(0), row.size), nothing(nullptr, 0);
        swap_sd_def(sd.at(0), vvbase, nothing);
        EXPECT_TRUE(same(expected, sd));
        EXPECT_TRUE(same(expected_lists, lists));
    }
}

} // namespace
