/* The transitions of a run of structured data. */

#include "compiler/cdgen_sd_run.h"

#include <gtest/gtest.h>

namespace {

struct SdRun : testing::Test {
    vx_value_t value = {};
    cdb_ref_t section = {};
    vx_uint16_t highest = 7;
    sd_run run;
};

TEST_F(SdRun, OfAnAttributeStoresItsSectionAndItsHighestIndex) {
    run.announce(&value, &section, &highest, 1);
    run.begin(40);
    run.curr_sdeli = 2;
    run.end();
    EXPECT_EQ(section.offset[0], 40u);
    EXPECT_EQ(highest, 2);
    EXPECT_EQ(run.curr_sdeli, -1);
    EXPECT_EQ(run.expected_sdeli, 0);
    EXPECT_EQ(run.attr_dflt_val, &value);
}

TEST_F(SdRun, WithoutElementsHasTheHighestIndexOfNone) {
    run.announce(&value, &section, &highest, 0);
    run.end();
    EXPECT_EQ(highest, 0xFFFF);
}

TEST_F(SdRun, AfterTheAttributeHasBeenLeftStoresNoIndex) {
    run.announce(&value, &section, &highest, 0);
    run.leave_attribute();
    run.curr_sdeli = 2;
    run.end();
    EXPECT_EQ(highest, 7);
    EXPECT_EQ(run.curr_sd_tbl, &section);
    run.forget_owner();
    EXPECT_EQ(run.curr_sd_tbl, nullptr);
}

TEST_F(SdRun, GivenUpCountsFromTheBeginning) {
    cdb_ref_t nobody = {};
    run.announce(&value, &section, &highest, 0);
    run.begin_for(nobody, 16);
    run.curr_sdeli = 1;
    run.expected_sdeli = 2;
    run.give_up();
    EXPECT_EQ(nobody.offset[0], 16u);
    EXPECT_EQ(highest, 7);
    EXPECT_EQ(run.expected_sdeli, 0);
    EXPECT_EQ(run.curr_sd_tbl, nullptr);
}

TEST(SdElement, IsCompleteWithFourAttributesWhateverItsValidValues) {
    sd_element_state element;
    element.sd_vv_found = 1;
    for (int *found : {&element.sd_name_found, &element.sd_desc_found, &element.sd_disp_found, &element.sd_dt_found}) {
        EXPECT_FALSE(element.is_complete());
        *found = 1;
    }
    EXPECT_TRUE(element.is_complete());
    element.forget();
    EXPECT_FALSE(element.is_complete());
    EXPECT_EQ(element.sd_vv_found, 1);
}

} // namespace
