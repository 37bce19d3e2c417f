/* The forms in which findings are written, and their fingerprints. */

#include "report/fingerprint.h"
#include "report/report.h"

#include <gtest/gtest.h>

#include <string>

namespace {

check::finding finding_at(bool error, int line, const std::string &source = "abc") {
    return {.error = error,
            .code = error ? "S106" : "S509",
            .name = error ? "error" : "octal",
            .text = "text " + std::to_string(line),
            .at = {line, 1, 1},
            .source = source,
            .notes = {}};
}

/* A form at work, and what it has written. */
struct written {
    explicit written(const report::text_settings &settings)
        : form(report::text_form([this](std::string_view part) { text += part; }, settings)) {
        form->begin_source("f");
    }
    explicit written(std::unique_ptr<report::writer> make(report::output))
        : form(make([this](std::string_view part) { text += part; })) {
        form->begin_source("f");
    }

    /* The lines that are findings, without source and code: "f:1:1: error: text 1", and the summary. */
    std::string lines() const {
        std::string all;
        for (size_t at = 0; at < text.size(); at = text.find('\n', at) + 1) {
            std::string line = text.substr(at, text.find('\n', at) - at);
            if (line.front() != ' ')
                all += line.substr(0, line.find(" [")) + "\n";
        }
        return all;
    }

