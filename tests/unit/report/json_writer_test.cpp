/* Writing JSON piece by piece. */

#include "report/json_writer.h"

#include <gtest/gtest.h>

#include <new>
#include <string>

namespace {

std::string json_of(std::string_view text) {
    std::string json;
    report::append_json(json, text);
    return json;
}

TEST(JsonText, EscapesWhatIsNotPlainAscii) {
    EXPECT_EQ(json_of("a\"b\\c/"), R"("a\"b\\c/")");
    EXPECT_EQ(json_of("\t\n\r\b\f\x1b\x7f"), R"("\t\n\r\b\f\u001b\u007f")");
    EXPECT_EQ(json_of("\u00e4\u20ac\U0001F600"), R"("\u00e4\u20ac\ud83d\ude00")");
    EXPECT_EQ(json_of(std::string_view("\0", 1)), R"("\u0000")");
}

TEST(JsonText, ReplacesWhatIsNotUtf8) {
    EXPECT_EQ(json_of("a\xff\xfe!"), R"("a\ufffd\ufffd!")");
    EXPECT_EQ(json_of("\xe2\x82!"), R"("\ufffd!")");
}

TEST(JsonWriter, IndentsAndSeparates) {
    std::string text;
    report::json_writer to([&text](std::string_view part) { text += part; });
    to.open_object();
    to.add_schema("a.schema.json", 2);
    to.open_list("all");
    to.add_number("ignored", 7);
    to.open_object();
    to.close();
    to.add_null({});
    to.close();
    to.open_list("none");
    to.close();
    to.add_truth("is", true);
    to.close();
    EXPECT_EQ(text, R"({
  "schema": "a.schema.json",
  "version": 2,
  "all": [
    7,
    {},
    null
  ],
  "none": [],
  "is": true
}
)");
}

TEST(JsonWriter, TakesBackMembersThatCannotBeAddedAsAWhole) {
    std::string written;
    report::json_writer to([&](std::string_view part) { written += part; });
    to.open_list();
    EXPECT_THROW(to.add_whole([&] {
        to.open_object();
        to.add_text("text", std::string(100'000, 'x'));
        to.open_list("list");
        to.close();
        throw std::bad_alloc();
    }),
                 std::bad_alloc);
    to.add_whole([&] { to.add_number({}, 1); });
    to.close();
    EXPECT_EQ(written, "[\n  1\n]\n");
}

TEST(JsonWriter, DoesNotKeepALongDocument) {
    size_t longest = 0;
    size_t written = 0;
    report::json_writer to([&](std::string_view part) {
        longest = std::max(longest, part.size());
        written += part.size();
    });
    to.open_list();
    for (int i = 0; i < 100'000; ++i) {
        to.open_object();
        to.add_number("number", 1);
        to.close();
    }
    to.close();
    EXPECT_GT(written, 2'000'000u);
    EXPECT_LT(longest, 100'000u);
}

} // namespace
