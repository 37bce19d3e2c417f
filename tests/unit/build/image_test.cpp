/* The time in a finished database. */

#include "build/image.h"

#include "build/compile.h"
#include "cdb_view.h"
#include "check/check.h"
#include "compiler/stepwise.h"

#include <gtest/gtest.h>

#include <cstring>

namespace {

using bytes = std::vector<std::byte>;

const std::string SOURCE = "ControlDefinition\n\tFileVersion=1\n"
                           "ClassToManagerMapping\n\tResourceManager=M\n\tFirstKey=1\n\tLastKey=2\n"
                           "\tMessageCatalog=m\n\tDescriptiveMessageSet=1\n";

/* The image of a class, in both byte orders, with a time. */
struct both {
    explicit both(orb_timeval32_t time) {
        auto finish = [&](stepwise_compiler &compiler, const check::view &) {
            native = compiler.image();
            build::set_time(native, time);
            reversed = compiler.reversed(native);
        };
        check::compile_job job = {"A.cdef", finish};
        check::check_bytes(
            SOURCE, "x", {}, [](check::finding &&) {}, &job);
    }

    bytes native, reversed;
};

TEST(Image, OfAnyTimeIsSound) {
    both image({5, 6});
    EXPECT_TRUE(cdb::verify(cdb::database(image.native)).empty());
    EXPECT_TRUE(cdb::verify(cdb::database(image.reversed)).empty());
    vx_uint32_t seconds = 0;
    std::memcpy(&seconds, image.native.data() + 16, 4);
    EXPECT_EQ(seconds, 5u);
}

TEST(Image, IsTheSameWhateverTheTime) {
    both a({5, 6}), b({7, 0}), none({0, 0});
    EXPECT_TRUE(build::is_same_but_time(a.native, b.native));
    EXPECT_TRUE(build::is_same_but_time(a.reversed, none.reversed));
    EXPECT_FALSE(build::is_same_but_time(a.native, a.reversed));
}

TEST(Image, IsAnotherWithAnotherByteOrSize) {
    both a({5, 6});
    for (size_t place = 0; place < a.native.size(); ++place) {
        bytes other = a.native;
        other[place] ^= std::byte{1};
        EXPECT_FALSE(build::is_same_but_time(a.native, other)) << place;
    }
    EXPECT_FALSE(build::is_same_but_time(a.native, std::span(a.native).first(a.native.size() - 1)));
    EXPECT_FALSE(build::is_same_but_time({}, {}));
}

} // namespace
