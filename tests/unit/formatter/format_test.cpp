/* Formatting: how lines, comments and empty lines change. */

#include "formatter/format.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>

namespace {

/* A class that needs no formatting, and what is appended to it. */
std::string class_with(std::string_view more) {
    return std::string("ControlDefinition\n\tFileVersion=1.0.0.0\n\nResourceClass\n\tDescription=1\n\tDisplayName=2\n"
                       "\tProperties=HasResources\n\tClassPermTemplate=0\n\tResourcePermTemplate=0\n\tName=Pump\n\n"
                       "ClassToManagerMapping\n\tResourceManager=M\n\tFirstKey=1\n\tLastKey=2\n\tMessageCatalog=m\n"
                       "\tDescriptiveMessageSet=1\n")
        .append(more);
}

formatter::formatted format(std::string_view source, const formatter::options &how = {}) {
    return formatter::format(source, "source", how);
}

/* The formatted form of lines that follow a class. */
std::string after_class(std::string_view more, const formatter::options &how = {}) {
    formatter::formatted result = format(class_with(more), how);
    EXPECT_EQ(result.refusal, "");
    EXPECT_EQ(format(result.text, how).text, result.text) << "not the same again";
    EXPECT_EQ(result.text.substr(0, class_with("").size()), class_with(""));
    return result.text.substr(class_with("").size());
}

constexpr formatter::options REORDERED = {.reorder = true};

TEST(Format, LeavesAFormattedSource) {
    formatter::formatted result = format(class_with(""));
    EXPECT_EQ(result.text, class_with(""));
    EXPECT_TRUE(result.changes.empty());
}

TEST(Format, IndentsAttributesByOneTab) {
    EXPECT_EQ(
        after_class("\nResourceVariableClass\n  VariableClass=S\n\t\tObservationInterval=9\n \tReportingInterval=9\n"),
        "\nResourceVariableClass\n\tVariableClass=S\n\tObservationInterval=9\n\tReportingInterval=9\n");
}

TEST(Format, RemovesBlanksAtTheEndsOfLines) {
    EXPECT_EQ(after_class("\nResourceVariableClass \t\n\tVariableClass=S  \n\tObservationInterval=9\t\n \t\n"
                          "\tReportingInterval=9 # nine \t\n# end  \n"),
              "\nResourceVariableClass\n\tVariableClass=S\n\tObservationInterval=9\n\n"
              "\tReportingInterval=9 # nine\n# end\n");
}

/* Blanks in front of a quote do not belong to the value; blanks in front of any other text do. */
TEST(Format, RemovesBlanksOnlyInFrontOfAQuote) {
    EXPECT_EQ(after_class("\nResourceVariableClass\n\tVariableClass= \t\" S\"\n\tObservationInterval= 9\n"
                          "\tReportingInterval=9\n\tAlias= a  b\n"),
              "\nResourceVariableClass\n\tVariableClass=\" S\"\n\tObservationInterval= 9\n\tReportingInterval=9\n"
              "\tAlias= a  b\n");
}

TEST(Format, PutsOneEmptyLineBetweenStanzas) {
    EXPECT_EQ(
        after_class("ResourceVariableClass\n\tVariableClass=S\n\tObservationInterval=9\n\tReportingInterval=9\n\n \n\n"
                    "ResourceVariableClass\n\tVariableClass=T\n\tObservationInterval=9\n\tReportingInterval=9\n"),
        "\nResourceVariableClass\n\tVariableClass=S\n\tObservationInterval=9\n\tReportingInterval=9\n\n"
        "ResourceVariableClass\n\tVariableClass=T\n\tObservationInterval=9\n\tReportingInterval=9\n");
}

TEST(Format, KeepsEmptyLinesInsideStanzas) {
    constexpr std::string_view kept = "\nResourceVariableClass\n\n\tVariableClass=S\n\n\n\tObservationInterval=9\n"
                                      "\tReportingInterval=9\n";
    EXPECT_EQ(after_class(kept), kept);
}

TEST(Format, RemovesEmptyLinesAtBothEnds) {
    EXPECT_EQ(format("\n \n" + class_with("\n\t\n")).text, class_with(""));
}

TEST(Format, EndsTheLastLine) {
    std::string whole = class_with("");
    EXPECT_EQ(format(whole.substr(0, whole.size() - 1)).text, whole);
}

/* Comments in column 1 belong to the stanza below them, others to the one above. */
TEST(Format, PutsTheEmptyLineAboveAStanzasComments) {
    EXPECT_EQ(after_class("  # above\n# below\n// too\nResourceVariableClass\n\tVariableClass=S\n"
                          "\tObservationInterval=9\n\tReportingInterval=9\n"),
              "\t# above\n\n# below\n// too\nResourceVariableClass\n\tVariableClass=S\n\tObservationInterval=9\n"
              "\tReportingInterval=9\n");
}

TEST(Format, LeavesTheAuthorsEmptyLineBetweenComments) {
    constexpr std::string_view kept = "# above\n\n# below\n\nResourceVariableClass\n\tVariableClass=S\n"
                                      "\tObservationInterval=9\n\tReportingInterval=9\n";
    EXPECT_EQ(after_class(kept), kept);
}

TEST(Format, KeepsTheColumnsOfComments) {
    EXPECT_EQ(after_class("\nResourceVariableClass\n    VariableClass=S          # one\n"
                          "                             # more\n  ObservationInterval=9      # two\n"
                          "  ReportingInterval=9\t# three\n"),
              "\nResourceVariableClass\n\tVariableClass=S      # one\n                             # more\n"
              "\tObservationInterval=9 # two\n\tReportingInterval=9\t# three\n");
}

/* The text reaches the column where the comment was. */
TEST(Format, MovesACommentTogetherWithThoseBelowIt) {
    EXPECT_EQ(after_class("\nResourceVariableClass\n VariableClass=S # one\n                 // more\n"
                          " ObservationInterval=9#two\n ReportingInterval=9\n"),
              "\nResourceVariableClass\n\tVariableClass=S # one\n                        // more\n"
              "\tObservationInterval=9#two\n\tReportingInterval=9\n");
}

TEST(Format, IndentsCommentsByOneTabOrNot) {
    EXPECT_EQ(after_class("\nResourceVariableClass\n# a\n    # b\n\tVariableClass=S\n\t\t/* c */\n"
                          "\tObservationInterval=9\n\tReportingInterval=9\n"),
              "\nResourceVariableClass\n# a\n\t# b\n\tVariableClass=S\n\t/* c */\n\tObservationInterval=9\n"
              "\tReportingInterval=9\n");
}

/* To the compiler the rest of a line with more than 254 bytes is another line. */
TEST(Format, LeavesLongLinesAlone) {
    std::string longer = "    # " + std::string(246, 'x') + "  # more  \n";
    EXPECT_EQ(after_class(longer), longer);
    EXPECT_EQ(after_class(longer.substr(0, longer.size() - 1)), longer.substr(0, longer.size() - 1));
}

TEST(Format, FormatsLinesOf253Bytes) {
    std::string comment = "# " + std::string(247, 'x');
    EXPECT_EQ(after_class("    " + comment + "\n"), "\t" + comment + "\n");
    EXPECT_EQ(after_class("    " + comment), "\t" + comment + "\n");
}

/* Keeping the comment's column would take 14 bytes more than the line has. */
TEST(Format, MakesNoLineLongerThanTheCompilerReads) {
    std::string comment = "# " + std::string(226, 'x');
    EXPECT_EQ(after_class("\nResourceVariableClass\n\tVariableClass=S\n\tObservationInterval=9\n"
                          "\t\t\tReportingInterval=9  " +
                          comment + "\n"),
              "\nResourceVariableClass\n\tVariableClass=S\n\tObservationInterval=9\n\tReportingInterval=9  " + comment +
                  "\n");
}

/* A carriage return is a part of a value, or of a comment, like any other character. */
TEST(Format, KeepsCarriageReturns) {
    EXPECT_EQ(
        after_class("\nResourceVariableClass\n  VariableClass=S\r\n\tObservationInterval=9\n\tReportingInterval=9\n"
                    "  # comment \r\n"),
        "\nResourceVariableClass\n\tVariableClass=S\r\n\tObservationInterval=9\n\tReportingInterval=9\n"
        "\t# comment \r\n");
}

/* Without the blanks there would be a carriage return at the end of a line, which is something else. */
TEST(Format, KeepsBlanksAfterACarriageReturn) {
    EXPECT_EQ(after_class("  # comment\r \n"), "  # comment\r \n");
}

TEST(Format, KeepsSignsInsideQuotes) {
    constexpr std::string_view kept = "\nResourceVariableClass\n\tVariableClass=\"a  # b // c\"\n"
                                      "\tObservationInterval=9\n\tReportingInterval=9\n\tAlias=a/b # c\n";
    EXPECT_EQ(after_class(kept), kept);
}

TEST(Format, KeepsWhatFollowsANul) {
    std::string kept = "\nResourceVariableClass\n\tVariableClass=S\n\tObservationInterval=9\n  ReportingInterval=9 ";
    kept.push_back('\0');
    kept += " rest \n";
    EXPECT_EQ(after_class(kept), kept);
}

TEST(Format, KeepsLinesOfQuotes) {
    constexpr std::string_view kept = "\nResourceVariableClass\n\tVariableClass=S\n  \"\" \n\tObservationInterval=9\n"
                                      "\tReportingInterval=9\n\tAlias=\"\"\n";
    EXPECT_EQ(after_class(kept), kept);
}

TEST(Format, LeavesASourceWithErrorsAlone) {
    formatter::formatted result = format(class_with("ResourceClas\n  Name=x\n"));
    EXPECT_EQ(result.text, class_with("ResourceClas\n  Name=x\n"));
    EXPECT_TRUE(result.changes.empty());
    EXPECT_EQ(result.refusal, "it has errors");
    ASSERT_TRUE(result.error);
    EXPECT_EQ(result.error->at.line, 18);
}

TEST(Format, LeavesAByteOrderMarkToTheAuthor) {
    EXPECT_TRUE(format("\xEF\xBB\xBF" + class_with("")).is_left_alone());
}

/* ---- Changes ---------------------------------------------------------------------------------------------------- */

std::string shown(const std::vector<formatter::change> &changes) {
    std::string text;
    for (const formatter::change &each : changes)
        text += std::to_string(each.begin) + "+" + std::to_string(each.size) + " '" + each.text + "'\n";
    return text;
}

const std::string LOOSE = "ResourceVariableClass\n  VariableClass=S\n\tObservationInterval=9\n  ReportingInterval=9";

TEST(FormatChanges, AreNoLargerThanNecessary) {
    EXPECT_EQ(class_with("").size(), 273U);
    EXPECT_EQ(shown(format(class_with(LOOSE)).changes), "273+0 '\n'\n295+2 '\t'\n336+2 '\t'\n357+0 '\n'\n");
}

TEST(FormatChanges, AreThoseOfTheLinesThatAreWanted) {
    std::string source = class_with(LOOSE);
    auto changed = [&source](std::size_t first, std::size_t last) {
        return shown(format(source, {.only = formatter::line_range{first, last}}).changes);
    };
    EXPECT_EQ(changed(17, 17), "273+0 '\n'\n");
    EXPECT_EQ(changed(18, 19), "295+2 '\t'\n");
    EXPECT_EQ(changed(20, 20), "336+2 '\t'\n357+0 '\n'\n");
    EXPECT_EQ(changed(20, 90), "336+2 '\t'\n357+0 '\n'\n");
    EXPECT_EQ(changed(0, 16), "");
}

/* ---- The order of attributes ------------------------------------------------------------------------------------ */

TEST(FormatOrder, StaysUnlessItIsWanted) {
    constexpr std::string_view kept = "\nResourceVariableClass\n\tReportingInterval=9\n\tObservationInterval=8\n"
                                      "\tVariableClass=S\n";
    EXPECT_EQ(after_class(kept), kept);
    EXPECT_EQ(after_class(kept, REORDERED), "\nResourceVariableClass\n\tVariableClass=S\n\tObservationInterval=8\n"
                                            "\tReportingInterval=9\n");
}

TEST(FormatOrder, EndsTheLastLine) {
    EXPECT_EQ(after_class("\nResourceVariableClass\n\tReportingInterval=9\n\tObservationInterval=8\n\tVariableClass=S",
                          REORDERED),
              "\nResourceVariableClass\n\tVariableClass=S\n\tObservationInterval=8\n\tReportingInterval=9\n");
}

TEST(FormatOrder, TakesCommentsAlong) {
    EXPECT_EQ(after_class("\nResourceVariableClass\n\t# after how long\n\tReportingInterval=9   # seconds\n"
                          "\t                      # or so\n\tObservationInterval=8\n# which\n\tVariableClass=S\n"
                          "\t# the end\n",
                          REORDERED),
              "\nResourceVariableClass\n# which\n\tVariableClass=S\n\tObservationInterval=8\n\t# after how long\n"
              "\tReportingInterval=9   # seconds\n\t                      # or so\n\t# the end\n");
}

TEST(FormatOrder, KeepsTheAuthorsGroups) {
    EXPECT_EQ(after_class("\nResourceVariableClass # header\n                      # too\n\tReportingInterval=9\n"
                          "\tObservationInterval=8\n\n\tVariableClass=S\n",
                          REORDERED),
              "\nResourceVariableClass # header\n                      # too\n\tObservationInterval=8\n"
              "\tReportingInterval=9\n\n\tVariableClass=S\n");
}

/* Texts are stored in the order of the source, and message numbers belong to the value above them. */
TEST(FormatOrder, KeepsTheOrderOfWhatIsStoredInOrder) {
    EXPECT_EQ(after_class("\nPersistentResourceAttribute\n\tId=0\n\tDescription=1\n\tDisplayName=2\n\tDataType=String\n"
                          "\tName=A\n\tVarietyRange=3,4\n\tVarietyRange=1,2\n\tDefaultValue=b\n\tValidValue=b\n"
                          "\tValueDisplayName=7\n\tValidValue=a\n\tGroupName=5\n\tProperties=Public\n\tGroupID=6\n",
                          REORDERED),
              "\nPersistentResourceAttribute\n\tName=A\n\tDescription=1\n\tDisplayName=2\n\tId=0\n\tDataType=String\n"
              "\tVarietyRange=3,4\n\tVarietyRange=1,2\n\tGroupID=6\n\tGroupName=5\n\tProperties=Public\n"
              "\tDefaultValue=b\n\tValidValue=b\n\tValueDisplayName=7\n\tValidValue=a\n");
}

/* In its stanza a number that overflows may only follow a typed 0. */
TEST(FormatOrder, LeavesAStanzaInWhichANumberOverflows) {
    constexpr std::string_view kept =
        "\nPersistentResourceAttribute\n\tId=0\n\tName=A\n\tDescription=1\n\tDisplayName=2\n"
        "\tDataType=UInt32\n\tVarietyRange=1,2\n\tValidValue=0\n"
        "\tGroupID=99999999999999999999\n";
    EXPECT_EQ(after_class(kept, REORDERED), kept);
}

/* It may be the header of a stanza, which has other attributes. */
TEST(FormatOrder, EndsWithALineThatIsNotTakenApart) {
    constexpr std::string_view first = "\nResourceVariableClass\n\tVariableClass=S\n\tObservationInterval=9\n"
                                       "\tReportingInterval=9\n\n";
    constexpr std::string_view other = "\tReportingInterval=9\n\tObservationInterval=8\n\tVariableClass=T\n";
    std::string by_return = std::string(first) + "ResourceVariableClass # \r \n" + std::string(other);
    EXPECT_EQ(after_class(by_return, REORDERED), by_return);
    std::string by_length =
        std::string(first) + "# " + std::string(252, '-') + "ResourceVariableClass\n" + std::string(other);
    EXPECT_EQ(after_class(by_length, REORDERED), by_length);
}

TEST(FormatOrder, TakesLinesWithoutAValueForComments) {
    EXPECT_EQ(after_class("\nResourceVariableClass\n\tNoSuch=\"\"\n\tObservationInterval=8\n\tReportingInterval=9\n"
                          "\tVariableClass=S\n",
                          REORDERED),
              "\nResourceVariableClass\n\tVariableClass=S\n\tNoSuch=\"\"\n\tObservationInterval=8\n"
              "\tReportingInterval=9\n");
}

} // namespace
