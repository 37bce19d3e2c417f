/* Suggestions for misspelt names. */

#include "language/suggestions.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using language::near_miss;
using language::suggestion;

TEST(NearMiss, FindsTheNameThatIsOneEditAway) {
    for (const char *text : {"ataType", "DaataType", "DxtaType", "DtaaType", "datatype"})
        EXPECT_EQ(near_miss(text, {"DataType", "Description"}), "DataType") << text;
}

TEST(NearMiss, PrefersTheNearerName) {
    EXPECT_EQ(near_miss("FistKey", {"LastKey", "FirstKey"}), "FirstKey");
}

TEST(NearMiss, ChoosesNoneOfTwoThatAreEquallyNear) {
    EXPECT_EQ(near_miss("Ib", {"Id", "If"}), "");
    EXPECT_EQ(near_miss("Ib", {"Id", "Id"}), "Id");
}

TEST(NearMiss, AllowsOneEditForThreeLettersAndThreeAtMost) {
    EXPECT_EQ(near_miss("abcdef", {"xbxdef"}), "xbxdef");
    EXPECT_EQ(near_miss("abcde", {"xbxde"}), "");
    EXPECT_EQ(near_miss("abcdefghijklmno", {"xbxdxfghijklmno"}), "xbxdxfghijklmno");
    EXPECT_EQ(near_miss("abcdefghijklmno", {"xbxdxfxhijklmno"}), "");
}

TEST(NearMiss, TakesTextsOfAnyLength) {
    EXPECT_EQ(near_miss("", {"Id"}), "");
    EXPECT_EQ(near_miss(std::string(64, 'a'), {}), "");
    std::string name(67, 'a');
    EXPECT_EQ(near_miss(std::string(64, 'a'), {name}), name);
    EXPECT_EQ(near_miss(std::string(65, 'a'), {std::string(65, 'a')}), "");
}

TEST(Suggestion, NamesTheNearMissOrWhatIsKnown) {
    EXPECT_EQ(suggestion("Nmae", {"Name", "Id"}), "did you mean `Name`?");
    EXPECT_EQ(suggestion("Colour", {"Name", "Id", "DataType"}), "known are `Name`, `Id` and `DataType`");
}

TEST(Suggestion, ListsFortyNamesAtMost) {
    EXPECT_EQ(suggestion("Colour", {}), "");
    EXPECT_NE(suggestion("Colour", language::name_list(40, "Id")), "");
    EXPECT_EQ(suggestion("Colour", language::name_list(41, "Id")), "");
}

TEST(Suggestion, NamesWhatTheTextIsAPartOf) {
    EXPECT_EQ(suggestion("Type", {"Name", "DataType"}), "did you mean `DataType`?");
    EXPECT_EQ(suggestion("Interval", {"OneInterval", "NewInterval", "Id"}),
              "did you mean `OneInterval` or `NewInterval`?");
    EXPECT_EQ(suggestion("Key", {"AKey", "BKey", "CKey"}), "did you mean `AKey`, `BKey` or `CKey`?");
    EXPECT_EQ(suggestion("Key", {"AKey", "BKey", "CKey", "DKey"}), "known are `AKey`, `BKey`, `CKey` and `DKey`");
}

TEST(MeantBy, IsCertainOfOneEditOnly) {
    EXPECT_TRUE(language::meant_by("datatype", {"DataType"}).is_certain());
    EXPECT_TRUE(language::meant_by("DtaType", {"DataType"}).is_certain());
    EXPECT_FALSE(language::meant_by("DtaTpe", {"DataType"}).is_certain());
    EXPECT_EQ(language::meant_by("DtaTpe", {"DataType"}).name(), "DataType");
    EXPECT_FALSE(language::meant_by("Type", {"DataType"}).is_certain());
    EXPECT_FALSE(language::meant_by("Ib", {"Id", "If"}).is_certain());
}

TEST(TypeSuggestion, KnowsTypesOfOtherLanguages) {
    EXPECT_EQ(language::type_suggestion("int", false), "did you mean `Int32`?");
    EXPECT_EQ(language::type_suggestion("Double", true), "did you mean `Float64`?");
    EXPECT_EQ(language::type_suggestion("bool", false), "did you mean `UInt32` or `Int32`?");
    EXPECT_EQ(language::type_suggestion("unsigned[]", false), "did you mean `UInt32Array`?");
    EXPECT_EQ(language::type_suggestion("FloatArray", false), "did you mean `Float32Array`?");
    EXPECT_FALSE(language::type_meant_by("int", false).is_certain());
}

TEST(TypeSuggestion, SaysWhichTypesAreNotAccepted) {
    EXPECT_EQ(language::type_suggestion("int32", true), "did you mean `Int32`?");
    EXPECT_EQ(language::type_suggestion("SBSS", false), "`SBS` is not supported");
    EXPECT_EQ(language::type_suggestion("SDArry", true), "an element cannot be of type `SDArray`");
    EXPECT_EQ(language::type_suggestion("SDArry", false), "did you mean `SDArray`?");
}

TEST(Listed, PutsAndBeforeTheLastName) {
    EXPECT_EQ(language::listed({}), "");
    EXPECT_EQ(language::listed({"Id"}), "`Id`");
    EXPECT_EQ(language::listed({"Name", "Id"}), "`Name` and `Id`");
}

} // namespace

TEST(suggestions, all_names_that_are_one_edit_away) {
    const language::name_list names = {"S201", "S205", "S215", "S509"};
    EXPECT_EQ(language::one_edit_from("S2015", names), (language::name_list{"S201", "S205", "S215"}));
    EXPECT_EQ(language::one_edit_from("s509", names), language::name_list{"S509"});
    EXPECT_TRUE(language::one_edit_from("S5555", names).empty());
    EXPECT_TRUE(language::one_edit_from(std::string(65, 'S'), names).empty());
}
