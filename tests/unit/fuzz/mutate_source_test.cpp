/* The changes to sources that the fuzzers try: that each kind of change comes about, and that nothing else does. */

#include "fuzz/mutate.h"
#include "sample.h"

#include <gtest/gtest.h>

#include <set>

namespace {

constexpr unsigned TRIES = 40000; /* the rarest change expected below comes about once in 1,200 */

constexpr std::string_view SOURCE = "# first\n"
                                    "ControlDefinition\n"
                                    "\tFileVersion=1.2.3.4\n"
                                    "ResourceClass\n"
                                    "\tDescription=11\n"
                                    "\tDisplayName=22\n";

constexpr sampling::sample EACH_SEED(1, 0);

std::set<std::string> changed(std::string_view source, sampling::sample seeds = EACH_SEED) {
    std::set<std::string> all;
    for (unsigned seed = 1; seed <= TRIES; ++seed) {
        if (!seeds.takes())
            continue;
        fuzz::chance random(seed);
        all.insert(fuzz::changed_source(source, random));
    }
    return all;
}

std::set<std::string> crossed(std::string_view source, std::string_view other, sampling::sample seeds = EACH_SEED) {
    std::set<std::string> all;
    for (unsigned seed = 1; seed <= TRIES; ++seed) {
        if (!seeds.takes())
            continue;
        fuzz::chance random(seed);
        all.insert(fuzz::crossed_source(source, other, random));
    }
    return all;
}

TEST(fuzz_mutate_source, moves_copies_and_takes_away_stanzas) {
    std::set<std::string> all = changed(SOURCE);
    std::string control = "ControlDefinition\n\tFileVersion=1.2.3.4\n";
    std::string resource = "ResourceClass\n\tDescription=11\n\tDisplayName=22\n";
    EXPECT_TRUE(all.contains("# first\n" + resource + control));
    EXPECT_TRUE(all.contains("# first\n" + control + control + resource));
    EXPECT_TRUE(all.contains("# first\n" + control));
    EXPECT_TRUE(all.contains("# first\n" + resource));
}

TEST(fuzz_mutate_source, moves_copies_and_takes_away_lines) {
    std::set<std::string> all = changed(SOURCE);
    std::string begin = "# first\nControlDefinition\n\tFileVersion=1.2.3.4\n";
    EXPECT_TRUE(all.contains(begin + "\tDescription=11\nResourceClass\n\tDisplayName=22\n"));
    EXPECT_TRUE(all.contains(begin + "ResourceClass\n\tDescription=11\n\tDisplayName=22\n\tDisplayName=22\n"));
    EXPECT_TRUE(all.contains(begin + "ResourceClass\n\tDescription=11\n"));
}

/* Both are message numbers. The version is of another form. */
TEST(fuzz_mutate_source, exchanges_values_of_the_same_form_only) {
    std::string begin = "# first\nControlDefinition\n\tFileVersion=";
    std::set<std::string> all = changed(SOURCE);
    EXPECT_TRUE(all.contains(begin + "1.2.3.4\nResourceClass\n\tDescription=22\n\tDisplayName=11\n"));
    EXPECT_FALSE(all.contains(begin + "11\nResourceClass\n\tDescription=1.2.3.4\n\tDisplayName=22\n"));
}

TEST(fuzz_mutate_source, breaks_quotes_and_comments) {
    std::set<std::string> all = changed("A\n\tB=\"c\"\n");
    EXPECT_TRUE(all.contains("A\n\tB=\"c\n"));
    EXPECT_TRUE(all.contains("A\n\tB=c\"\n"));
    EXPECT_TRUE(all.contains("A\n\tB=\"\"c\"\n"));
    EXPECT_TRUE(all.contains("A\n\tB=\"#c\"\n"));
    EXPECT_TRUE(all.contains("A\n\tB=//\"c\"\n"));
}

TEST(fuzz_mutate_source, adds_attributes_of_the_stanza) {
    bool added = false;
    for (const std::string &each : changed("ResourceClass\n"))
        added = added || each.starts_with("ResourceClass\n\tProperties=");
    EXPECT_TRUE(added);
}

TEST(fuzz_mutate_source, takes_stanzas_lines_values_and_the_rest_from_another_source) {
    std::set<std::string> all = crossed(SOURCE, "ResourceClass\n\tDisplayName=33\nClassAction\n");
    std::string begin = "# first\nControlDefinition\n\tFileVersion=1.2.3.4\n";
    EXPECT_TRUE(all.contains(begin + "ResourceClass\n\tDescription=11\n\tDisplayName=22\nClassAction\n"));
    EXPECT_TRUE(all.contains(begin + "ResourceClass\n\tDescription=11\n\tDisplayName=33\n\tDisplayName=22\n"));
    EXPECT_TRUE(all.contains(begin + "ResourceClass\n\tDescription=33\n\tDisplayName=22\n"));
    EXPECT_TRUE(all.contains(begin + "ResourceClass\n\tDisplayName=33\nClassAction\n"));
}

TEST(fuzz_mutate_source, takes_any_bytes) {
    const sampling::sample seeds = sampling::of_this_run();
    for (std::string_view odd : {std::string_view(), std::string_view("\0\n\0", 3), std::string_view("\n\n"),
                                 std::string_view("X"), std::string_view("=\n\t=\n"), std::string_view("\t")}) {
        EXPECT_FALSE(changed(odd, seeds).empty());
        EXPECT_FALSE(crossed(odd, SOURCE, seeds).empty());
        EXPECT_FALSE(crossed(SOURCE, odd, seeds).empty());
    }
}

TEST(fuzz_mutate_source, the_same_numbers_give_the_same_change) {
    fuzz::chance one(7), other(7);
    EXPECT_EQ(fuzz::changed_source(SOURCE, one), fuzz::changed_source(SOURCE, other));
}

} // namespace
