/* Who has the first list of valid values of a class, as far as records alone decide. Whole databases:
 * cdef/owners_test.py. */

#include "reader/ownership.h"

#include <gtest/gtest.h>

namespace {

using cdb::first_list_evidence;
using cdb::owner_of_first_list;
using cdb::suspect;

constexpr auto NO_TEXT = std::nullopt;
constexpr auto NOBODY = std::nullopt;

TEST(FirstList, TheOnlySuspectHasIt) {
    const suspect alone[] = {{.can_have_it = true, .began = 16, .name = 8, .text = NO_TEXT}};
    EXPECT_EQ(owner_of_first_list(alone, {}), 0);
}

TEST(FirstList, NobodyHasItWithoutSuspects) {
    EXPECT_EQ(owner_of_first_list({}, {}), NOBODY);
}

TEST(FirstList, AnotherOwnerLeavesNoneToSuspects) {
    const suspect alone[] = {{.can_have_it = true, .began = 16, .name = 8, .text = NO_TEXT}};
    EXPECT_EQ(owner_of_first_list(alone, first_list_evidence{.has_owner = true}), NOBODY);
}

TEST(FirstList, NumbersBelongToTheEarliest) {
    const suspect both[] = {{.can_have_it = true, .began = 32, .name = 8, .text = NO_TEXT},
                            {.can_have_it = true, .began = 16, .name = 16, .text = NO_TEXT}};
    EXPECT_EQ(owner_of_first_list(both, {}), 1);
}

TEST(FirstList, WhoCannotHaveItIsPassedOver) {
    const suspect both[] = {{.can_have_it = false, .began = 16, .name = 8, .text = NO_TEXT},
                            {.can_have_it = true, .began = 32, .name = 16, .text = NO_TEXT}};
    EXPECT_EQ(owner_of_first_list(both, {}), 1);
    EXPECT_EQ(owner_of_first_list(std::span(both).first(1), {}), NOBODY);
}

TEST(FirstList, TextsBelongToTheLatestNameBeforeThem) {
    const suspect all[] = {{.can_have_it = true, .began = 16, .name = 8, .text = 40},
                           {.can_have_it = true, .began = 32, .name = 24, .text = 40},
                           {.can_have_it = true, .began = 48, .name = 64, .text = 40}};
    EXPECT_EQ(owner_of_first_list(all, {}), 1);
}

TEST(FirstList, TextsOutweighNumbers) {
    const suspect both[] = {{.can_have_it = true, .began = 16, .name = 8, .text = NO_TEXT},
                            {.can_have_it = true, .began = 32, .name = 24, .text = 40}};
    EXPECT_EQ(owner_of_first_list(both, {}), 1);
}

/* Its list was made before any later one; so its stanza began before that of the attribute which has a later one. */
TEST(FirstList, TheOwnerBeganBeforeThoseOfLaterLists) {
    const suspect alone[] = {{.can_have_it = true, .began = 32, .name = 8, .text = NO_TEXT}};
    EXPECT_EQ(owner_of_first_list(alone, first_list_evidence{.has_owner = false, .later_list = 48}), 0);
    EXPECT_EQ(owner_of_first_list(alone, first_list_evidence{.has_owner = false, .later_list = 16}), NOBODY);
}

/* ---- Whether a list fits --------------------------------------------------------------------------------------- */

/* A table with one list of one entry, and strings: 8 zero bytes, then "abc". */
struct one_entry {
    one_entry(std::uint32_t low, std::uint32_t high) {
        const std::uint32_t numbers[] = {CDB_ID_VALID_VALUES, 1, low, 0, high};
        std::memcpy(list.data(), numbers, sizeof numbers);
        std::memcpy(texts.data() + 8, "abc", 3);
    }
    cdb::bytes strings() const {
        return {std::as_bytes(std::span(texts)), std::endian::native};
    }
    cdb::valid_value_list of(vx_data_type_t type) const {
        cdb::class_tables tables;
        tables.strings = strings();
        tables.valid_vals = {std::as_bytes(std::span(list)), std::endian::native};
        return cdb::valid_values_at(tables, {}, type);
    }
    bool fits(vx_data_type_t type, bool is_complete = true) const {
        return cdb::can_have_list(of(type), strings(), is_complete);
    }

