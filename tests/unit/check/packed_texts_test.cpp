/* Texts in the order in which they came. */

#include "check/packed_texts.h"

#include <gtest/gtest.h>

#include <string>

namespace {

TEST(PackedTexts, AreInTheirOrder) {
    check::packed_texts texts;
    for (const char *text : {"a", "", "bc", ""})
        texts.add(text);
    EXPECT_EQ(texts.size(), 4u);
    EXPECT_EQ(texts[0], "a");
    EXPECT_EQ(texts[1], "");
    EXPECT_EQ(texts[2], "bc");
    EXPECT_EQ(texts[3], "");
}

TEST(PackedTexts, FillManyBlocks) {
    check::packed_texts texts;
    for (int i = 0; i < 10'000; ++i)
        texts.add(std::to_string(i));
    for (size_t i = 0; i < 10'000; ++i)
        EXPECT_EQ(texts[i], std::to_string(i));
}

TEST(PackedTexts, MayBeAsLongAsALine) {
    check::packed_texts texts;
    for (size_t i = 0; i < 600; ++i)
        texts.add(std::string(LINE_MAX_CHARS, static_cast<char>('a' + i % 26)));
    for (size_t i = 0; i < 600; ++i)
        EXPECT_EQ(texts[i], std::string(LINE_MAX_CHARS, static_cast<char>('a' + i % 26)));
}

TEST(PackedTexts, AreGoneWhenCleared) {
    check::packed_texts texts;
    for (int i = 0; i < 1000; ++i)
        texts.add("a");
    texts.clear();
    EXPECT_EQ(texts.size(), 0u);
    texts.add("b");
    EXPECT_EQ(texts[0], "b");
}

} // namespace
