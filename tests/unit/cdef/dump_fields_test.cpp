#include "cdef/dump/dump.h"

#include <gtest/gtest.h>

using cdb::meaning;
using cdef::dump::as_text;
using cdef::dump::fact_of;

namespace {

std::string text_of(meaning as, std::uint32_t number) {
    return as_text(fact_of(as, number));
}

} // namespace

TEST(dump_fields, plain_and_signed_numbers) {
    EXPECT_EQ(text_of(meaning::PLAIN, 0xFFFFFFFF), "4294967295");
    EXPECT_EQ(text_of(meaning::SIGNED, 0xFFFFFFFF), "-1");
    EXPECT_EQ(text_of(meaning::BITS, 0x1F), "0x1f");
}

TEST(dump_fields, a_mark_is_four_characters_or_a_number) {
    EXPECT_EQ(text_of(meaning::MARK, 0x43444231), "CDB1");
    EXPECT_EQ(text_of(meaning::MARK, 0x43444200), "0x43444200");
}

TEST(dump_fields, times) {
    EXPECT_EQ(text_of(meaning::TIME, 0), "none");
    EXPECT_EQ(text_of(meaning::TIME, 951782400), "2000-02-29T00:00:00Z");
}

TEST(dump_fields, properties_come_lowest_bit_first_and_unknown_ones_last) {
    EXPECT_EQ(text_of(meaning::ACTION_PROPERTIES, 0x3), "LongRun, Public");
    EXPECT_EQ(text_of(meaning::ACTION_PROPERTIES, 0x82), "Public, 0x80");
    EXPECT_EQ(text_of(meaning::ACTION_PROPERTIES, 0), "none");
    EXPECT_EQ(text_of(meaning::PERMISSIONS, 0x21), "q, c");
}

TEST(dump_fields, numbers_with_names) {
    EXPECT_EQ(text_of(meaning::SECTION_TYPE, CDB_DSECT_CMMAP), "CDB_DSECT_CMMAP");
    EXPECT_EQ(text_of(meaning::SECTION_TYPE, 8), "0x8");
    EXPECT_EQ(text_of(meaning::DATA_TYPE, VX_CHAR_PTR), "String");
    EXPECT_EQ(text_of(meaning::DATA_TYPE, 23), "0x17");
    EXPECT_EQ(text_of(meaning::VARIABLE_TYPE, ORB_STATE), "State");
    EXPECT_EQ(text_of(meaning::VERSION, 0x01020304), "1.2.3.4");
}

TEST(dump_fields, numbers_that_stand_for_none) {
    EXPECT_EQ(text_of(meaning::NONE_IS_0, 0), "none");
    EXPECT_EQ(text_of(meaning::NONE_IS_255, 255), "none");
    EXPECT_EQ(text_of(meaning::NONE_IS_65535, 0xFFFF), "none");
    EXPECT_EQ(text_of(meaning::NONE_IS_255, 0), "0");
}