    std::array<char, 32> list = {};
    std::array<char, 24> texts = {};
};

TEST(CanHaveList, NumbersFitNumbersOnly) {
    const one_entry entry(7, 8);
    EXPECT_TRUE(entry.fits(VX_INT32));
    EXPECT_TRUE(entry.fits(VX_UINT32_ARRAY));
    for (vx_data_type_t type : {VX_UNKNOWN, VX_NONE, VX_CHAR_PTR, VX_BINARY_PTR, VX_RSRC_HANDLE_PTR, VX_SD_PTR})
        EXPECT_FALSE(entry.fits(type)) << type;
}

TEST(CanHaveList, OnlyACompleteStanzaHasValidValues) {
    EXPECT_FALSE(one_entry(7, 8).fits(VX_INT32, false));
}

TEST(CanHaveList, AnEmptyListFitsNobody) {
    one_entry entry(7, 8);
    entry.list[offsetof(valid_values_t, vv_count) + (std::endian::native == std::endian::big ? 3 : 0)] = 0;
    EXPECT_FALSE(entry.fits(VX_INT32));
}

TEST(CanHaveList, TextsAreStoredAtMultiplesOf8AndAreNotEmpty) {
    EXPECT_TRUE(one_entry(8, 8).fits(VX_CHAR_PTR));
    EXPECT_FALSE(one_entry(8, 9).fits(VX_CHAR_PTR));
    EXPECT_FALSE(one_entry(16, 8).fits(VX_CHAR_PTR)); /* empty */
    EXPECT_FALSE(one_entry(0, 8).fits(VX_CHAR_PTR));  /* never filled */
    EXPECT_FALSE(one_entry(8, 24).fits(VX_CHAR_PTR)); /* outside */
}

TEST(CanHaveList, BinariesLieInsideTheStrings) {
    EXPECT_TRUE(one_entry(16, 16).fits(VX_BINARY_PTR)); /* of length 0 */
    EXPECT_FALSE(one_entry(8, 16).fits(VX_BINARY_PTR)); /* of length "abc" */
}

TEST(FirstText, IsThePlaceOfTheLowValue) {
    EXPECT_EQ(cdb::first_text(one_entry(8, 16).of(VX_CHAR_PTR)), 8);
    EXPECT_EQ(cdb::first_text(one_entry(8, 16).of(VX_INT32)), NO_TEXT);
}

/* ---- The answer ------------------------------------------------------------------------------------------------ */

constexpr cdb::rule CUT_SHORT = {cdb::CODE_CUT_SHORT, cdb::severity::warning, {}};
constexpr cdb::rule ASTRAY = {cdb::CODE_RANGE_ASTRAY, cdb::severity::warning, {}};
constexpr cdb::rule OTHER = {cdb::CODE_RESERVED, cdb::severity::error, {}};

cdb::finding at(const cdb::rule &broken, std::size_t offset) {
    return {&broken, 0, {}, 0, {}, offset, {}, {}};
}

TEST(Ownership, StraysAreWhatTwoRulesReport) {
    EXPECT_EQ(cdb::stray_of(at(CUT_SHORT, 48)), 48);
    EXPECT_EQ(cdb::stray_of(at(ASTRAY, 16)), 16);
    EXPECT_EQ(cdb::stray_of(at(OTHER, 24)), std::nullopt);
}

TEST(Ownership, StraysAreNotOwn) {
    const std::array<std::byte, 64> file = {};
    const cdb::ownership owners(cdb::database(file), {48, 16});
    EXPECT_FALSE(owners.is_own(16));
    EXPECT_FALSE(owners.is_own(48));
    EXPECT_TRUE(owners.is_own(24));
}

TEST(Ownership, KnowsPartsOfTheDatabase) {
    const std::array<std::byte, 64> file = {};
    const cdb::database db(file);
    const cdb::ownership owners(db, {48});
    EXPECT_FALSE(owners.is_own(db.file().part(40), 8));
    EXPECT_TRUE(owners.is_own(db.file().part(40), 0));
    EXPECT_TRUE(owners.is_own(cdb::bytes(), 48));
}

} // namespace
