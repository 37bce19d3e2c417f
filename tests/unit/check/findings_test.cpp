/* Findings are counted, withdrawn, and passed on in order. */

#include "check/findings.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <utility>
#include <vector>

namespace {

using check::findings;

class Findings : public testing::Test {
protected:
    void error(int line) {
        found.error(message_of(MSG_NO_EQUALS), {line, 1, 1}, "source", "error");
    }
    void warn(check::warning_id id, int line) {
        found.warn(check::warnings[id], {line, 1, 1}, "source", "warning", {});
    }
    /* "S103 5, " for each. */
    std::string handed_over() {
        count = found.close();
        std::string all;
        for (const check::finding &each : given)
            all += std::string(each.code) + " " + std::to_string(each.at.line) + ", ";
        return all;
    }

    std::vector<check::finding> given;
    int open_line = 0; /* whose warnings may still be withdrawn */
    findings found{[this](check::finding &&each) { given.push_back(std::move(each)); },
                   [this](check::warning_id, int line) { return line == open_line; }};
    check::totals count;
};

TEST_F(Findings, AreHandedOverByLineAndErrorsFirst) {
    warn(check::OCTAL, 2);
    warn(check::NARROWED, 2);
    error(2);
    warn(check::SD_WITHOUT_RUN, 1);
    EXPECT_EQ(handed_over(), "S502 1, S103 2, S509 2, S508 2, ");
    EXPECT_EQ(count.errors, 1u);
    EXPECT_EQ(count.warnings, 3u);
}

TEST_F(Findings, TakeBackTheWarningsOfALine) {
    warn(check::OCTAL, 1);
    warn(check::OCTAL, 2);
    warn(check::OCTAL, 2);
    warn(check::NARROWED, 2);
    warn(check::OCTAL, 3);
    found.retract(check::OCTAL, 2);
    found.retract(check::OCTAL, 2);
    found.retract(check::INCOMPLETE, 2);
    EXPECT_EQ(handed_over(), "S509 1, S508 2, S509 3, ");
    EXPECT_EQ(count.warnings, 3u);
}

TEST_F(Findings, KeepTheNoteOfAWarning) {
    found.warn(check::warnings[check::OCTAL], {1, 0, 0}, "", "text", {{1, 0, 0}, "note"});
    found.warn(check::warnings[check::OCTAL], {1, 0, 0}, "", "text", {{1, 0, 0}, ""});
    found.close();
    EXPECT_EQ(given.at(0).notes.size(), 1u);
    EXPECT_EQ(given.at(1).notes.size(), 0u);
}

TEST_F(Findings, AreHandedOverBeforeTheEndIfThereAreMany) {
    for (int line = 1; line <= 10'000; ++line)
        error(line);
    EXPECT_GT(given.size(), 8'000u);
    EXPECT_LT(given.size(), 10'000u);
    EXPECT_EQ(found.close().errors, 10'000u);
    for (size_t i = 0; i < given.size(); ++i)
        EXPECT_EQ(given[i].at.line, static_cast<int>(i) + 1);
}

check::correction of_edits(size_t count) {
    return {check::certainty::certain, std::vector<check::edit>(count)};
}

TEST_F(Findings, AreHandedOverIfTheirNotesAndEditsAreMany) {
    found.error(message_of(MSG_NO_EQUALS), {1, 1, 1}, "source", "error").fix = of_edits(10'000);
    error(2);
    found.error(message_of(MSG_NO_EQUALS), {3, 1, 1}, "source", "error").notes.resize(6'383);
    error(4);
    EXPECT_EQ(given.size(), 0u); /* 16,383 of them wait */
    found.error(message_of(MSG_NO_EQUALS), {5, 1, 1}, "source", "error").notes.resize(1);
    EXPECT_EQ(given.size(), 0u);
    error(6);
    EXPECT_EQ(given.size(), 2u);
    EXPECT_EQ(handed_over(), "S103 1, S103 2, S103 3, S103 4, S103 5, S103 6, ");
}

TEST_F(Findings, CountTheEditsOfALaterCorrection) {
    error(1);
    error(2);
    found.correct(MSG_NO_EQUALS, 1, [] { return of_edits(16'384); });
    error(3);
    EXPECT_EQ(given.size(), 1u);
    EXPECT_EQ(given.at(0).fix.edits.size(), 16'384u);
    found.correct(MSG_NO_EQUALS, 1, [] { return of_edits(1); }); /* has been handed over */
    found.correct(MSG_NO_EQUALS, 3, [] { return of_edits(2); });
    found.close();
    EXPECT_EQ(given.at(1).fix.edits.size(), 0u);
    EXPECT_EQ(given.at(2).fix.edits.size(), 2u);
}

TEST_F(Findings, WaitForOnesOfEarlierLines) {
    for (int line = 1; line <= 10'000; ++line) {
        error(line);
        if (line % 100 == 0)
            warn(check::OCTAL, line - 99);
    }
    found.close();
    auto by_line = [](const check::finding &a, const check::finding &b) { return a.at.line < b.at.line; };
    EXPECT_EQ(given.size(), 10'100u);
    EXPECT_TRUE(std::is_sorted(given.begin(), given.end(), by_line));
}

TEST_F(Findings, CanBeTakenBackAsLongAsTheyMustBe) {
    open_line = 1;
    warn(check::OCTAL, 1);
    warn(check::OCTAL, 2);
    for (int line = 3; line <= 10'000; ++line)
        error(line);
    EXPECT_EQ(given.front().at.line, 2);
    found.retract(check::OCTAL, 1);
    EXPECT_EQ(found.close().warnings, 1u);
    EXPECT_EQ(given.size(), 9'999u);
}

} // namespace
