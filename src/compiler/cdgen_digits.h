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

/* The four to eight digits of a text in the bytes of a word, the last digit in the highest byte and zeros in front. A
 * byte of another character is more than 9. Works on little-endian machines only. */
inline uint64_t digits_in_word(const char *text, size_t count) {
    uint32_t first = 0;
    uint32_t last = 0;
    memcpy(&first, text, sizeof first);
    memcpy(&last, text + count - sizeof last, sizeof last);
    size_t in_front = 8 * (DIGITS_AT_ONCE - count);
    uint64_t characters = uint64_t{last} << 32 | uint64_t{first} << in_front; /* where they overlap, they agree */
    return characters ^ (uint64_t{0x3030303030303030} << in_front);
}

/* True if no byte is more than 9. */
inline bool are_digits(uint64_t bytes) {
    return (((bytes + 0x7676767676767676) | bytes) & 0x8080808080808080) == 0;
}

/* The number that the digits mean. Digits are first combined to pairs, then all pairs with two multiplications. */
inline uint64_t number_of(uint64_t digits) {
    uint64_t pairs = digits * 10 + (digits >> 8);
    constexpr uint64_t ONE_IN_FOUR = 0x000000FF000000FF;
    uint64_t odd = (pairs & ONE_IN_FOUR) * (100 + (uint64_t{1000000} << 32));
    uint64_t even = (pairs >> 16 & ONE_IN_FOUR) * (1 + (uint64_t{10000} << 32));
    return (odd + even) >> 32;
}

/* True if a text consists of up to eight digits; *value is then its number. */
inline bool few_digits(const char *text, size_t count, uint64_t *value) {
    if (std::endian::native == std::endian::little && count >= sizeof(uint32_t)) {
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
    return count > 0;
}

/* The same for up to MOST_DIGITS digits; false for more. */
inline bool all_digits(std::string_view text, uint64_t *value) {
    if (text.size() <= DIGITS_AT_ONCE)
        return few_digits(text.data(), text.size(), value);
    size_t in_front = text.size() - DIGITS_AT_ONCE;
    uint64_t high = 0;
    if (in_front > DIGITS_AT_ONCE || !few_digits(text.data(), in_front, &high) ||
        !few_digits(text.data() + in_front, DIGITS_AT_ONCE, value))
        return false;
    *value += high * 100000000;
    return true;
}

#endif
