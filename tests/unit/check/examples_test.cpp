/* An example for each code. */

#include "check/examples.h"

#include "check/found_in.h"
#include "language/messages.h"

#include <set>
#include <string>
#include <vector>

namespace {

using check::example;
using found_in::findings_in;

/* Every code that a check reports. */
std::set<std::string> all_codes() {
    std::set<std::string> codes;
    for (const message &row : message_rows)
        codes.insert(row.code);
    for (const check::warning &row : check::warnings)
        codes.insert(row.code);
    return codes;
}

std::vector<example> all_examples() {
    std::vector<example> all;
    for (const std::string &code : all_codes())
        if (const example *one = check::example_of(code))
            all.push_back(*one);
    return all;
}

std::set<std::string> codes_in(const std::string &source) {
    std::set<std::string> codes;
    for (const check::finding &found : findings_in(source))
        codes.insert(found.code);
    return codes;
}

/* No source causes these, none below 4 GB does, or a check does not report them. Those from S601 on need a build. */
bool has_no_example(const std::string &code) {
    static const std::set<std::string> codes = {"S105", "S213", "S305", "S306", "S307", "S308"};
    return code > "S600" || codes.contains(code);
}

TEST(Examples, AreThereForEachCodeThatASourceCauses) {
    for (const std::string &code : all_codes())
        EXPECT_EQ(check::example_of(code) == nullptr, has_no_example(code)) << code;
    EXPECT_EQ(check::example_of("S999"), nullptr);
}

TEST(Examples, MakeExactlyTheirCode) {
    for (const example &one : all_examples())
        EXPECT_EQ(codes_in(source_with(*one.within, one.lines)), std::set<std::string>{one.code}) << one.lines;
}

TEST(Examples, AreSoundWhenTheyAreCured) {
    for (const example &one : all_examples())
        EXPECT_EQ(codes_in(source_with(*one.within, one.cured == nullptr ? "" : one.cured)), std::set<std::string>())
            << one.code;
}

} // namespace
