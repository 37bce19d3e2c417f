/* cdgen_scan.cpp: finds newlines, quotes and comments, many bytes at a time. */

#include "compiler/cdgen_scan.h"

#include "compiler/cdgen_words.h"

#include <algorithm>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace {

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
    for (size_t block = 0; block <= size / SCAN_BLOCK; ++block) {
        block_bits found = scan_block(buffer + block * SCAN_BLOCK);
        newlines.words[block] = found.newlines;
        marks.words[block] = found.marks;
    }
    end_at(size);
}

void scanned_places::end_at(size_t size) {
    size_t last = size / SCAN_BLOCK;
    uint64_t end = uint64_t{1} << size % SCAN_BLOCK;
    newlines.words[last] &= end - 1;
    std::fill_n(&newlines.words[last + 1], FAR_BLOCKS - 1, 0);
    newlines.words[last + FAR_BLOCKS] = 1;
    marks.words[last] = (marks.words[last] & (end - 1)) | end;
}
