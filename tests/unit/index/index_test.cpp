/* What is where in a source. */

#include "index/expressions.h"
#include "index/names.h"
#include "index/stanzas.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>

namespace {

using source_index::line_kind;
using source_index::name_kind;

std::vector<std::string> texts_of(std::string_view source) {
    std::vector<std::string> found;
    for (const source_index::line &each : source_index::lines_of(source))
        found.emplace_back(each.text.of(source));
    return found;
}

TEST(SourceLines, HaveTheTextThatTheCompilerReads) {
    EXPECT_EQ(texts_of("A # x\n\tb=1 // y\n\n /* z\n\tc=\"#\" #\n"),
              (std::vector<std::string>{"A", "b=1", "", "", "c=\"#\""}));
}

TEST(SourceLines, AreReadInPieces) {
    std::string source = std::string(300, 'a') + "\n\tb=1";
    auto lines = source_index::lines_of(source);
    ASSERT_EQ(lines.size(), 3U);
    EXPECT_EQ(lines[1].whole, (source_index::span{254, 300}));
    EXPECT_EQ(lines[2].text.of(source), "b=1");
}

TEST(SourceLines, HaveKinds) {
    std::vector<line_kind> kinds;
    for (const source_index::line &each : source_index::lines_of("A\n b\n\n#\n \"\"\n"))
        kinds.push_back(each.kind);
    EXPECT_EQ(kinds, (std::vector{line_kind::header, line_kind::attribute, line_kind::empty, line_kind::comment,
                                  line_kind::empty}));
}

std::string value_in(std::string_view line) {
    return std::string(source_index::parts_of(line, {0, line.size()}).value.of(line));
}

TEST(Values, AreWithoutQuotes) {
    EXPECT_EQ(value_in("a=b"), "b");
    EXPECT_EQ(value_in("a= b"), " b");
    EXPECT_EQ(value_in("a= \"b c\""), "b c");
    EXPECT_EQ(value_in("a=\"b"), "b");
    EXPECT_EQ(value_in("a=\"b\\\""), "b\\\"");
    EXPECT_EQ(value_in("a=\""), "");
    EXPECT_EQ(value_in("a="), "");
    EXPECT_EQ(value_in("a"), "");
}

TEST(Values, AreWrittenWithQuotesOnlyIfTheyNeedThem) {
    for (const char *plain : {"b", "b c", " b", "a\"b", "a#", "b\\"})
        EXPECT_TRUE(source_index::has_value("\ta=" + source_index::written_value(plain), plain)) << plain;
    EXPECT_EQ(source_index::written_value("b c"), "b c");
    EXPECT_EQ(source_index::written_value("b # c"), "\"b # c\"");
    EXPECT_EQ(source_index::written_value("\"b"), "\"\"b\"");
    EXPECT_EQ(source_index::written_value("#\\"), "#\\"); /* no line has this value */
}

std::vector<std::string> words_of(std::string_view expression) {
    std::vector<std::string> found;
    for (const source_index::expression_name &each : source_index::names_in(expression))
        found.push_back((each.member ? "." : "") + std::string(each.at.of(expression)));
    return found;
}

TEST(Expressions, HaveNames) {
    using words = std::vector<std::string>;
    EXPECT_EQ(words_of("A > 0x1F && _b1<=1e5"), (words{"A", "_b1"}));
    EXPECT_EQ(words_of("A.B == \"C\" || D.E.F"), (words{"A", ".B", "D", ".E", ".F"}));
    EXPECT_EQ(words_of(R"('it\'s A)"), (words{"s", "A"}));
    EXPECT_EQ(words_of(R"(\"A\" B \C)"), (words{"B", "C"}));
    EXPECT_EQ(words_of("1.x"), words{"x"});
    EXPECT_EQ(words_of("\xCE\xB1 + 'x"), words{"\xCE\xB1"});
}

/* Each mention as "name:line", with a '*' where it is defined. */
std::vector<std::string> mentions_in(const std::string &source, std::string_view name) {
    source_index::index whole = source_index::index_of(source);
    source_index::names names = source_index::names_of(source, whole);
    std::vector<std::string> found;
    for (const source_index::mention &each : names.mentions)
        if (names.all[each.name].text == name)
            found.push_back(std::to_string(each.name) + ":" + std::to_string(whole.line_at(each.at.begin) + 1) +
                            (each.defines ? "*" : ""));
    return found;
}

using shown_places = std::vector<std::string>;

TEST(Names, OfALocator) {
    EXPECT_EQ(mentions_in("ControlDefinition\nResourceClass\n\tLocator=A\n"
                          "PersistentClassAttribute\n\tName=A\nPersistentResourceAttribute\n\tName=A\n",
                          "A"),
              (shown_places{"1:3", "0:5*", "1:7*"}));
}

TEST(Names, OfExpressionsAreOfTheSameLevelFirst) {
    std::string source = "ControlDefinition\nDynamicClassAttribute\n\tName=A\nDynamicResourceAttribute\n\tName=A\n"
                         "\tExpression=\"A > B\"\n\tReArmExpression=A\n";
    EXPECT_EQ(mentions_in(source, "A"), (shown_places{"0:3*", "1:5*", "1:6", "1:7"}));
    EXPECT_EQ(mentions_in(source, "B"), shown_places{});
}

TEST(Names, OfElementsBelongToTheirRun) {
    std::string source = "ControlDefinition\nDynamicResourceAttribute\n\tName=A\n\tDataType=SD\n"
                         "DAttrSDDefinition\n\tElementName=E\nDAttrSDDefinition\n\tElementName=F\n"
                         "DynamicResourceAttribute\n\tName=B\n\tExpression=A.F > B.F\n"
                         "DAttrSDDefinition\n\tElementName=F\n";
    EXPECT_EQ(mentions_in(source, "F"), (shown_places{"2:8*", "2:11", "4:11", "4:13*"}));
}

TEST(Names, OfVariableClassesAreShared) {
    EXPECT_EQ(mentions_in("ResourceVariableClass\n\tVariableClass=V\nDynamicResourceAttribute\n\tVariableClass=V\n"
                          "DynamicClassAttribute\n\tVariableClass=V\n",
                          "V"),
              (shown_places{"0:2*", "0:4", "0:6"}));
}

TEST(Names, OfTwoClassesAreTwo) {
    EXPECT_EQ(mentions_in("ControlDefinition\nPersistentResourceAttribute\n\tName=A\n"
                          "ControlDefinition\nPersistentResourceAttribute\n\tName=A\n",
                          "A"),
              (shown_places{"0:3*", "1:6*"}));
}

TEST(Quotes, ContainTheOffsetsBetweenThem) {
    std::string_view text = R"(A == 'b\' && "d\" 'e)";
    std::string inside;
    for (std::size_t at = 0; at <= text.size(); ++at)
        inside += source_index::is_in_quotes(text, at) ? '^' : ' ';
    EXPECT_EQ(inside, "      ^^^     ^^^  ^^");
}

TEST(Numbers, ContinueAfterTheHighest) {
    std::string source = "ControlDefinition\nPersistentResourceAttribute\n\tId=4\nDynamicResourceAttribute\n\tId=7\n"
                         "PersistentClassAttribute\n\tId=9\nResourceAction\nPersistentResourceAttribute\n\tId=5\n";
    source_index::index whole = source_index::index_of(source);
    EXPECT_EQ(whole.next_id(source, whole.stanzas[5]), 8);
    EXPECT_EQ(whole.next_id(source, whole.stanzas[3]), 0);
    EXPECT_EQ(whole.next_id(source, whole.stanzas[4]), 0);
    EXPECT_EQ(whole.next_id(source, whole.stanzas[0]), std::nullopt);
}

TEST(Numbers, AreReadAsTheCompilerReadsThem) {
    std::string source =
        "ControlDefinition\nResourceAction\n\tId=0x1F\nResourceAction\n\tId=010\nResourceAction\n\tId=8\n"
        "ResourceAction\n\tId=x\n";
    source_index::index whole = source_index::index_of(source);
    EXPECT_EQ(whole.next_id(source, whole.stanzas[4]), 32);
    EXPECT_FALSE(whole.is_free_id(source, whole.stanzas[2]));
    EXPECT_FALSE(whole.is_free_id(source, whole.stanzas[3]));
    EXPECT_FALSE(whole.is_free_id(source, whole.stanzas[4]));
    EXPECT_TRUE(whole.is_free_id(source, whole.stanzas[1]));
}

/* Whether the first of two actions with these Ids has one of its own, and the number that the second one may have. */
std::pair<bool, long long> free_and_next(const std::string &one, const std::string &other) {
    std::string source = "ControlDefinition\nResourceAction\n\tId=" + one + "\nResourceAction\n\tId=" + other + "\n";
    source_index::index whole = source_index::index_of(source);
    return {whole.is_free_id(source, whole.stanzas[1]), whole.next_id(source, whole.stanzas[2]).value()};
}

TEST(Numbers, MayBeLarge) {
    using result = std::pair<bool, long long>;
    EXPECT_EQ(free_and_next("2147483646", "0"), (result{true, 2147483647}));
    EXPECT_EQ(free_and_next("2147483647", "1"), (result{true, 0}));
    EXPECT_EQ(free_and_next("0x7fffffff", "2147483647"), (result{false, 0}));
    EXPECT_EQ(free_and_next("4294967295", "0x80000000"), (result{true, 0}));
    EXPECT_EQ(free_and_next("0x80000000", "2147483648"), (result{false, 0}));
    EXPECT_EQ(free_and_next("4294967301", "5"), (result{false, 6})); /* 5 and 2 to the power of 32 */
}

std::vector<std::size_t> owners_in(std::string_view source) {
    std::vector<std::size_t> owners;
    for (const source_index::stanza &each : source_index::index_of(source).stanzas)
        owners.push_back(each.owner);
    return owners;
}

/* Runs of an action follow it, whatever runs are between; those of an attribute follow it at once. */
TEST(Runs, HaveOwners) {
    constexpr std::size_t NONE = source_index::NONE;
    EXPECT_EQ(owners_in("ControlDefinition\nResourceAction\nActionInSDDefinition\nActionOutSDDefinition\n"
                        "PAttrSDDefinition\nActionInSDDefinition\nClassAction\nActionOutSDDefinition\n"
                        "ActionInSDDefinition\nPersistentResourceAttribute\nPAttrSDDefinition\n"
                        "ActionInSDDefinition\nActionOutSDDefinition\n"),
              (std::vector<std::size_t>{NONE, NONE, 1, 1, NONE, 1, NONE, 6, 6, NONE, 9, NONE, NONE}));
}

TEST(Numbers, OfElementsCountInTheirRun) {
    std::string source = "ControlDefinition\nResourceAction\nActionInSDDefinition\n\tElementIndex=0\n"
                         "ActionInSDDefinition\nActionOutSDDefinition\n";
    source_index::index whole = source_index::index_of(source);
    EXPECT_EQ(whole.next_id(source, whole.stanzas[3]), 1);
    EXPECT_EQ(whole.next_id(source, whole.stanzas[4]), 0);
    EXPECT_EQ(whole.stanzas[4].owner, 1U);
}

} // namespace
