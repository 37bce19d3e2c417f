/* cdgen_scan.cpp: finds newlines, quotes and comments, many bytes at a time. */

#include "compiler/cdgen_scan.h"

#include <cstring>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace {

constexpr size_t WORD = sizeof(uint64_t);

/* A word whose bytes are all the same. */
constexpr uint64_t all(char byte) {
    return 0x0101010101010101 * static_cast<unsigned char>(byte);
}

/* The highest bit of each byte that is 0. The addition carries from no byte into the next. */
constexpr uint64_t zero_bytes(uint64_t word) {
    constexpr uint64_t low_bits = all(0x7F);
    return ~(((word & low_bits) + low_bits) | word | low_bits);
}

/* The first byte is the lowest. */
uint64_t load_word(const char *bytes) {
    uint64_t word = 0;
    memcpy(&word, bytes, sizeof word);
    return std::endian::native == std::endian::little ? word : __builtin_bswap64(word);
}

/* The highest bits of eight bytes, next to each other. */
constexpr uint64_t gathered(uint64_t high_bits) {
    return (high_bits >> 7) * 0x0102040810204080 >> 56;
}

uint64_t marks_of_word(uint64_t word) {
    return zero_bytes(word) | zero_bytes(word ^ all('"')) | zero_bytes(word ^ all('#')) | zero_bytes(word ^ all('/'));
}

} // namespace

block_bits scan_block_by_words(const char *bytes) {
    block_bits found = {0, 0};
    for (size_t at = 0; at < SCAN_BLOCK; at += WORD) {
        uint64_t word = load_word(bytes + at);
        found.newlines |= gathered(zero_bytes(word ^ all('\n'))) << at;
        found.marks |= gathered(marks_of_word(word)) << at;
    }
    return found;
}

#if defined(__SSE2__)

namespace {

constexpr size_t PIECE = sizeof(__m128i);

__m128i load_piece(const char *bytes) {
    return _mm_loadu_si128(reinterpret_cast<const __m128i *>(bytes));
}

/* The bits of the bytes that `matches` makes 0xFF. */
template <class Matches> uint64_t bits_of(const char *bytes, Matches matches) {
    uint64_t bits = 0;
    for (size_t at = 0; at < SCAN_BLOCK; at += PIECE)
        bits |= uint64_t{static_cast<unsigned>(_mm_movemask_epi8(matches(load_piece(bytes + at))))} << at;
    return bits;
}

__m128i equal(__m128i bytes, char byte) {
    return _mm_cmpeq_epi8(bytes, _mm_set1_epi8(byte));
}

__m128i is_mark(__m128i piece) {
    return _mm_or_si128(_mm_or_si128(equal(piece, '"'), equal(piece, '#')),
                        _mm_or_si128(equal(piece, '/'), equal(piece, '\0')));
}

/* True if the block may have marks. When the bits in which a quote, a number sign and a slash differ are ignored, these
 * three, and five other characters, become 0, as a NUL is; so the test is for a byte that is 0. */
bool may_have_marks(const char *bytes) {
    constexpr char DIFFERENCES = ('"' ^ '#') | ('"' ^ '/');
    __m128i least = _mm_set1_epi8(-1);
    for (size_t at = 0; at < SCAN_BLOCK; at += PIECE) {
        __m128i piece = load_piece(bytes + at);
        __m128i kind = _mm_xor_si128(_mm_or_si128(piece, _mm_set1_epi8(DIFFERENCES)), _mm_set1_epi8('"' | DIFFERENCES));
        least = _mm_min_epu8(least, _mm_min_epu8(piece, kind));
    }
    return _mm_movemask_epi8(equal(least, '\0')) != 0;
}

} // namespace

/* Marks are rare. */
block_bits scan_block(const char *bytes) {
    return {bits_of(bytes, [](__m128i piece) { return equal(piece, '\n'); }),
            may_have_marks(bytes) ? bits_of(bytes, is_mark) : 0};
}

#else

block_bits scan_block(const char *bytes) {
    return scan_block_by_words(bytes);
}

#endif

[[gnu::noinline]] void scanned_places::scan(const char *buffer, size_t size) {
    blocks = size / SCAN_BLOCK + 1;
    for (size_t block = 0; block < blocks; ++block) {
        block_bits found = scan_block(buffer + block * SCAN_BLOCK);
        newlines[block] = found.newlines;
        marks.words[block] = found.marks;
    }
    uint64_t end = uint64_t{1} << size % SCAN_BLOCK;
    newlines[blocks - 1] &= end - 1;
    marks.words[blocks - 1] = (marks.words[blocks - 1] & (end - 1)) | end;
    blocks_listed = 0;
    list_more();
}

bool scanned_places::list_more() {
    uint32_t *next = listed.data();
    for (const uint32_t *full = next + MOST_LISTED - SCAN_BLOCK; next <= full && blocks_listed < blocks;
         ++blocks_listed)
        for (uint64_t rest = newlines[blocks_listed]; rest != 0; rest &= rest - 1)
            *next++ = static_cast<uint32_t>(blocks_listed * SCAN_BLOCK) + static_cast<uint32_t>(std::countr_zero(rest));
    *next = NO_NEWLINE;
    taken = 0;
    return next != listed.data();
}
