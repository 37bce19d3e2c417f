#include "text/append.h"

#include <gtest/gtest.h>

TEST(text_append, keeps_what_is_there) {
    std::string to = "a";
    text::appendf(to, "%d-%s", 7, "b");
    text::appendf(to, "%s", "");
    EXPECT_EQ(to, "a7-b");
}
