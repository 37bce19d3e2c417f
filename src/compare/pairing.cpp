/* pairing.cpp: pairs the parts of one record with those of another. */

#include "compare/pairing.h"

#include <algorithm>
#include <iterator>

namespace compare {

namespace {

/* One of the two sides. Only hashes are kept, and members are made again whenever they are needed. */
class side {
public:
    side(const siblings &members, std::size_t first) : all(members) {
        entries.reserve(all.size() - first);
        for (std::size_t i = first; i < all.size(); ++i)
            entries.push_back({static_cast<std::uint32_t>(hash_of(at(i))), static_cast<std::uint32_t>(i)});
        sort();
    }

    std::size_t size() const {
        return entries.size();
    }
    std::uint32_t index(std::size_t entry) const {
        return entries[entry].index;
    }
    std::uint32_t hash(std::size_t entry) const {
        return entries[entry].hash;
    }
    identity at(std::size_t index) const {
        section_tables room;
        return identity_of(all.at(index, room));
    }

private:
    struct hashed {
        std::uint32_t hash;
        std::uint32_t index;
    };

    /* Sorts by hash, then by identity, then by position. */
    void sort() {
        std::sort(entries.begin(), entries.end(), [this](const hashed &a, const hashed &b) {
            if (a.hash != b.hash || a.index == b.index)
                return a.hash < b.hash;
            auto order = order_of(at(a.index), at(b.index));
            return std::is_eq(order) ? a.index < b.index : std::is_lt(order);
        });
    }

    const siblings &all;
    std::vector<hashed> entries;
};

std::strong_ordering order_of(const side &a, std::size_t i, const side &b, std::size_t j) {
    if (auto by_hash = a.hash(i) <=> b.hash(j); std::is_neq(by_hash))
        return by_hash;
    return order_of(a.at(a.index(i)), b.at(b.index(j)));
}

bool are_alike(const siblings &before, const siblings &after, std::size_t index) {
    section_tables room_before, room_after;
    return std::is_eq(order_of(identity_of(before.at(index, room_before)), identity_of(after.at(index, room_after))));
}

} // namespace

pairing::pairing(const siblings &before, const siblings &after) {
    std::size_t fewer = std::min(before.size(), after.size());
    while (alike < fewer && are_alike(before, after, alike))
        ++alike;
    if (alike == before.size() && alike == after.size())
        return;
    side one(before, alike), other(after, alike);
    partners.assign(one.size(), NONE);
    std::size_t j = 0;
    for (std::size_t i = 0; i < one.size(); ++i) {
        while (j < other.size() && std::is_lt(order_of(other, j, one, i)))
            unpaired.push_back(other.index(j++));
        if (j < other.size() && std::is_eq(order_of(other, j, one, i)))
            partners[one.index(i) - alike] = other.index(j++);
    }
    while (j < other.size())
        unpaired.push_back(other.index(j++));
    std::sort(unpaired.begin(), unpaired.end());
}

void pairing::join(std::span<const pair> pairs) {
    std::vector<std::uint32_t> joined, rest;
    for (const pair &p : pairs) {
        partners[p.before - alike] = p.after;
        joined.push_back(p.after);
    }
    std::sort(joined.begin(), joined.end());
    std::set_difference(unpaired.begin(), unpaired.end(), joined.begin(), joined.end(), std::back_inserter(rest));
    unpaired = std::move(rest);
}

} // namespace compare
