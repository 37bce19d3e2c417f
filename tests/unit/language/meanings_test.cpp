/* Attributes of one name may mean different things in stanzas of different kinds. */

#include "language/meanings.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <string_view>

namespace {

const srtable_ctrl &stanza_of(std::size_t number) {
    return sc_tables[number];
}

std::string_view meaning_in(std::size_t number, std::string_view attribute) {
    return language::meaning_of(stanza_of(number), *find_attr(stanza_of(number), attribute)).meaning;
}

} // namespace

TEST(Meanings, OfNamesDependOnTheStanza) {
    EXPECT_EQ(meaning_in(SC_RESOURCE_CLASS, "Name"), "name of the class");
    for (std::size_t each :
         {SC_PERSISTENT_RESOURCE_ATTRIBUTE, SC_PERSISTENT_CLASS_ATTRIBUTE, SC_DYNAMIC_RESOURCE_ATTRIBUTE,
          SC_DYNAMIC_CLASS_ATTRIBUTE, SC_CLASS_ACTION, SC_RESOURCE_ACTION})
        EXPECT_EQ(meaning_in(each, "Name"), "name") << stanza_of(each).sc_name;
}

TEST(Meanings, OfDescriptionsDependOnTheStanza) {
    EXPECT_EQ(meaning_in(SC_RESOURCE_CLASS, "Description"), "message number of the description");
    for (std::size_t each : {SC_PERSISTENT_RESOURCE_ATTRIBUTE, SC_DYNAMIC_CLASS_ATTRIBUTE, SC_RESOURCE_ACTION,
                             SC_DEFINE_SD_DEFINITION, SC_ACTION_OUT_SD_DEFINITION})
        EXPECT_EQ(meaning_in(each, "Description"), "message number") << stanza_of(each).sc_name;
}

TEST(Meanings, OfPropertiesDependOnTheStanza) {
    EXPECT_EQ(meaning_in(SC_RESOURCE_CLASS, "Properties"), "class properties");
    EXPECT_EQ(meaning_in(SC_PERSISTENT_CLASS_ATTRIBUTE, "Properties"), "persistent attribute properties");
    EXPECT_EQ(meaning_in(SC_DYNAMIC_RESOURCE_ATTRIBUTE, "Properties"), "dynamic attribute properties");
    EXPECT_EQ(meaning_in(SC_RESOURCE_ACTION, "Properties"), "action properties");
}

TEST(Meanings, OfVarietiesDependOnTheStanza) {
    EXPECT_EQ(meaning_in(SC_PERSISTENT_RESOURCE_ATTRIBUTE, "VarietyRange"),
              "the varieties that have the attribute, first and last");
    EXPECT_EQ(meaning_in(SC_CLASS_ACTION, "VarietyRange"), "the varieties that have the action, first and last");
}
