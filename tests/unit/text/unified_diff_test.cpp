/* What changed in a text, as patch(1) reads it. */

#include "text/unified_diff.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

namespace {

std::string diff(std::string_view before, std::string_view after) {
    std::string whole;
    text::unified_diff("a", "b", before, after, [&](std::string_view piece) { whole += piece; });
    return whole;
}

TEST(UnifiedDiff, IsEmptyWithoutAChange) {
    EXPECT_EQ(diff("", ""), "");
    EXPECT_EQ(diff("1\n2\n", "1\n2\n"), "");
}

TEST(UnifiedDiff, ShowsThreeLinesAroundAChange) {
    EXPECT_EQ(diff("1\n2\n3\n4\n5\n6\n7\n8\n9\n", "1\n2\n3\n4\nfive\n6\n7\n8\n9\n"),
              "--- a\n+++ b\n@@ -2,7 +2,7 @@\n 2\n 3\n 4\n-5\n+five\n 6\n 7\n 8\n");
}

TEST(UnifiedDiff, ShowsAMovedLine) {
    EXPECT_EQ(diff("1\n2\n3\n", "2\n3\n1\n"), "--- a\n+++ b\n@@ -1,3 +1,3 @@\n-1\n 2\n 3\n+1\n");
}

TEST(UnifiedDiff, CountsNoLinesFromTheLineInFront) {
    EXPECT_EQ(diff("", "1\n"), "--- a\n+++ b\n@@ -0,0 +1 @@\n+1\n");
    EXPECT_EQ(diff("1\n2\n", ""), "--- a\n+++ b\n@@ -1,2 +0,0 @@\n-1\n-2\n");
}

TEST(UnifiedDiff, JoinsChangesThatShareLines) {
    EXPECT_EQ(diff("a\n1\n2\n3\n4\n5\n6\nb\n", "A\n1\n2\n3\n4\n5\n6\nB\n"),
              "--- a\n+++ b\n@@ -1,8 +1,8 @@\n-a\n+A\n 1\n 2\n 3\n 4\n 5\n 6\n-b\n+B\n");
    EXPECT_EQ(diff("a\n1\n2\n3\n4\n5\n6\n7\nb\n", "A\n1\n2\n3\n4\n5\n6\n7\nB\n"),
              "--- a\n+++ b\n@@ -1,4 +1,4 @@\n-a\n+A\n 1\n 2\n 3\n@@ -6,4 +6,4 @@\n 5\n 6\n 7\n-b\n+B\n");
}

TEST(UnifiedDiff, SaysWhereANewlineIsMissing) {
    EXPECT_EQ(diff("1\n2", "1\n2\n"), "--- a\n+++ b\n@@ -1,2 +1,2 @@\n 1\n-2\n\\ No newline at end of file\n+2\n");
}

TEST(UnifiedDiff, FindsALineThatIs64LinesAway) {
    std::string removed;
    std::string shown;
    for (int i = 0; i < 64; ++i) {
        removed += std::to_string(i) + "\n";
        shown += "-" + std::to_string(i) + "\n";
    }
    EXPECT_EQ(diff(removed + "same\n", "same\n"), "--- a\n+++ b\n@@ -1,65 +1 @@\n" + shown + " same\n");
}

TEST(UnifiedDiff, TakesManyChangedLines) {
    std::string before;
    std::string after;
    for (int i = 0; i < 300; ++i) {
        before += std::to_string(i) + "\r\n";
        after += std::to_string(i) + "\n";
    }
    std::string made = diff(before, after);
    EXPECT_TRUE(made.starts_with("--- a\n+++ b\n@@ -1,300 +1,300 @@\n-0\r\n-1\r\n"));
    EXPECT_TRUE(made.ends_with("+298\n+299\n"));
}

TEST(UnifiedDiff, ShowsManyChangesThatShareLines) {
    std::string before;
    std::string after;
    std::string shown;
    for (int i = 0; i < 3000; ++i) {
        before += "a\nsame\n";
        after += "b\nsame\n";
        shown += "-a\n+b\n same\n";
    }
    EXPECT_EQ(diff(before, after), "--- a\n+++ b\n@@ -1,6000 +1,6000 @@\n" + shown);
}

TEST(UnifiedDiff, IsPassedOnInPieces) {
    std::string lines;
    for (int i = 0; i < 100000; ++i)
        lines += "abcde\n";
    std::size_t pieces = 0;
    std::size_t largest = 0;
    text::unified_diff("a", "b", "", lines, [&](std::string_view piece) {
        ++pieces;
        largest = std::max(largest, piece.size());
    });
    EXPECT_GE(pieces, 10u);
    EXPECT_LE(largest, 65536u);
}

TEST(UnifiedDiff, TakesALineThatIsLongerThanAPiece) {
    std::string line(100000, 'x');
    EXPECT_EQ(diff("1\n", line + "\n2\n" + line),
              "--- a\n+++ b\n@@ -1 +1,3 @@\n-1\n+" + line + "\n+2\n+" + line + "\n\\ No newline at end of file\n");
}

TEST(ChangedLines, AreWholeLinesOfBothTexts) {
    std::vector<std::string> shown;
    for (const text::line_change &each : text::changed_lines("a\nb\nc\nd\ne", "a\nB\nc\nd\nx\ny"))
        shown.push_back(std::to_string(each.begin) + "-" + std::to_string(each.end) + " " + std::string(each.by));
    EXPECT_EQ(shown, (std::vector<std::string>{"2-4 B\n", "8-9 x\ny"}));
    EXPECT_TRUE(text::changed_lines("a\n", "a\n").empty());
    EXPECT_EQ(text::changed_lines("", "a\n").front().by, "a\n");
    EXPECT_EQ(text::changed_lines("a\nb\n", "a\n").front().begin, 2U);
}

} // namespace
