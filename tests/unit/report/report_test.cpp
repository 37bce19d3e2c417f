/* Findings as text, and their places in the forms of other programs. */

#include "report/places.h"
#include "report/report.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using check::place;
using report::excerpt_of;

TEST(Prefix, HasAsMuchAsThePlace) {
    EXPECT_EQ(report::prefix_of("a.cdefsrc", {}), "a.cdefsrc: ");
    EXPECT_EQ(report::prefix_of("a.cdefsrc", {7, 0, 0}), "a.cdefsrc:7: ");
    EXPECT_EQ(report::prefix_of("a.cdefsrc", {7, 3, 2}), "a.cdefsrc:7:3: ");
    EXPECT_EQ(report::prefix_of("a\033[1m", {}), "a?[1m: ");
}

TEST(Excerpt, MarksEachCharacter) {
    EXPECT_EQ(excerpt_of({7, 3, 4}, "a Name=x"), "    7 | a Name=x\n      |   ^~~~\n");
    EXPECT_EQ(excerpt_of({7, 2, 1}, "\tx"), "    7 | \tx\n      | \t^\n");
    EXPECT_EQ(excerpt_of({1234567, 1, 1}, "x"), "1234567 | x\n        | ^\n");
}

TEST(Excerpt, CountsCharactersNotBytes) {
    EXPECT_EQ(excerpt_of({7, 4, 4}, "\u00e4=\u00f6\u00fc"), "    7 | \u00e4=\u00f6\u00fc\n      |   ^~\n");
    EXPECT_EQ(excerpt_of({7, 2, 2}, "\xff\xfe\xfd"), "    7 | ???\n      |  ^~\n");
}

TEST(Excerpt, StaysWithinTheLine) {
    EXPECT_EQ(excerpt_of({7, 9, 9}, "abc"), "    7 | abc\n      |    ^\n");
    EXPECT_EQ(excerpt_of({7, 0, 0}, "abc"), "");
    EXPECT_EQ(excerpt_of({}, ""), "");
}

TEST(Uri, EscapesWhatMustNotBeInIt) {
    EXPECT_EQ(report::uri_of("dir/a-b_c.d~1"), "dir/a-b_c.d~1");
    EXPECT_EQ(report::uri_of("a b%\xc3\xa4"), "a%20b%25%C3%A4");
    EXPECT_EQ(report::uri_of("a:b?#[]"), "a%3Ab%3F%23%5B%5D");
    EXPECT_EQ(report::uri_of("/a b/c"), "file:///a%20b/c");
}

TEST(Characters, AreThoseThatBeginInTheBytes) {
    EXPECT_EQ(report::characters_in("\u00e4bc", 0), 0u);
    EXPECT_EQ(report::characters_in("\u00e4bc", 3), 2u);
    EXPECT_EQ(report::characters_in("\u00e4bc", 99), 3u);
}

TEST(Text, ShowsAFindingAndItsNotes) {
    check::finding found = {.error = false,
                            .code = "S509",
                            .name = "octal",
                            .text = "a leading 0",
                            .at = {3, 5, 3},
                            .source = "\tId=010",
                            .notes = {{{3, 5, 3}, "here"}, {{1, 1, 2}, "there", "ab"}}};
    EXPECT_EQ(report::as_text("f", found), "f:3:5: warning: a leading 0 [S509 octal]\n"
                                           "    3 | \tId=010\n      | \t   ^~~\n"
                                           "f:3:5: note: here\n"
                                           "f:1:1: note: there\n    1 | ab\n      | ^~\n");
}

using make_form = std::unique_ptr<report::writer>(report::output);

/* What a form makes of one source with one finding. */
std::string written(make_form *make, const check::finding &found) {
    std::string text;
    std::unique_ptr<report::writer> to = make([&text](std::string_view part) { text += part; });
    to->begin_source("f");
    to->add(found);
    to->end_source({2, 3});
    to->close();
    return text;
}

/* A finding in "\u00e4b". */
const check::finding AFTER_UMLAUT = {
    .error = true, .code = "S106", .name = "error", .text = "t", .at = {3, 3, 1}, .source = "\u00e4b", .notes = {}};

TEST(Sarif, HasColumnsInCharacters) {
    std::string text = written(report::sarif_form, AFTER_UMLAUT);
    EXPECT_NE(text.find("\"startColumn\":2,"), std::string::npos);
    EXPECT_NE(text.find("\"endColumn\":3"), std::string::npos);
}

TEST(Json, HasPlacesInBytesAndInCharacters) {
    EXPECT_EQ(written(report::json_form, AFTER_UMLAUT), R"({
  "schema": "cdef-check.schema.json",
  "version": 1,
  "sources": [
    {
      "file": "f",
      "findings": [
        {
          "code": "S106",
          "severity": "error",
          "name": "error",
          "message": "t",
          "line": 3,
          "column": 3,
          "length": 1,
          "character_column": 2,
          "character_length": 1,
          "source": "\u00e4b",
          "notes": [],
          "fix": null
        }
      ],
      "errors": 2,
      "warnings": 3
    }
  ],
  "errors": 2,
  "warnings": 3
}
)");
}

} // namespace