    std::string text;
    std::unique_ptr<report::writer> form;
};

TEST(TextForm, LeavesOutWarningsBeforeErrors) {
    written to({.shown_max = 3});
    for (int line = 1; line <= 4; ++line)
        to.form->add(finding_at(false, line));
    to.form->add(finding_at(true, 5));
    to.form->add(finding_at(true, 6));
    to.form->end_source({2, 4});
    EXPECT_EQ(to.lines(), "");
    to.form->close();
    EXPECT_EQ(to.lines(), "f:1:1: warning: text 1\nf:5:1: error: text 5\nf:6:1: error: text 6\n"
                          "2 errors and 4 warnings; 3 not shown (--max 0 shows all)\n");
}

TEST(TextForm, CountsOverAllSources) {
    written to({.shown_max = 2});
    to.form->add(finding_at(true, 1));
    to.form->end_source({1, 0});
    to.form->begin_source("g");
    to.form->end_source({});
    to.form->begin_source("h");
    to.form->add(finding_at(true, 2));
    to.form->add(finding_at(true, 3));
    to.form->end_source({2, 0});
    to.form->close();
    EXPECT_EQ(to.lines(), "f:1:1: error: text 1\nh:2:1: error: text 2\n"
                          "3 errors and 0 warnings in 2 of 3 sources; 1 not shown (--max 0 shows all)\n");
}

TEST(TextForm, WritesAtOnceWhatIsCertain) {
    written to({.shown_max = 100});
    to.form->add(finding_at(true, 1));
    to.form->add(finding_at(false, 2));
    to.form->add(finding_at(true, 3));
    to.form->end_source({2, 1});
    EXPECT_EQ(to.lines(), "f:1:1: error: text 1\n");
}

TEST(TextForm, KeepsNothingWithoutALimit) {
    written to({.shown_max = 0});
    for (int line = 1; line <= 10'000; ++line)
        to.form->add(finding_at(false, line));
    EXPECT_GT(to.text.size(), 300'000u);
}

/* A warning is certain once 1,024 findings wait after it. */
TEST(TextForm, KeepsFewWhateverTheLimit) {
    written to({.shown_max = 1'030});
    for (int line = 1; line <= 1'030; ++line)
        to.form->add(finding_at(false, line));
    to.form->end_source({0, 1'030});
    EXPECT_EQ(to.lines(), "f:1:1: warning: text 1\nf:2:1: warning: text 2\nf:3:1: warning: text 3\n"
                          "f:4:1: warning: text 4\nf:5:1: warning: text 5\nf:6:1: warning: text 6\n");
    for (int line = 1'031; line <= 2'060; ++line)
        to.form->add(finding_at(true, line));
    to.form->close();
    std::string lines = to.lines();
    EXPECT_EQ(std::count(lines.begin(), lines.end(), '\n'), 1'031);
    EXPECT_NE(lines.find("f:6:1: warning: text 6\nf:1031:1: error: text 1031\n"), std::string::npos);
    EXPECT_NE(lines.find("f:2054:1: error: text 2054\n"
                         "1030 errors and 1030 warnings; 1030 not shown (--max 0 shows all)\n"),
              std::string::npos);
}

TEST(TextForm, IsQuiet) {
    written to({.shown_max = 1, .quiet = true});
    to.form->add(finding_at(false, 1));
    to.form->add(finding_at(true, 2));
    to.form->close();
    EXPECT_EQ(to.lines(), "f:2:1: error: text 2\n");
}

TEST(TextForm, SaysNothingOfNothing) {
    written to({.shown_max = 1});
    to.form->end_source({});
    to.form->close();
    EXPECT_EQ(to.text, "");
}

TEST(TextForm, HasColours) {
    written to({.coloured = true});
    to.form->add(finding_at(true, 1));
    to.form->end_source({1, 0});
    EXPECT_EQ(to.text, "\033[1mf:1:1: \033[0m\033[1;31merror: \033[0mtext 1 [S106]\n"
                       "    1 | abc\n      | \033[1;32m^\033[0m\n");
}

TEST(TextForm, ListsKnownNamesOnce) {
    written to(report::text_settings{});
    for (int line = 1; line <= 3; ++line) {
        check::finding found = finding_at(true, line);
        found.notes = {{found.at, line == 3 ? "known are `B`" : "known are `A`"}, {found.at, "other"}};
        to.form->add(found);
    }
    to.form->end_source({3, 0});
    EXPECT_EQ(to.lines(), "f:1:1: error: text 1\nf:1:1: note: known are `A`\nf:1:1: note: other\n"
                          "f:2:1: error: text 2\nf:2:1: note: other\n"
                          "f:3:1: error: text 3\nf:3:1: note: known are `B`\nf:3:1: note: other\n");
}

TEST(TextForm, HasMessagesWhereTheyBelong) {
    written to({.shown_max = 1});
    to.form->add(finding_at(false, 1));
    to.form->fail_source("f: cannot read\033");
    to.form->close();
    EXPECT_EQ(to.text, "f:1:1: warning: text 1 [S509 octal]\n    1 | abc\n      | ^\ncdef: f: cannot read\\x1b\n"
                       "0 errors and 1 warning\n");
}

TEST(GithubForm, EscapesWhatSeparates) {
    written to(report::github_form);
    to.form->begin_source("a,b:c%\n.cdefsrc");
    check::finding found = finding_at(true, 3, "\u00e4bc");
    found.at = {3, 3, 2};
    found.text = "100%: \033a, b";
    found.notes = {{found.at, "a note"}};
    to.form->add(found);
    to.form->add(check::finding{.error = false, .code = "S523", .text = "t", .at = {}, .source = {}, .notes = {}});
    to.form->fail_source("f: cannot read");
    EXPECT_EQ(to.text,
              "::error file=a%2Cb%3Ac%25?.cdefsrc,line=3,col=2,endColumn=3,title=S106::100%25: ?a, b%0Aa note\n"
              "::warning file=a%2Cb%3Ac%25?.cdefsrc,title=S523::t\n"
              "::error file=a%2Cb%3Ac%25?.cdefsrc::f: cannot read\n");
}

TEST(AllForms, HaveFilesThatCouldNotBeWritten) {
    written github(report::github_form), gitlab(report::gitlab_form), json(report::json_form);
    for (written *to : {&github, &gitlab, &json}) {
        to->form->fail_output("f.cdef: cannot write");
        to->form->end_source({0, 0});
        to->form->begin_source("g");
        to->form->end_source({0, 0});
        to->form->close();
    }
    EXPECT_NE(github.text.find("::error file=f::f.cdef: cannot write\n"), std::string::npos) << github.text;
    EXPECT_NE(gitlab.text.find("\"description\": \"f.cdef: cannot write\""), std::string::npos) << gitlab.text;
    EXPECT_NE(json.text.find("\"warnings\": 0,\n      \"unwritten\": [\n        \"f.cdef: cannot write\"\n      ]\n"),
              std::string::npos)
        << json.text;
    EXPECT_EQ(json.text.find("unwritten"), json.text.rfind("unwritten"));
}

TEST(GithubForm, CountsLinesAsTheFileDoes) {
    written to(report::github_form);
    check::finding found = finding_at(true, 5);
    found.at.file_line = 3;
    found.at.file_column = 509;
    to.form->add(found);
    to.form->end_source({1, 0});
    EXPECT_EQ(to.text, "::error file=f,line=3,col=509,endColumn=509,title=S106::text 5\n");
}

TEST(GitlabForm, IsAListOfEntries) {
    written to(report::gitlab_form);
    to.form->begin_source("./dir/f");
    check::finding found = finding_at(false, 3);
    found.notes = {{found.at, "a note"}};
    to.form->add(found);
    to.form->end_source({0, 1});
    to.form->close();
    std::string mark = report::hexadecimal(report::hash_of("abc", report::hash_of({"\0", 1}, report::hash_of("S509"))));
    EXPECT_EQ(to.text, R"([
  {
    "description": "text 3; a note",
    "check_name": "S509",
    "fingerprint": ")" + report::hexadecimal(report::hash_of(mark + ":1", report::hash_of("dir/f"))) +
                           R"(",
    "severity": "minor",
    "location": {
      "path": "dir/f",
      "lines": {
        "begin": 3
      }
    }
  }
]
)");
}

TEST(Hash, IsFnv) { /* the values that its authors publish */
    EXPECT_EQ(report::hash_of(""), 0xCBF29CE484222325u);
    EXPECT_EQ(report::hash_of("a"), 0xAF63DC4C8601EC8Cu);
    EXPECT_EQ(report::hash_of("foobar"), 0x85944171F73967E8u);
}

std::string print_of(report::fingerprints &all, const check::finding &found) {
    return all.of("f", found).text();
}

TEST(Fingerprint, SurvivesAMovedLine) {
    report::fingerprints before, after;
    EXPECT_EQ(print_of(before, finding_at(true, 3, "\tId=x")), print_of(after, finding_at(true, 300, "  Id=x\r")));
}

TEST(Fingerprint, TellsLinesCodesAndRepetitionsApart) {
    report::fingerprints all;
    std::string first = print_of(all, finding_at(true, 1));
    EXPECT_NE(first, print_of(all, finding_at(true, 1, "abd")));
    EXPECT_NE(first, print_of(all, finding_at(false, 1)));
    EXPECT_EQ(first.substr(16), ":1");
    EXPECT_EQ(print_of(all, finding_at(true, 9)), first.substr(0, 16) + ":2");
    EXPECT_EQ(all.of("g", finding_at(true, 9)).text(), first);
}

TEST(Fingerprint, GoesByWhatANoteShowsIfTheFindingHasNoPlace) {
    report::fingerprints all;
    check::finding one = finding_at(true, 7, "the last line");
    one.at.column = 0;
    one.notes = {{{1, 1, 2}, "this one", "ab"}};
    check::finding other = one;
    other.source = "another last line";
    EXPECT_EQ(all.of("f", one).hash, all.of("f", other).hash);
    other.notes[0].source = "cd";
    EXPECT_NE(all.of("f", one).hash, all.of("f", other).hash);
}

} // namespace
