/* The names that the catalogue has. */

#include "language/names.h"

#include "language/catalogue_rows.h"

#include <gtest/gtest.h>

#include <algorithm>

namespace {

using language::name_list;

const srtable_ctrl &map_kind() {
    return sc_tables[SC_CLASS_TO_MANAGER_MAPPING];
}

TEST(Names, OfStanzasAreInTheOrderOfTheirKinds) {
    name_list names = language::stanza_names();
    ASSERT_EQ(names.size(), 19u);
    EXPECT_EQ(names.front(), "ControlDefinition");
    EXPECT_EQ(names.back(), "ActionOutSDDefinition");
}

TEST(Names, OfAttributesAreThoseOfTheKind) {
    name_list names = language::attribute_names(sc_tables[SC_CONTROL_DEFINITION]);
    EXPECT_NE(std::find(names.begin(), names.end(), "FileVersion"), names.end());
    EXPECT_EQ(std::find(names.begin(), names.end(), "FirstKey"), names.end());
}

TEST(KindsWith, AreAllThatHaveTheAttribute) {
    EXPECT_EQ(language::kinds_with("FirstKey"), language::kind_set().set(SC_CLASS_TO_MANAGER_MAPPING));
    EXPECT_EQ(language::kinds_with("Range").count(), 2u);
    EXPECT_TRUE(language::kinds_with("firstkey").none());
    EXPECT_TRUE(language::kinds_with("").none());
}

/* The one that is meant, or all of them. */
std::string meant(std::string_view text, stanza_id kind) {
    name_list names = language::attribute_meant_by(text, sc_tables[kind]).names;
    return names.empty() ? "" : language::listed(names, "or");
}

TEST(AttributeMeantBy, IsThePartOfAName) {
    EXPECT_EQ(meant("Type", SC_PERSISTENT_RESOURCE_ATTRIBUTE), "`DataType`");
    EXPECT_EQ(meant("Default", SC_PERSISTENT_CLASS_ATTRIBUTE), "`DefaultValue`");
    EXPECT_EQ(meant("Desc", SC_RESOURCE_ACTION), "`Description`");
    EXPECT_EQ(meant("Type", SC_DYNAMIC_RESOURCE_ATTRIBUTE), "`DataType` or `VariableType`");
}

TEST(AttributeMeantBy, IsTheSisterInThisKind) {
    EXPECT_EQ(meant("InitialValue", SC_PERSISTENT_RESOURCE_ATTRIBUTE), "`DefaultValue`");
    EXPECT_EQ(meant("DefaultValue", SC_DYNAMIC_CLASS_ATTRIBUTE), "`InitialValue`");
    EXPECT_EQ(meant("ValidValue", SC_DYNAMIC_RESOURCE_ATTRIBUTE), "`ValidStateValue`");
    EXPECT_EQ(meant("ValidStateValue", SC_PATTR_SD_DEFINITION), "`ValidValue`");
    EXPECT_EQ(meant("Name", SC_ONLINE_SD_DEFINITION), "`ElementName`");
    EXPECT_EQ(meant("Name", SC_RESOURCE_VARIABLE_CLASS), "`VariableClass`");
    EXPECT_EQ(meant("ElementName", SC_CLASS_ACTION), "`Name`");
    EXPECT_EQ(meant("Id", SC_ACTION_IN_SD_DEFINITION), "`ElementIndex`");
    EXPECT_EQ(meant("ElementIndex", SC_RESOURCE_ACTION), "`Id`");
    EXPECT_EQ(meant("Permission", SC_RESOURCE_CLASS), "`ClassPermTemplate` or `ResourcePermTemplate`");
    EXPECT_EQ(meant("VariableClass", SC_PERSISTENT_RESOURCE_ATTRIBUTE), "");
}

TEST(AttributeMeantBy, IsTheSisterOfAMisspeltOne) {
    EXPECT_EQ(meant("Default", SC_DYNAMIC_RESOURCE_ATTRIBUTE), "`InitialValue`");
    EXPECT_EQ(meant("InitalValue", SC_PERSISTENT_RESOURCE_ATTRIBUTE), "`DefaultValue`");
}

TEST(AttributeMeantBy, IsNothingWithoutLikeness) {
    EXPECT_EQ(meant("Colour", SC_PERSISTENT_RESOURCE_ATTRIBUTE), "");
    EXPECT_EQ(meant("Range", SC_PERSISTENT_RESOURCE_ATTRIBUTE), "");
}

TEST(PropertyNames, AreThoseOfTheAttributeType) {
    EXPECT_EQ(language::property_names(AT_DATTR_PROPS), (name_list{"Public", "QryReqsMonitoring"}));
    EXPECT_EQ(language::property_names(AT_ACTION_PROPS), (name_list{"Public", "LongRun"}));
}

TEST(MissingNames, AreRequiredAndNotSeen) {
    name_list all = {"ResourceManager", "FirstKey", "LastKey", "MessageCatalog", "DescriptiveMessageSet"};
    EXPECT_EQ(language::missing_names(map_kind(), 0), all);
    EXPECT_EQ(language::missing_names(map_kind(), map_kind().sc_attrs[0].req_bit).size(), 4u);
    EXPECT_EQ(language::missing_names(map_kind(), map_kind().req_mask_cmplt), name_list());
}

TEST(BitOf, IsTheOneThatEveryKindGivesTheAttribute) {
    EXPECT_EQ(language::bit_of("GroupID"), OPTIONAL | 0x1);
    EXPECT_EQ(language::bit_of("GroupName"), OPTIONAL | 0x2);
    EXPECT_EQ(language::bit_of("Permission"), OPTIONAL | 0x4);
    EXPECT_EQ(language::bit_of("ElementIndex"), 0x8u);
}

} // namespace
