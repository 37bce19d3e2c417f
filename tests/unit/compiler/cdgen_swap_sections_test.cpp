/* The reversal of attributes, actions, errors and dependencies, of sections, and of whole images. */

#include "compiler/cdgen.h"
#include "compiler/cdgen_swap.h"

#include "compiler/image_fixture.h"

#include <bit>

namespace {

using namespace by_hand;

/* ---- Records --------------------------------------------------------------------------------------------------- */

/* A record and the tables that it refers to. */
struct record_and_tables {
    explicit record_and_tables(size_t size)
        : record(size), strings(4 * VALUES_SIZE), lists(64), varieties(48), sds(80) {
        for (size_t block = 0; block < strings.bytes.size(); block += VALUES_SIZE)
            put_values(strings, 0, block);
        lists.u32(4, 1).u32(36, 1);
        varieties.u32(4, 1).u32(20, 2);
        sds.u32(4, 1).u32(44, 1);
        for (size_t element : {size_t{8}, size_t{48}})
            sds.u32(element + 8, VX_INT32).u32(element + 16, NONE);
    }

    void swap(decltype(&swap_pattr) swap_records, vx_uint32_t count = 1) {
        swap_area sbase = area(strings), vvbase = area(lists), vlbase = area(varieties), sdbase = area(sds);
        swap_records(record.at(0), count, sbase, vvbase, vlbase, sdbase);
    }

    static swap_area area(image &table) {
        return {table.at(0), table.bytes.size()};
    }

