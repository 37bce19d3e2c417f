/* cdgen_words.h: eight bytes at a time. */
#ifndef CDGEN_CDGEN_WORDS_H
#define CDGEN_CDGEN_WORDS_H

#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>

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
inline uint64_t load_word(const char *bytes) {
    uint64_t word = 0;
    memcpy(&word, bytes, sizeof word);
    return std::endian::native == std::endian::little ? word : __builtin_bswap64(word);
}

/* The first of these characters in a text, or null. Up to WORD - 1 bytes after the text are read. */
inline char *find_character(char *text, size_t length, char wanted) {
    for (size_t at = 0; at < length; at += WORD)
        if (uint64_t found = zero_bytes(load_word(text + at) ^ all(wanted))) {
            at += static_cast<size_t>(std::countr_zero(found)) / 8;
            return at < length ? text + at : nullptr;
        }
    return nullptr;
}

#endif
