/* Which time a database gets. */

#include "build/time.h"

#include <gtest/gtest.h>

namespace {

using build::time_of;
using build::time_wishes;

constexpr orb_timeval32_t NOW = {77, 88};

std::string shown(orb_timeval32_t time) {
    return std::to_string(time.tv_sec) + "." + std::to_string(time.tv_usec);
}

std::string refusal(const time_wishes &wishes) {
    try {
        time_of(wishes, NOW);
    } catch (const build::wrong_request &e) {
        return e.what();
    }
    return "";
}

TEST(Time, IsNoneUnlessItIsAskedFor) {
    EXPECT_EQ(shown(time_of({}, NOW)), "0.0");
    EXPECT_EQ(shown(time_of({.option = "none", .environment = "5"}, NOW)), "0.0");
}

TEST(Time, IsNowOrWhatTheOptionSays) {
    EXPECT_EQ(shown(time_of({.option = "now", .environment = "5"}, NOW)), "77.88");
    EXPECT_EQ(shown(time_of({.option = "4294967295", .environment = "5"}, NOW)), "4294967295.0");
}

TEST(Time, IsTheEnvironmentsWithoutAnOption) {
    EXPECT_EQ(shown(time_of({.environment = "5"}, NOW)), "5.0");
}

TEST(Time, IsNoneWhateverElseIsAskedForIfThatIsForced) {
    EXPECT_EQ(shown(time_of({.option = "now", .environment = "x", .forced_empty = true}, NOW)), "0.0");
}

TEST(Time, HasToBeANumberOf32Bits) {
    EXPECT_EQ(refusal({.option = "bad", .forced_empty = true}),
              "--timestamp: 'bad' is not none, now or seconds from 0 to 4294967295");
    EXPECT_EQ(refusal({.option = "soon"}), "--timestamp: 'soon' is not none, now or seconds from 0 to 4294967295");
    EXPECT_EQ(refusal({.option = "-1"}), "--timestamp: '-1' is not none, now or seconds from 0 to 4294967295");
    EXPECT_EQ(refusal({.environment = "4294967296"}),
              "SOURCE_DATE_EPOCH: '4294967296' is not seconds from 0 to 4294967295");
    EXPECT_EQ(refusal({.environment = "1 "}), "SOURCE_DATE_EPOCH: '1 ' is not seconds from 0 to 4294967295");
    EXPECT_EQ(refusal({.environment = ""}), "SOURCE_DATE_EPOCH: '' is not seconds from 0 to 4294967295");
}

} // namespace
