#include "text/keyed_hash.h"

#include <gtest/gtest.h>

#include <string>

namespace {

/* The published vectors: the key is 00, 01, ... 0f, and so is the text as far as it goes. */
TEST(text_keyed_hash, of_the_published_texts) {
    constexpr text::hash_key KEY = {0x0706050403020100, 0x0F0E0D0C0B0A0908};
    struct vector {
        std::size_t length;
        std::uint64_t hash;
    };
    for (vector each : {vector{0, 0xABAC0158050FC4DC},
                        {1, 0xC9F49BF37D57CA93},
                        {2, 0x82CB9B024DC7D44D},
                        {7, 0xD3927D989BB11140},
                        {8, 0x369095118D299A8E},
                        {9, 0x25A48EB36C063DE4},
                        {15, 0xD320D86D2A519956},
                        {16, 0xCC4FDD1A7D908B66},
                        {63, 0x9D199062B7BBB3A8}}) {
        std::string text;
        for (std::size_t i = 0; i < each.length; ++i)
            text += static_cast<char>(i);
        EXPECT_EQ(text::hash_of(text, KEY), each.hash) << each.length;
    }
}

TEST(text_keyed_hash, depends_on_both_halves_of_the_key) {
    EXPECT_NE(text::hash_of("a", {1, 2}), text::hash_of("a", {3, 2}));
    EXPECT_NE(text::hash_of("a", {1, 2}), text::hash_of("a", {1, 3}));
}

TEST(text_keyed_hash, has_another_random_key_each_time) {
    text::hash_key one = text::random_key();
    text::hash_key other = text::random_key();
    EXPECT_TRUE(one.first != other.first || one.second != other.second);
}

} // namespace
