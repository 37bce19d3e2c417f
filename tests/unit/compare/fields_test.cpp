#include "compare/fields.h"

#include <gtest/gtest.h>

using cdb::meaning;

TEST(compare_fields, bits_have_names_in_the_order_of_the_table) {
    constexpr props_t known[] = {{"Two", 0x2}, {"One", 0x1}};
    EXPECT_EQ(compare::text_of_bits(0x3, known), "Two+One");
    EXPECT_EQ(compare::text_of_bits(0x31, known), "One+0x30");
    EXPECT_EQ(compare::text_of_bits(0x30, known), "0x30");
    EXPECT_EQ(compare::text_of_bits(0, known), "none");
}

TEST(compare_fields, numbers_read_as_what_they_mean) {
    EXPECT_EQ(compare::text_of_number(0xFFFFFFFF, meaning::PLAIN), "4294967295");
    EXPECT_EQ(compare::text_of_number(0xFFFFFFFF, meaning::SIGNED), "-1");
    EXPECT_EQ(compare::text_of_number(0x01020304, meaning::VERSION), "1.2.3.4");
    EXPECT_EQ(compare::text_of_number(VX_CHAR_PTR, meaning::DATA_TYPE), "String");
    EXPECT_EQ(compare::text_of_number(ORB_STATE, meaning::VARIABLE_TYPE), "State");
    EXPECT_EQ(compare::text_of_number(0x21, meaning::DYNAMIC_PROPERTIES), "Public+0x1");
}

TEST(compare_fields, a_permission_is_one_letter_or_bits) {
    EXPECT_EQ(compare::text_of_number(0x10, meaning::PERMISSIONS), "d");
    EXPECT_EQ(compare::text_of_number(0x11, meaning::PERMISSIONS), "0x11");
    EXPECT_EQ(compare::text_of_number(0, meaning::PERMISSIONS), "none");
}

TEST(compare_fields, numbers_that_stand_for_none) {
    EXPECT_EQ(compare::text_of_number(0xFFFF, meaning::NONE_IS_65535), "none");
    EXPECT_EQ(compare::text_of_number(0xFFFF, meaning::LOCATOR), "none");
    EXPECT_EQ(compare::text_of_number(255, meaning::NONE_IS_255), "255");
    EXPECT_EQ(compare::text_of_number(CDB_NONE, meaning::UNUSED), "0");
    EXPECT_EQ(compare::text_of_number(8, meaning::UNUSED), "8");
}
