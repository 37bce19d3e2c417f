/* cdgen_digits.h: decimal numbers, eight digits at a time. */
#ifndef CDGEN_CDGEN_DIGITS_H
#define CDGEN_CDGEN_DIGITS_H

#include <bit>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string_view>

constexpr size_t DIGITS_AT_ONCE = 8;
constexpr size_t MOST_DIGITS = 2 * DIGITS_AT_ONCE; /* that all_digits takes */

/* The one to eight digits of a text in the bytes of a word, the last digit in the highest byte and zeros in front. A
 * byte of another character is more than 9. Works on little-endian machines only. */
inline uint64_t digits_in_word(const char *text, size_t count) {
    uint64_t characters = 0;
    memcpy(&characters, text, sizeof characters);
    return (characters ^ 0x3030303030303030) << ((0 - 8 * count) % 64);
}

/* True if no byte is more than 9. */
inline bool are_digits(uint64_t bytes) {
    return (((bytes + 0x7676767676767676) | bytes) & 0x8080808080808080) == 0;
}

/* The number that the digits mean. Digits are combined to pairs, pairs to fours, and fours to the number. */
inline uint64_t number_of(uint64_t digits) {
    uint64_t pairs = digits * (1 + (10 << 8)) >> 8;
    uint64_t fours = (pairs & 0x00FF00FF00FF00FF) * (1 + (100 << 16)) >> 16;
    return (fours & 0x0000FFFF0000FFFF) * (1 + (uint64_t{10000} << 32)) >> 32;
}

/* True if a text of one to eight characters consists of digits; *value is then its number. */
inline bool few_digits(const char *text, size_t count, uint64_t *value) {
    if (std::endian::native == std::endian::little) {
        uint64_t digits = digits_in_word(text, count);
        *value = number_of(digits);
        return are_digits(digits);
    }
    uint64_t number = 0;
    for (const char *p = text; p < text + count; ++p) {
        unsigned digit = static_cast<unsigned char>(*p) - unsigned{'0'};
        if (digit > 9)
            return false;
        number = number * 10 + digit;
    }
    *value = number;
    return true;
}

/* The same for up to MOST_DIGITS digits; false for none or more. DIGITS_AT_ONCE bytes are read, however short the text
 * is. */
inline bool all_digits(std::string_view text, uint64_t *value) {
    if (text.size() - 1 < DIGITS_AT_ONCE)
        return few_digits(text.data(), text.size(), value);
    size_t in_front = text.size() - DIGITS_AT_ONCE;
    uint64_t high = 0;
    if (in_front - 1 >= DIGITS_AT_ONCE || !few_digits(text.data(), in_front, &high) ||
        !few_digits(text.data() + in_front, DIGITS_AT_ONCE, value))
        return false;
    *value += high * 100000000;
    return true;
}

/* The same for digits that are a decimal number even where a 0 in front would make them octal. */
inline bool plain_decimal(std::string_view text, uint64_t *value) {
    return all_digits(text, value) && (text[0] != '0' || text.size() == 1);
}

#endif
