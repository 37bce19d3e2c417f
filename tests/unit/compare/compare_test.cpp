#include "compare/compiled.h"

#include <gtest/gtest.h>

using namespace compiled;

TEST(compare, equal_databases_do_not_differ) {
    std::string stanzas = attribute("A", 1) + attribute("A", 1);
    EXPECT_EQ(differences(stanzas, stanzas), lines());
}

TEST(compare, order_of_parts_does_not_matter) {
    EXPECT_EQ(differences(attribute("A", 1) + attribute("B", 2), attribute("B", 2) + attribute("A", 1)), lines());
}

TEST(compare, new_parts_come_after_those_that_were_there) {
    EXPECT_EQ(differences(attribute("A", 1) + attribute("B", 2) + attribute("C", 3),
                          attribute("D", 4) + attribute("B", 5) + attribute("C", 3)),
              (lines{"removed 'A': CMP101", "changed 'B' Id 2 -> 5: CMP102", "added 'D'"}));
}

TEST(compare, parts_of_one_name_pair_in_their_order) {
    std::string two = attribute("A", 1) + attribute("A", 2), three = two + attribute("A", 3);
    EXPECT_EQ(differences(two, three), lines{"added 'A'"});
    EXPECT_EQ(differences(three, two), lines{"removed 'A': CMP101"});
}

TEST(compare, an_attribute_of_the_same_number_and_type_is_renamed) {
    EXPECT_EQ(differences(attribute("A", 1), attribute("B", 1)), lines{"renamed 'A' to 'B': CMP101 CMP301"});
}

TEST(compare, what_else_changed_of_a_renamed_part_has_its_new_name) {
    EXPECT_EQ(differences(attribute("A", 1), attribute("B", 1, "Int32", "DefaultValue=5\n")),
              (lines{"renamed 'A' to 'B': CMP101 CMP301", "changed 'B' default 0 -> 5"}));
}

TEST(compare, an_attribute_of_another_number_or_type_is_not_renamed) {
    EXPECT_EQ(differences(attribute("A", 1), attribute("B", 2)), (lines{"removed 'A': CMP101", "added 'B'"}));
    EXPECT_EQ(differences(attribute("A", 1), attribute("B", 1, "String")),
              (lines{"removed 'A': CMP101", "added 'B': CMP103 CMP303 CMP301"}));
}

TEST(compare, of_several_that_may_be_renamed_the_first_is_taken) {
    EXPECT_EQ(differences(attribute("A", 1) + attribute("B", 1), attribute("C", 1)),
              (lines{"renamed 'A' to 'C': CMP101 CMP301", "removed 'B': CMP101"}));
}

TEST(compare, valid_values_pair_by_how_they_read) {
    EXPECT_EQ(differences(attribute("A", 1, "Int32", "ValidValue=1\nValidValue=2,3\n"),
                          attribute("A", 1, "Int64", "ValidValue=2,3\nValidValue=1\n")),
              lines{"changed 'A' type Int32 -> Int64: CMP104 CMP303"});
}

TEST(compare, a_value_of_another_type_that_reads_alike_is_the_same) {
    EXPECT_EQ(
        differences(attribute("A", 1, "Int32", "DefaultValue=7\n"), attribute("A", 1, "UInt64", "DefaultValue=7\n")),
        lines{"changed 'A' type Int32 -> UInt64: CMP104 CMP303"});
}

TEST(compare, what_the_taker_throws_ends_it) {
    database older(source_of(attribute("A", 1))), newer(source_of(""));
    compare::origin one = older.origin(), other = newer.origin();
    EXPECT_THROW(compare::compare(one, other, [](const compare::difference &) { throw 1; }), int);
}
