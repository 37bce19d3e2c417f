#include "language/attribute_order.h"
#include "language/same_bytes.h"

#include <gtest/gtest.h>

#include <span>
#include <string>

namespace {

const srtable_ctrl &kind = sc_tables[SC_RESOURCE_ACTION];

/* The attribute that is expected for a line. */
const table_attrs *expected(language::attribute_order &order, std::string line, const srtable_ctrl &of = kind) {
    line.reserve(line.size() + language::name_pattern::WIDTH);
    return order.expected(of, line.c_str());
}

const table_attrs *named(std::string_view name) {
    return find_attr(kind, name);
}

TEST(ExpectedAttribute, ExpectsWhatCameNextLastTime) {
    language::attribute_order order;
    order.restart();
    for (std::string_view name : {"Id", "Name", "TimeOut"})
        order.took(kind, *named(name));
    order.restart();
    EXPECT_EQ(expected(order, "Id=1"), named("Id"));
    EXPECT_EQ(expected(order, "Name=x"), named("Name"));
    EXPECT_EQ(expected(order, "Permission=x"), nullptr);
    EXPECT_EQ(expected(order, "TimeOut=1"), named("TimeOut"));
}

TEST(ExpectedAttribute, FollowsTheLatestStanza) {
    language::attribute_order order;
    order.took(kind, *named("Name"));
    order.restart();
    order.took(kind, *named("Id"));
    order.restart();
    EXPECT_EQ(expected(order, "Name=x"), nullptr);
    EXPECT_EQ(expected(order, "Id=x"), named("Id"));
}

TEST(ExpectedAttribute, OneThatIsRepeatedIsExpectedAgain) {
    language::attribute_order order;
    order.took(kind, *named("VarietyRange"));
    order.took(kind, *named("VarietyRange"));
    EXPECT_EQ(expected(order, "VarietyRange=1,2"), named("VarietyRange"));
    EXPECT_EQ(expected(order, "VarietyRange=1,2"), named("VarietyRange"));
}

void expect_only_its_name(const srtable_ctrl &of, const table_attrs &attr) {
    std::string name = attr.ta_name;
    auto expects = [&](const std::string &line) {
        language::attribute_order order;
        order.took(of, attr);
        order.restart();
        return expected(order, line, of) == &attr;
    };
    EXPECT_TRUE(expects(name + "="));
    EXPECT_FALSE(expects(name));
    EXPECT_FALSE(expects(name + " ="));
    EXPECT_FALSE(expects(name.substr(1) + "="));
    for (size_t at = 0; at < name.size(); ++at) {
        std::string other = name;
        other[at] ^= 1;
        EXPECT_FALSE(expects(other + "=1")) << other;
    }
}

TEST(ExpectedAttribute, OnlyTheWholeNameAndItsEqualsSign) {
    for (const srtable_ctrl &of : std::span(sc_tables).first(SC_COUNT))
        for (const table_attrs &attr : of.sc_attrs)
            expect_only_its_name(of, attr);
}

TEST(ExpectedAttribute, SameBytesIsWhatMemcmpSays) {
    const std::string text = "the same text, which has forty characters";
    for (size_t n = 0; n <= 40; ++n) {
        std::string copy = text.substr(0, n);
        EXPECT_TRUE(language::same_bytes(copy.data(), text.data(), n));
        for (size_t at = 0; at < n; ++at) {
            copy[at] ^= 0x40;
            EXPECT_FALSE(language::same_bytes(copy.data(), text.data(), n)) << n << " " << at;
            copy[at] ^= 0x40;
        }
    }
}

} // namespace
