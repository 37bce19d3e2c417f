/* keyed_hash.cpp: SipHash, with one round for each word and three at the end, which is enough for hash tables. */

#include "text/keyed_hash.h"

#include <bit>
#include <chrono>
#include <cstddef>
#include <cstring>
#include <exception>
#include <random>

namespace text {

namespace {

constexpr std::size_t WORD = sizeof(std::uint64_t);

/* Eight bytes, the lowest one first. */
std::uint64_t word_at(const char *bytes) {
    std::uint64_t word = 0;
    std::memcpy(&word, bytes, WORD);
    return std::endian::native == std::endian::little ? word : __builtin_bswap64(word);
}

/* Fewer bytes, the lowest one first. before: how many bytes are before them */
std::uint64_t rest_at(const char *bytes, std::size_t size, std::size_t before) {
    if (size == 0)
        return 0;
    if (before >= WORD) /* this is faster */
        return word_at(bytes + size - WORD) >> 8 * (WORD - size);
    std::uint64_t word = 0;
    for (std::size_t i = size; i-- > 0;)
        word = word << 8 | static_cast<unsigned char>(bytes[i]);
    return word;
}

struct state {
    explicit state(const hash_key &key)
        : v0(key.first ^ 0x736F6D6570736575), v1(key.second ^ 0x646F72616E646F6D), v2(key.first ^ 0x6C7967656E657261),
          v3(key.second ^ 0x7465646279746573) {}

    void round() {
        v0 += v1;
        v2 += v3;
        v1 = std::rotl(v1, 13) ^ v0;
        v3 = std::rotl(v3, 16) ^ v2;
        v0 = std::rotl(v0, 32);
        v2 += v1;
        v0 += v3;
        v1 = std::rotl(v1, 17) ^ v2;
        v3 = std::rotl(v3, 21) ^ v0;
        v2 = std::rotl(v2, 32);
    }
    void take(std::uint64_t word) {
        v3 ^= word;
        round();
        v0 ^= word;
    }

    std::uint64_t v0, v1, v2, v3;
};

} // namespace

std::uint64_t hash_of(std::string_view bytes, const hash_key &key) {
    state s(key);
    std::size_t rest = bytes.size() % WORD;
    std::size_t whole = bytes.size() - rest;
    for (std::size_t i = 0; i < whole; i += WORD)
        s.take(word_at(bytes.data() + i));
    s.take(std::uint64_t{bytes.size()} << 56 | rest_at(bytes.data() + whole, rest, whole));
    s.v2 ^= 0xFF;
    for (int i = 0; i < 3; ++i)
        s.round();
    return s.v0 ^ s.v1 ^ s.v2 ^ s.v3;
}

hash_key random_key() {
    try {
        std::random_device random;
        auto word = [&] { return std::uint64_t{random()} << 32 | random(); };
        std::uint64_t first = word();
        return {first, word()};
    } catch (const std::exception &) { /* the time, and where the system has put the stack */
        auto now = std::chrono::high_resolution_clock::now().time_since_epoch().count();
        return {static_cast<std::uint64_t>(now), std::bit_cast<std::uintptr_t>(&now)};
    }
}

} // namespace text
