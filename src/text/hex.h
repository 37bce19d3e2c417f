/* hex.h: hexadecimal, in lower case. Inline, so that the reader, which is installed alone, can use it. */
#ifndef CDGEN_TEXT_HEX_H
#define CDGEN_TEXT_HEX_H

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>

namespace text {

inline constexpr std::string_view HEX_DIGITS = "0123456789abcdef";

/* "0x1f": without leading zeros. */
inline std::string hex(std::uint64_t number) {
    std::string digits;
    do
        digits.insert(digits.begin(), HEX_DIGITS[number % 16]);
    while ((number /= 16) != 0);
    return "0x" + digits;
}

/* Appends "001f": two digits for each byte. */
inline void append_hex(std::string &to, std::span<const std::byte> bytes) {
    for (std::byte b : bytes) {
        to += HEX_DIGITS[std::to_integer<unsigned>(b) >> 4];
        to += HEX_DIGITS[std::to_integer<unsigned>(b) & 0xF];
    }
}

/* The same as a text of its own. */
inline std::string hex_of(std::span<const std::byte> bytes) {
    std::string digits;
    digits.reserve(bytes.size() * 2);
    append_hex(digits, bytes);
    return digits;
}

} // namespace text

#endif
