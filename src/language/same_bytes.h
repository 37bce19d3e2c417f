/* same_bytes.h: compares names of the language, which are too short for a call of memcmp. */
#ifndef CDGEN_LANGUAGE_SAME_BYTES_H
#define CDGEN_LANGUAGE_SAME_BYTES_H

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string_view>

namespace language {

/* True if both begin with the same word and, n bytes long, end with the same word. The two words may overlap. */
template <class Word> bool same_ends(const char *a, const char *b, std::size_t n) {
    auto differ = [a, b](std::size_t at) {
        Word left = 0;
        Word right = 0;
        std::memcpy(&left, a + at, sizeof left);
        std::memcpy(&right, b + at, sizeof right);
        return left ^ right;
    };
    return (differ(0) | differ(n - sizeof(Word))) == 0;
}

/* True if memcmp would find n bytes equal. */
[[gnu::always_inline]] inline bool same_bytes(const char *a, const char *b, std::size_t n) {
    for (constexpr std::size_t STEP = sizeof(std::uint64_t); n > 2 * STEP; a += STEP, b += STEP, n -= STEP)
        if (!same_ends<std::uint64_t>(a, b, STEP))
            return false;
    if (n >= sizeof(std::uint64_t))
        return same_ends<std::uint64_t>(a, b, n);
    if (n >= sizeof(std::uint32_t))
        return same_ends<std::uint32_t>(a, b, n);
    if (n >= sizeof(std::uint16_t))
        return same_ends<std::uint16_t>(a, b, n);
    return n == 0 || *a == *b;
}

[[gnu::always_inline]] inline bool same_text(std::string_view a, std::string_view b) {
    return a.size() == b.size() && same_bytes(a.data(), b.data(), a.size());
}

} // namespace language

#endif
