/* Whether a class may replace an older version. */

#include "gate/judge.h"

#include <gtest/gtest.h>

namespace {

TEST(GateJudge, ReportsAClassThatIsGoneWithoutAPlace) {
    check::finding found = gate::without_class("it's\n");
    EXPECT_EQ(found.text, "- ResourceClass 'it\\'s\\x0a' (readers miss it)");
    EXPECT_STREQ(found.code, "CMP101");
    EXPECT_TRUE(found.error);
    EXPECT_EQ(found.at.line, 0);
}

} // namespace
