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
    run.set_index(2);
    run.end();
    EXPECT_EQ(section.offset[0], 40u);
    EXPECT_EQ(highest, 2);
    EXPECT_EQ(run.index(), -1);
    EXPECT_EQ(run.expected_index(), 0);
    EXPECT_EQ(run.value(), &value);
    EXPECT_EQ(run.state(), sd_run_state::OF_ATTRIBUTE);
}

TEST_F(SdRun, WithoutElementsHasTheHighestIndexOfNone) {
    run.announce(&value, &section, &highest, 0);
    run.end();
    EXPECT_EQ(highest, 0xFFFF);
}

TEST_F(SdRun, WithoutAnOwnerStoresNoIndex) {
    run.announce(&value, &section, &highest, 0);
    run.forget_owner();
    run.set_index(2);
    run.end();
    EXPECT_EQ(highest, 7);
    EXPECT_EQ(run.state(), sd_run_state::NO_OWNER);
    EXPECT_FALSE(run.has_section());
    EXPECT_EQ(run.value(), nullptr);
}

TEST_F(SdRun, OfAFieldMakesNoValue) {
    run.belong_to(&section);
    run.begin(24);
    EXPECT_EQ(run.state(), sd_run_state::OF_FIELD);
    EXPECT_FALSE(run.makes_value());
    EXPECT_EQ(section.offset[0], 24u);
}

TEST_F(SdRun, KeepsAnOwnerThatItHas) {
    cdb_ref_t other = {};
    run.announce(&value, &section, &highest, 0);
    run.belong_to(&other);
    EXPECT_EQ(run.section(), &section);
    EXPECT_TRUE(run.makes_value());
}

TEST_F(SdRun, HasNoOwnerIfThereIsNoField) {
    run.belong_to(nullptr);
    EXPECT_EQ(run.state(), sd_run_state::NO_OWNER);
}

TEST_F(SdRun, CountsTheElementsOfOneRun) {
    run.belong_to(&section);
    run.count_element();
    run.begin(0);
    run.count_element();
    EXPECT_EQ(run.elements(), 1u);
}

TEST_F(SdRun, GivenUpCountsFromTheBeginning) {
    cdb_ref_t nobody = {};
    run.announce(&value, &section, &highest, 0);
    run.begin_for(nobody, 16);
    run.set_index(1);
    run.expect_index(2);
    run.give_up();
    EXPECT_EQ(nobody.offset[0], 16u);
    EXPECT_EQ(highest, 7);
    EXPECT_EQ(run.expected_index(), 0);
    EXPECT_EQ(run.state(), sd_run_state::NO_OWNER);
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
