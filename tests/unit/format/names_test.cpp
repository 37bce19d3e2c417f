#include "format/names.h"

#include <gtest/gtest.h>

#include <string>

TEST(format_names, a_permission_has_a_letter_if_its_mask_has_one) {
    EXPECT_EQ(permission_letter(0x1), 'q');
    EXPECT_EQ(permission_letter(DEFAULT_PERMISSION), 's');
    EXPECT_EQ(permission_letter(0x200), 'x');
    EXPECT_EQ(permission_letter(0x3), '\0');
    EXPECT_EQ(permission_letter(0), '\0');
}

TEST(format_names, properties_are_taken_in_the_order_of_the_table) {
    std::string names;
    auto add = [&names](const char *name) { names.append(name).append(";"); };
    EXPECT_EQ(take_properties(0x1B, pa_props, add), 0U);
    EXPECT_EQ(names, "Select;ReqdForDefine;OptForDefine;ReadOnly;");
}

TEST(format_names, bits_without_a_name_are_left) {
    std::string names;
    auto add = [&names](const char *name) { names.append(name); };
    EXPECT_EQ(take_properties(0x181, act_props, add), 0x180U);
    EXPECT_EQ(names, "LongRun");
}
