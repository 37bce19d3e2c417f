/* The source that a new class begins with. */

#include "cdef/new/first_source.h"

#include <gtest/gtest.h>

namespace {

using cdef::new_command::first_source;

bool has(const std::string &name, const std::string &line) {
    return first_source(name).value_or("").find("\n\t" + line + "\n") != std::string::npos;
}

TEST(FirstSource, NamesTheClass) {
    EXPECT_TRUE(has("Fan", "Name=Fan"));
    EXPECT_TRUE(has("Fan", "ResourceManager=FanManager"));
    EXPECT_TRUE(has("Fan", "MessageCatalog=Fan.cat"));
}

TEST(FirstSource, QuotesNamesThatNeedIt) {
    EXPECT_TRUE(has("a // b", "Name=\"a // b\""));
    EXPECT_TRUE(has("a#b", "Name=\"a#b\""));
    EXPECT_TRUE(has("a = b", "Name=a = b"));
    EXPECT_TRUE(has("[a,b]", "Name=[a,b]"));
    EXPECT_TRUE(has("K\xc3\xbchler", "Name=K\xc3\xbchler"));
    EXPECT_TRUE(has("K\xc3\xbchler", "MessageCatalog=K__hler.cat"));
}

TEST(FirstSource, IsNotThereForNamesThatNoLineGives) {
    for (const std::string &name : {std::string(), std::string("a\nb"), std::string("a\0b", 3), std::string("a\rb"),
                                    std::string(" a "), std::string(300, 'x')})
        EXPECT_FALSE(first_source(name).has_value()) << name;
    EXPECT_TRUE(first_source(std::string(240, 'x')).has_value());
}

} // namespace