    image record, strings, lists, varieties, sds;
};

void expect_same(const record_and_tables &expected, const record_and_tables &actual) {
    EXPECT_TRUE(same(expected.record, actual.record)) << "record";
    EXPECT_TRUE(same(expected.strings, actual.strings)) << "strings";
    EXPECT_TRUE(same(expected.lists, actual.lists)) << "valid values";
    EXPECT_TRUE(same(expected.varieties, actual.varieties)) << "variety lists";
    EXPECT_TRUE(same(expected.sds, actual.sds)) << "SD definitions";
}

void turn_second_variety_list(image &varieties) {
    varieties.turn({{16, 4}, {20, 4}, {24, 4}, {28, 4}, {32, 4}, {36, 4}});
}

void turn_sd(image &sds, size_t at) {
    sds.turn(sd_def_head, at).turn(sd_element, at + 8);
}

/* The valid values at 32. */
void put_valid_values(record_and_tables &to, const value_row &value, size_t block) {
    put_cell(to.lists, 40, value, block);
    put_cell(to.lists, 48, value, block);
}

void turn_valid_values(record_and_tables &expected, const value_row &value, size_t block) {
    expected.lists.turn({{32, 4}, {36, 4}, {40, value.width}, {48, value.width}, {56, 2}});
    expected.strings.turn(value.beyond, block);
}

TEST(SwapPattr, FieldsValueAndListsAreReversedForEveryType) {
    for (const value_row &row : value_rows) {
        SCOPED_TRACE(row.name);
        const value_row &valid_value = valid_value_row(row.type);
        record_and_tables given(72);
        given.record.u32(36, row.type).u32(40, 16).u32(48, 32).u32(56, 40);
        put_cell(given.record, 24, row, 0);
        put_valid_values(given, valid_value, VALUES_SIZE);
        record_and_tables expected = given;
        expected.record.turn(pattr_numbers).turn(24, row.width);
        expected.strings.turn(row.beyond);
        turn_valid_values(expected, valid_value, VALUES_SIZE);
        turn_second_variety_list(expected.varieties);
        turn_sd(expected.sds, 40);
        given.swap(swap_pattr);
        expect_same(expected, given);
    }
}

TEST(SwapDattr, FieldsValuesAndListsAreReversedForEveryType) {
    for (const value_row &row : value_rows) {
        SCOPED_TRACE(row.name);
        const value_row &valid_value = valid_value_row(row.type);
        record_and_tables given(136);
        given.record.u32(104, row.type).u32(56, 16).u32(64, 32).u32(72, 40);
        for (size_t value = 0; value < 3; ++value)
            put_cell(given.record, 32 + 8 * value, row, value * VALUES_SIZE);
        put_valid_values(given, valid_value, 3 * VALUES_SIZE);
        record_and_tables expected = given;
        expected.record.turn(dattr_numbers).turn(32, row.width).turn(40, row.width).turn(48, row.width);
        for (size_t value = 0; value < 3; ++value)
            expected.strings.turn(row.beyond, value * VALUES_SIZE);
        turn_valid_values(expected, valid_value, 3 * VALUES_SIZE);
        turn_second_variety_list(expected.varieties);
        turn_sd(expected.sds, 40);
        given.swap(swap_dattr);
        expect_same(expected, given);
    }
}

TEST(SwapAction, FieldsAndListsAreReversed) {
    record_and_tables given(56);
    given.record.u32(32, 16).u32(40, 40).u32(48, 0);
    record_and_tables expected = given;
    expected.record.turn(action_numbers);
    turn_second_variety_list(expected.varieties);
    turn_sd(expected.sds, 0);
    turn_sd(expected.sds, 40);
    given.swap(swap_action);
    expect_same(expected, given);
}

TEST(SwapErrors, FieldsAndListsAreReversed) {
    record_and_tables given(48);
    given.record.u32(24, 16).u32(32, 40);
    record_and_tables expected = given;
    expected.record.turn(error_numbers);
    turn_second_variety_list(expected.varieties);
    turn_sd(expected.sds, 40);
    given.swap(swap_errors);
    expect_same(expected, given);
}

/* A kind of record. */
struct record_row {
    const char *name;
    decltype(&swap_pattr) swap;
    size_t size;
    numbers turned;
    std::vector<size_t> references; /* into the list tables */
    numbers values;                 /* of Int32s */
    size_t type_at;                 /* of a record without values: anywhere */
};

const std::vector<record_row> record_rows = {
    {"pattr", swap_pattr, 72, pattr_numbers, {40, 48, 56}, {{24, 4}}, 36},
    {"dattr", swap_dattr, 136, dattr_numbers, {56, 64, 72}, {{32, 4}, {40, 4}, {48, 4}}, 104},
    {"action", swap_action, 56, action_numbers, {32, 40, 48}, {}, 4},
    {"error", swap_errors, 48, error_numbers, {24, 32}, {}, 4},
    {"depend", swap_depends, 8, depend_numbers, {}, {}, 0},
};

/* Records of a kind that all refer to one offset. */
record_and_tables records_with_references(const record_row &row, size_t records, vx_uint32_t reference) {
    record_and_tables made(records * row.size);
    for (size_t at = 0; at < made.record.bytes.size(); at += row.size) {
        made.record.u32(at + row.type_at, VX_INT32);
        for (size_t place : row.references)
            made.record.u32(at + place, reference);
    }
    return made;
}

TEST(SwapRecords, AsManyAsAskedForAreReversedAndNoneIsNotFollowed) {
    for (const record_row &row : record_rows)
        for (vx_uint32_t count : {0u, 1u, 2u}) {
            SCOPED_TRACE(std::string(row.name) + ' ' + std::to_string(count));
            record_and_tables given = records_with_references(row, 3, NONE), expected = given;
            for (size_t i = 0; i < count; ++i)
                expected.record.turn(row.turned, i * row.size).turn(row.values, i * row.size);
            given.swap(row.swap, count);
            expect_same(expected, given);
        }
}

TEST(SwapRecords, ReferencesOutOfTheirTableOrNotAlignedAreReversedButNotFollowed) {
    for (const record_row &row : record_rows)
        for (vx_uint32_t reference : {80u, 76u, 2u, 7u, 0xFFFFFFF8u}) {
            SCOPED_TRACE(std::string(row.name) + ' ' + std::to_string(reference));
            record_and_tables given = records_with_references(row, 1, reference), expected = given;
            expected.record.turn(row.turned).turn(row.values);
            given.swap(row.swap);
            expect_same(expected, given);
        }
}

TEST(SwapRecords, SharedListsAreReversedOnce) {
    for (const record_row &row : record_rows) {
        SCOPED_TRACE(row.name);
        record_and_tables given = records_with_references(row, 2, 0), expected = given;
        for (size_t i = 0; i < 2; ++i)
            expected.record.turn(row.turned, i * row.size).turn(row.values, i * row.size);
        if (!row.references.empty()) {
            expected.varieties.turn({{0, 4}, {4, 4}, {8, 4}, {12, 4}});
            turn_sd(expected.sds, 0);
        }
        if (!row.values.empty())
            expected.lists.turn({{0, 4}, {4, 4}, {8, 4}, {16, 4}, {24, 2}});
        given.swap(row.swap, 2);
        expect_same(expected, given);
    }
}

/* ---- Sections: every image has one ----------------------------------------------------------------------------- */

constexpr size_t SECTION = 96;

void expect_reversed(image expected, image given, size_t anchors = 1) {
    turn_frame(expected, anchors);
    cdgen_cdef_swap(given.at(0));
    EXPECT_TRUE(same(expected, given));
}

TEST(SwapSection, ManagersTableReferenceAndTextStay) {
    image given = image_of({{3, 40}}), expected = given;
    expected.turn(mgr_numbers, SECTION);
    expect_reversed(expected, given);
}

TEST(SwapSection, MapsReservedFieldsAndTextStay) {
    image given = image_of({{6, 76}}), expected = given;
    expected.turn(cmmap_numbers, SECTION);
    expect_reversed(expected, given);
}

TEST(SwapSection, VariableIdsStandBehindTheStrings) {
    for (vx_uint32_t count : {0u, 1u, 3u}) {
        SCOPED_TRACE(count);
        image given = image_of({{4, 40 + 24 + 16}}); /* 24 bytes of strings */
        given.u32(SECTION + 24, count).u32(SECTION + 28, 24);
        image expected = given;
        expected.turn(var_class_numbers, SECTION);
        for (size_t i = 0; i < count; ++i)
            expected.turn(SECTION + 64 + 4 * i, 4);
        expect_reversed(expected, given);
    }
}

TEST(SwapSection, VariableIdsBeyondTheSectionStay) {
    const struct {
        vx_uint32_t count, strings;
        size_t reversed;
    } rows[] = {{4, 24, 4}, {5, 24, 4}, {NONE, 24, 4}, {1, 36, 1}, {2, 36, 1}, {1, 40, 0}, {1, 48, 0}, {1, NONE, 0}};
    for (const auto &row : rows) {
        SCOPED_TRACE(std::to_string(row.count) + " after " + std::to_string(row.strings));
        image given = image_of({{4, 40 + 24 + 16}, {3, 24}});
        size_t start = 112;
        given.u32(start + 24, row.count).u32(start + 28, row.strings);
        image expected = given;
        expected.turn(var_class_numbers, start).turn(mgr_numbers, start + 80);
        for (size_t i = 0; i < row.reversed; ++i)
            expected.turn(start + 40 + row.strings + 4 * i, 4);
        expect_reversed(expected, given, 2);
    }
}

TEST(SwapSection, BucketsOfTheClassHashStay) {
    const struct {
        vx_uint32_t count;
        size_t reversed;
    } rows[] = {{0, 0}, {1, 1}, {2, 2}, {3, 2}, {NONE, 2}}; /* of two blocks */
    for (const auto &row : rows) {
        SCOPED_TRACE(row.count);
        image given = image_of({{7, 8200 + 2 * 24}});
        given.u32(SECTION + 8196, row.count);
        image expected = given;
        expected.turn(class_hash_numbers, SECTION);
        for (size_t i = 0; i < row.reversed; ++i)
            expected.turn(hash_block_numbers, SECTION + 8200 + 24 * i);
        expect_reversed(expected, given);
    }
}

TEST(SwapSection, OfAnotherTypeStaysButForItsAnchor) {
    for (vx_uint32_t type : {0u, 1u, 2u, 8u, 0x03000000u, 0xFFFFFFFFu}) {
        SCOPED_TRACE(type);
        image given = image_of({{type, 240}});
        expect_reversed(given, given);
    }
}

TEST(SwapSection, TooShortForItsRecordStaysButForItsAnchor) {
    const section_row rows[] = {{3, 23}, {4, 39}, {5, 223}, {6, 59}, {7, 8199}, {5, 0}};
    for (const section_row &row : rows) {
        SCOPED_TRACE(row.type);
        image given = image_of({row, {0, 300}}); /* followed by another section's bytes */
        expect_reversed(given, given, 2);
    }
}

TEST(SwapSection, OutsideTheFileStaysButForItsAnchor) {
    const struct { vx_uint32_t offset, length; } rows[] = {{120, 24}, {97, 24}, {NONE, 24}, {96, 25}, {96, NONE}};
    for (const auto &row : rows) {
        SCOPED_TRACE(std::to_string(row.offset) + ' ' + std::to_string(row.length));
        image given = image_of({{3, 24}});
        given.u32(84, row.offset).u32(88, row.length);
        expect_reversed(given, given);
    }
}

/* ---- Class sections -------------------------------------------------------------------------------------------- */

constexpr size_t sd_inputs[] = {56, 64, 72, 80, 88}; /* of the class record */

image class_image(const class_sizes &sizes) {
    image made = image_of({{5, 224 + sizes.records + sizes.varieties + sizes.sds + sizes.lists + sizes.strings}});
    put_class(made, SECTION, sizes);
    return made;
}

TEST(SwapClass, RecordIsReversedButForItsSpares) {
    image given = class_image({}), expected = given;
    expected.turn(class_numbers, SECTION);
    expect_reversed(expected, given);
}

/* A table of a class's records: where the class has its offset and its count. */
const struct table_row {
    const char *name;
    size_t offset, count;
    size_t kind; /* in record_rows */
} table_rows[] = {
    {"pattrsC", 24, 168, 0},  {"dattrsC", 32, 170, 1},  {"pattrs", 40, 172, 0},  {"dattrs", 48, 174, 1},
    {"actionsC", 96, 176, 2}, {"actions", 104, 178, 2}, {"errors", 112, 180, 3}, {"depends", 120, 182, 4},
};

/* Two records and a half of one table, with nothing in front of the lists but them. */
image class_with_records(const table_row &table, vx_uint16_t count) {
    const record_row &kind = record_rows[table.kind];
    image made = class_image({kind.size * 5 / 2, 0, 0, 0, 0});
    record_and_tables records = records_with_references(kind, 2, NONE);
    made.text(SECTION + 224, {records.record.at(0), 2 * kind.size});
    return made.u16(SECTION + table.count, count);
}

TEST(SwapClass, EachTableHasItsOwnCountAndNoRecordBeyondTheSectionIsReversed) {
    for (const table_row &table : table_rows)
        for (vx_uint16_t count : std::initializer_list<vx_uint16_t>{0, 1, 2, 3, 0xFFFF}) {
            SCOPED_TRACE(std::string(table.name) + ' ' + std::to_string(count));
            const record_row &kind = record_rows[table.kind];
            image given = class_with_records(table, count), expected = given;
            expected.turn(class_numbers, SECTION);
            for (size_t i = 0; i < 2 && i < count; ++i)
                expected.turn(kind.turned, SECTION + 224 + i * kind.size)
                    .turn(kind.values, SECTION + 224 + i * kind.size);
            expect_reversed(expected, given);
        }
}

TEST(SwapClass, TableOfRecordsThatIsNoneOrOutsideIsNotFollowed) {
    for (const table_row &table : table_rows)
        for (vx_uint32_t offset : {NONE, 0xFFFFFFF8u, 224 + 340u, 4096u}) {
            SCOPED_TRACE(std::string(table.name) + ' ' + std::to_string(offset));
            image given = class_with_records(table, 1);
            given.u32(SECTION + table.offset, offset);
            image expected = given;
            expected.turn(class_numbers, SECTION);
            expect_reversed(expected, given);
        }
}

TEST(SwapClass, EachSdInputIsFollowedUnlessNone) {
    for (size_t input : sd_inputs) {
        SCOPED_TRACE(input);
        image given = class_image({0, 0, 80, 32, 0});
        size_t sd = SECTION + 224 + 40, list = SECTION + 224 + 80;
        given.u32(SECTION + input, 40).u32(sd + 4, 1).u32(sd + 16, VX_UINT64).u32(sd + 24, 0).u32(list + 4, 1);
        image expected = given;
        expected.turn(class_numbers, SECTION).turn(sd_def_head, sd).turn(sd_element, sd + 8);
        expected.turn(valid_values_head, list).turn({{list + 8, 8}, {list + 16, 8}, {list + 24, 2}});
        expect_reversed(expected, given);
    }
}

TEST(SwapClass, SharedSdInputIsReversedOnce) {
    image given = class_image({0, 0, 40, 0, 0});
    size_t sd = SECTION + 224;
    for (size_t input : sd_inputs)
        given.u32(SECTION + input, 0);
    given.u32(sd + 4, 1).u32(sd + 24, NONE);
    image expected = given;
    expected.turn(class_numbers, SECTION).turn(sd_def_head, sd).turn(sd_element, sd + 8);
    expect_reversed(expected, given);
}

TEST(SwapClass, ListsAndValuesThatNothingRefersToStay) {
    image given = class_image({0, 16, 40, 32, VALUES_SIZE});
    size_t lists = SECTION + 224;
    given.u32(lists + 4, 1).u32(lists + 20, 1).u32(lists + 60, 1);
    put_values(given, lists + 88, 0);
    image expected = given;
    expected.turn(class_numbers, SECTION);
    expect_reversed(expected, given);
}

/* A persistent attribute's reference to a list of one entry, which is not the last in the section. */
TEST(SwapClass, ListBeyondItsTableIsNotFollowed) {
    const struct {
        const char *what;
        size_t reference, table_size, size;
    } rows[] = {{"variety list", 40, 184, 16}, {"SD definition", 56, 192, 40}, {"valid values", 48, 196, 32}};
    for (const auto &row : rows) {
        SCOPED_TRACE(row.what);
        image given = class_image({72, 16, 40, 32, 64});
        size_t attr = SECTION + 224;
        given.u16(SECTION + 172, 1).u32(attr + 36, VX_INT32).u32(attr + 40, NONE).u32(attr + 48, NONE);
        given.u32(attr + 56, NONE).u32(attr + row.reference, 0);
        put_ref(given, SECTION + row.table_size, row.size - 1);
        for (size_t list : {attr + 72, attr + 88, attr + 128})
            given.u32(list + 4, 1);
        image expected = given;
        expected.turn(class_numbers, SECTION).turn(pattr_numbers, attr).turn(attr + 24, 4);
        expect_reversed(expected, given);
    }
}

TEST(SwapClass, ValueBeyondTheSectionIsNotFollowed) {
    image given = image_of({{5, 224 + 72 + 16}, {0, 64}});
    size_t attr = 112 + 224;
    put_class(given, 112, {72, 0, 0, 0, 16});
    given.u16(112 + 172, 1).u32(attr + 36, VX_BINARY_PTR).u32(attr + 24, 16);
    given.u32(attr + 40, NONE).u32(attr + 48, NONE).u32(attr + 56, NONE);
    image expected = given;
    expected.turn(class_numbers, 112).turn(pattr_numbers, attr).turn(attr + 24, 4);
    expect_reversed(expected, given, 2);
}

/* An attribute whose reference to valid values was never set has 0 there, which may be the place of another attribute's
 * list. */
TEST(SwapClass, PlacesThatLeadNowhereAreNotFollowedAndKeepTheirZero) {
    image given = class_image({144, 0, 0, 32, 0});
    size_t attr = SECTION + 224, list = attr + 144;
    given.u16(SECTION + 172, 2).u32(list + 4, 1);
    for (size_t at : {attr, attr + 72})
        given.u32(at + 36, VX_INT32).u32(at + 40, NONE).u32(at + 48, 0).u32(at + 56, NONE);
    const size_t nowhere[] = {attr + 48, attr + 72 + 48};
    image expected = given;
    expected.turn(class_numbers, SECTION).turn(pattr_numbers, attr).turn(pattr_numbers, attr + 72);
    expected.turn({{attr + 24, 4}, {attr + 72 + 24, 4}});
    turn_frame(expected, 1);
    cdgen_cdef_swap(given.at(0), nowhere);
    EXPECT_TRUE(same(expected, given));
}

/* ---- Images ---------------------------------------------------------------------------------------------------- */

/* Map sections of 60 bytes and their strings shift everything after them, here a class with 8-byte values, by 4. */
TEST(SwapImage, SectionsAlignedToFourAreReversed) {
    image given = image_of({{6, 60}, {5, 224 + 72 + 120}, {3, 24}, {6, 68}, {4, 40 + 8 + 8}});
    size_t map = 160, cls = map + 60, attr = cls + 224, strings = attr + 72, mgr = strings + 120, vars = mgr + 24 + 68;
    put_class(given, cls, {72, 0, 0, 0, 120});
    given.u16(cls + 172, 1).u32(attr + 36, VX_INT64_ARRAY).u32(attr + 24, 96);
    given.u32(attr + 40, NONE).u32(attr + 48, NONE).u32(attr + 56, NONE);
    given.u32(strings + 96, 2).u32(vars + 24, 2).u32(vars + 28, 8);
    image expected = given;
    expected.turn(cmmap_numbers, map).turn(class_numbers, cls).turn(pattr_numbers, attr).turn(attr + 24, 4);
    expected.turn({{96, 4}, {104, 8}, {112, 8}}, strings);
    expected.turn(mgr_numbers, mgr).turn(cmmap_numbers, mgr + 24);
    expected.turn(var_class_numbers, vars).turn({{48, 4}, {52, 4}}, vars);
    ASSERT_EQ(cls % 8, 4u);
    expect_reversed(expected, given, 5);
}

/* 82 bytes: the last two are not a whole word. */
TEST(SwapImage, TrailingPartWordIsNotInTheChecksum) {
    image given(82);
    given.u32(0, 78).u32(24, 0);
    expect_reversed(given, given, 0);
}

TEST(SwapImage, FormatOfAReversedFileReadsFmt1) {
    image given = image_of({});
    cdgen_cdef_swap(given.at(0));
    bool little = std::endian::native == std::endian::little;
    EXPECT_EQ(std::string(given.at(8), 4), little ? "fmt1" : "1tmf");
}

vx_uint32_t other_order(const image &of, size_t at) {
    return image(of).turn(at, 4).word(at);
}

TEST(SwapImage, ReadInTheOtherOrderFrameIsTheSameAndTheChecksumHolds) {
    image given = image_of({{3, 24}, {6, 60}}), reversed = given;
    cdgen_cdef_swap(reversed.at(0));
    vx_uint32_t sum = other_order(reversed, 0);
    for (size_t at = 8; at < reversed.bytes.size(); at += 4)
        sum ^= other_order(reversed, at);
    EXPECT_EQ(other_order(reversed, 4), sum);
    for (size_t at : {0U, 8U, 24U, 80U, 84U, 88U, 92U, 96U, 100U, 104U, 108U})
        EXPECT_EQ(other_order(reversed, at), given.word(at)) << at;
}

TEST(SwapImage, AnchorsBeyondTheFileAreNotReversed) {
    for (vx_uint32_t count : {2u, 3u, NONE}) {
        SCOPED_TRACE(count);
        image given = image_of({{0, 24}}); /* 120 bytes: room for two anchors and a half */
        given.u32(24, count);
        given.u32(96, 3).u32(100, 0).u32(104, NONE);
        expect_reversed(given, given, 2);
    }
}

} // namespace
