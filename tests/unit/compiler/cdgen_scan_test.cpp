#include "compiler/cdgen_scan.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <random>
#include <string>
#include <string_view>

namespace {

constexpr std::string_view MARKS("\"#/\0", 4);

bool is_mark(char c) {
    return MARKS.find(c) != std::string_view::npos;
}

/* One byte at a time. */
block_bits plainly(const char *bytes) {
    block_bits found = {0, 0};
    for (size_t i = 0; i < SCAN_BLOCK; ++i) {
        found.newlines |= uint64_t{bytes[i] == '\n'} << i;
        found.marks |= uint64_t{is_mark(bytes[i])} << i;
    }
    return found;
}

void expect_bits_of(const char *bytes) {
    auto [newlines, marks] = plainly(bytes);
    auto [quick_newlines, quick_marks] = scan_block(bytes);
    auto [word_newlines, word_marks] = scan_block_by_words(bytes);
    EXPECT_EQ(quick_newlines, newlines);
    EXPECT_EQ(quick_marks, marks);
    EXPECT_EQ(word_newlines, newlines);
    EXPECT_EQ(word_marks, marks);
}

/* Random bytes. One in `rarity` is a byte that lines and comments depend on, or differs from such a byte in few bits.
 */
std::string random_bytes(std::mt19937 &random, size_t size, unsigned rarity) {
    constexpr std::string_view CLOSE("\n\"#/\0.\x0b!\x01\x8a\xa3\xaf\x80", 13);
    std::string bytes(size, 'x');
    for (char &byte : bytes)
        byte = random() % rarity == 0 ? CLOSE[random() % CLOSE.size()] : static_cast<char>('0' + random() % 75);
    return bytes;
}

size_t first_in(std::string_view bytes, size_t from, bool (*wanted)(char)) {
    return static_cast<size_t>(std::find_if(bytes.begin() + static_cast<std::ptrdiff_t>(from), bytes.end(), wanted) -
                               bytes.begin());
}

void expect_places_of(const std::string &padded, size_t size) {
    auto places = std::make_unique<scanned_places>();
    places->scan(padded.data(), size);
    std::string_view bytes(padded.data(), size);
    for (size_t from = 0; from <= size; ++from) {
        ASSERT_EQ(from + places->marks.distance_from(from), first_in(bytes, from, is_mark));
        size_t newline = first_in(bytes, from, [](char c) { return c == '\n'; });
        if (newline < size)
            ASSERT_EQ(from + places->newlines.distance_from(from), newline);
        else
            ASSERT_GT(from + places->newlines.distance_from(from), size + scanned_places::FAR);
    }
}

TEST(Scan, EveryByteAtEveryPlace) {
    for (int byte = 0; byte < 256; ++byte)
        for (size_t at = 0; at < SCAN_BLOCK; ++at) {
            std::string bytes(SCAN_BLOCK, 'x');
            bytes[at] = static_cast<char>(byte);
            expect_bits_of(bytes.data());
        }
}

TEST(Scan, ThreeFormsAgreeOnRandomBlocks) {
    std::mt19937 random(1);
    for (int i = 0; i < 20000; ++i)
        expect_bits_of(random_bytes(random, SCAN_BLOCK, 1 + static_cast<unsigned>(i) % 100).data());
}

TEST(Scan, BlocksNeedNotBeAligned) {
    std::mt19937 random(2);
    std::string bytes = random_bytes(random, 2 * SCAN_BLOCK, 10);
    for (size_t at = 0; at <= SCAN_BLOCK; ++at)
        expect_bits_of(bytes.data() + at);
}

TEST(Scan, SearchesEndAtTheEndOfTheBuffer) {
    std::mt19937 random(3);
    for (size_t size : {0U, 1U, 63U, 64U, 65U, 127U, 128U, 1000U})
        expect_places_of(random_bytes(random, size, 50) + std::string(SCAN_BLOCK, '\n'), size);
}

TEST(Scan, NothingButNewlines) {
    constexpr size_t SIZE = 3000;
    expect_places_of(std::string(SIZE, '\n') + std::string(SCAN_BLOCK, '#'), SIZE);
}

TEST(Scan, FullBuffer) {
    std::mt19937 random(4);
    expect_places_of(random_bytes(random, SCAN_BUFFER, 300) + std::string(SCAN_BLOCK, '#'), SCAN_BUFFER);
}

TEST(Scan, EmptyFromTheStart) {
    auto places = std::make_unique<scanned_places>();
    EXPECT_GT(places->newlines.distance_from(0), scanned_places::FAR);
    EXPECT_EQ(places->marks.distance_from(0), 0U);
}

} // namespace
