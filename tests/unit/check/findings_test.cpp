/* What has been found: counted, taken back, and handed over in order. */

#include "check/findings.h"

#include <gtest/gtest.h>

#include <string>

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
        std::string all;
        count = found.hand_over(
            [&](check::finding &&each) { all += std::string(each.code) + " " + std::to_string(each.at.line) + ", "; });
        return all;
    }

    findings found;
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
    std::vector<size_t> notes;
    found.hand_over([&](check::finding &&each) { notes.push_back(each.notes.size()); });
    EXPECT_EQ(notes, (std::vector<size_t>{1, 0}));
}

} // namespace
