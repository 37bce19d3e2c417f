/* Names that consist of words. */

#include "language/words.h"

#include <gtest/gtest.h>

namespace {

using language::is_part;
using language::name_list;
using language::words_of;

TEST(WordsOf, BeginWithCapitals) {
    EXPECT_EQ(words_of("DataType"), (name_list{"Data", "Type"}));
    EXPECT_EQ(words_of("PAttrSDDefinition"), (name_list{"P", "Attr", "SD", "Definition"}));
    EXPECT_EQ(words_of("GroupID"), (name_list{"Group", "ID"}));
    EXPECT_EQ(words_of("desc"), name_list{"desc"});
    EXPECT_EQ(words_of(""), name_list());
}

TEST(IsPart, LeavesWordsOutAndCutsThemShort) {
    EXPECT_TRUE(is_part("PersistentAttribute", "PersistentResourceAttribute"));
    EXPECT_TRUE(is_part("desc", "ReArmDescription"));
    EXPECT_TRUE(is_part("ConfirmMsg", "ConfirmationMsg"));
    EXPECT_FALSE(is_part("TypeData", "DataType"));
    EXPECT_FALSE(is_part("DataTypes", "DataType"));
    EXPECT_FALSE(is_part("ata", "DataType"));
    EXPECT_FALSE(is_part("DataType", "Data"));
    EXPECT_TRUE(is_part("TypeType", "DataTypeIsType"));
    EXPECT_FALSE(is_part("TypeType", "DataTypeIs"));
    EXPECT_TRUE(is_part("", "Data"));
    EXPECT_FALSE(is_part("Data", ""));
}

TEST(NamesWithPart, AreThoseOfThreeLettersOrMore) {
    EXPECT_EQ(language::names_with_part("Key", {"FirstKey", "LastKey", "Id"}), (name_list{"FirstKey", "LastKey"}));
    EXPECT_EQ(language::names_with_part("Ke", {"FirstKey"}), name_list());
}

} // namespace
