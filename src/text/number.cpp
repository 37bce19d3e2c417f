/* number.cpp: numbers as text. */

#include "text/number.h"
#include "text/append.h"
#include "text/hex.h"

#include <array>
#include <bit>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <limits>

namespace text {

namespace {

/* All bits of the fraction except the highest, which marks a quiet NaN. */
template <class Bits, class Number> Bits payload_of(Number number) {
    constexpr int FRACTION = std::numeric_limits<Number>::digits - 1;
    return std::bit_cast<Bits>(number) & ((Bits{1} << (FRACTION - 1)) - 1);
}

template <class Bits, class Number> std::string shortest_of(Number number) {
    if (std::isnan(number)) {
        Bits payload = payload_of<Bits>(number);
        return std::string(std::signbit(number) ? "-nan" : "nan") + (payload == 0 ? "" : "(" + hex(payload) + ")");
    }
    std::array<char, 32> digits;
    char *end = std::to_chars(digits.data(), digits.data() + digits.size(), number).ptr;
    return {digits.data(), end};
}

} // namespace

std::string shortest(float number) {
    return shortest_of<std::uint32_t>(number);
}

std::string shortest(double number) {
    return shortest_of<std::uint64_t>(number);
}

std::string dotted(std::uint32_t number) {
    std::string text;
    appendf(text, "%u.%u.%u.%u", number >> 24, number >> 16 & 0xFF, number >> 8 & 0xFF, number & 0xFF);
    return text;
}

} // namespace text
