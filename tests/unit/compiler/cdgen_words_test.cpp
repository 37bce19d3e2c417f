#include "compiler/cdgen_words.h"

#include <gtest/gtest.h>

#include <string>

namespace {

/* A text after which a word may be read, in which the character follows at once. */
std::string followed(const std::string &text, char next) {
    return text + std::string(WORD, next);
}

TEST(FindCharacter, TheFirstOne) {
    for (size_t length = 1; length <= 20; ++length)
        for (size_t at = 0; at < length; ++at) {
            std::string text = followed(std::string(length, '-'), ',');
            text[at] = ',';
            EXPECT_EQ(find_character(text.data(), length, ','), text.data() + at) << length;
        }
}

TEST(FindCharacter, NotAfterTheEnd) {
    for (size_t length = 0; length <= 20; ++length) {
        std::string text = followed(std::string(length, '-'), ',');
        EXPECT_EQ(find_character(text.data(), length, ','), nullptr) << length;
    }
}

TEST(FindCharacter, NoOtherCharacter) {
    for (int other = 0; other < 256; ++other)
        if (other != ',') {
            std::string text = followed(std::string(9, static_cast<char>(other)), '-');
            EXPECT_EQ(find_character(text.data(), 9, ','), nullptr) << other;
        }
}

} // namespace
