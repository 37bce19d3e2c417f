/* name_index.h: finds a name in a fixed list with one comparison. The list is hashed while compiling, with a multiplier
 * that gives every name a slot of its own. */
#ifndef CDGEN_NAME_INDEX_H
#define CDGEN_NAME_INDEX_H

#include <array>
#include <cstdint>
#include <span>
#include <string_view>

class name_index {
public:
    static constexpr int NOT_FOUND = -1;
    static constexpr std::size_t MOST_NAMES = 64;

    constexpr name_index() = default;

    /* name_of(i), for i below count, are the names. There are at most MOST_NAMES, and no two may have the same length
     * and the same first, middle and last character. (Otherwise the search for a multiplier does not end, and the C++
     * compiler reports that.) */
    template <class NameOf> consteval name_index(std::size_t count, NameOf name_of) {
        while (!fill(count, name_of))
            multiplier *= 0x5851F42D4C957F2D; /* stays odd */
    }

    /* The position of the only name that this can be, or NOT_FOUND. The caller has to compare the two. */
    constexpr int candidate(std::string_view name) const {
        return name.empty() ? NOT_FOUND : slots[slot_of(name)];
    }

private:
    static constexpr unsigned SLOT_BITS = 6;

    constexpr std::size_t slot_of(std::string_view name) const {
        auto byte = [&](std::size_t at) { return std::uint64_t{static_cast<unsigned char>(name[at])}; };
        std::size_t size = name.size();
        std::uint64_t key = byte(0) | byte((size - 1) / 2) << 8 | byte(size - 1) << 16 | std::uint64_t{size} << 24;
        return static_cast<std::size_t>((key * multiplier) >> (64 - SLOT_BITS));
    }

    template <class NameOf> consteval bool fill(std::size_t count, NameOf name_of) {
        slots.fill(NOT_FOUND);
        for (std::size_t i = 0; i < count; ++i) {
            std::int8_t &slot = slots[slot_of(name_of(i))];
            if (slot != NOT_FOUND)
                return false;
            slot = static_cast<std::int8_t>(i);
        }
        return true;
    }

    std::uint64_t multiplier = 0x9E3779B97F4A7C15; /* odd, otherwise arbitrary: the search begins here */
    std::array<std::int8_t, 1U << SLOT_BITS> slots = {};
};

#endif
