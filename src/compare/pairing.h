/* pairing.h: pairs the parts of one record with those of another. */
#ifndef CDGEN_COMPARE_PAIRING_H
#define CDGEN_COMPARE_PAIRING_H

#include "compare/identity.h"

#include <span>
#include <vector>

namespace compare {

/* The parts of a record, or the sections of a database, by their position. */
class siblings {
public:
    explicit siblings(const family &parts) : members(&parts), count(parts.count) {}
    explicit siblings(const origin &from) : sections(&from), count(from.db.section_count()) {}

    std::size_t size() const {
        return count;
    }
    /* room: for a section's tables; used for sections only, and must live as long as the node. */
    node at(std::size_t index, section_tables &room) const {
        return sections != nullptr ? section_node(*sections, index, room) : members->at(index);
    }

private:
    const family *members = nullptr;
    const origin *sections = nullptr;
    std::size_t count;
};

/* Parts with the same identity are paired in their order, the first with the first. */
class pairing {
public:
    static constexpr std::uint32_t NONE = 0xFFFFFFFF;

    pairing(const siblings &before, const siblings &after);

    /* The position in `after` of the partner of a part in `before`; NONE if it has no partner. */
    std::uint32_t partner_of(std::size_t before) const {
        return before < alike ? static_cast<std::uint32_t>(before) : partners[before - alike];
    }
    /* The positions of the parts in `after` without a partner, in their order. */
    const std::vector<std::uint32_t> &left() const {
        return unpaired;
    }

    struct pair {
        std::uint32_t before;
        std::uint32_t after;
    };
    /* Makes pairs of parts that have no partner. */
    void join(std::span<const pair> pairs);

private:
    std::size_t alike = 0;               /* how many parts at the beginning of both sides are pairs */
    std::vector<std::uint32_t> partners; /* of the others before */
    std::vector<std::uint32_t> unpaired;
};

} // namespace compare

#endif
