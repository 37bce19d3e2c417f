/* identity.cpp: what identifies records and entries. */

#include "compare/identity.h"

#include <functional>

namespace compare {

std::strong_ordering order_of(const identity &a, const identity &b) {
    if (auto by_kind = a.kind <=> b.kind; std::is_neq(by_kind))
        return by_kind;
    if (auto by_number = a.number <=> b.number; std::is_neq(by_number))
        return by_number;
    if (auto by_name = a.name <=> b.name; std::is_neq(by_name))
        return by_name;
    if (auto by_low = order_of(a.low, b.low); std::is_neq(by_low))
        return by_low;
    return order_of(a.high, b.high);
}

std::size_t hash_of(const identity &i) {
    constexpr std::size_t FACTOR = 31;
    std::size_t sum = std::hash<std::string_view>{}(i.name) ^ std::hash<std::uint64_t>{}(i.number);
    sum = sum * FACTOR + std::hash<std::string_view>{}(i.low.content());
    sum = sum * FACTOR + std::hash<std::string_view>{}(i.high.content());
    return sum * FACTOR + static_cast<std::size_t>(i.kind);
}

/* The elements of a valid value are not followed. */
owned_value valid_value_in(const node &n, std::size_t cell) {
    const cdb::bytes &strings = n.section->tables.strings;
    return {{n.area, n.at + cell, n.type, strings, cdb::NESTING_MAX},
            n.from->owners.is_own(n.area, n.at + cell),
            strings,
            &n.from->owners};
}

static identity identity_of_valid_value(const node &n) {
    return {.kind = n.kind,
            .low = look_at(valid_value_in(n, offsetof(vv_entry_t, vv_low_val))),
            .high = look_at(valid_value_in(n, offsetof(vv_entry_t, vv_high_val)))};
}

identity identity_of(const node &n) {
    switch (n.kind) {
    case node_kind::valid_value:
        return identity_of_valid_value(n);
    case node_kind::variety:
        return {.kind = n.kind,
                .number = std::uint64_t{n.area.number<std::uint32_t>(n.at + offsetof(vl_entry_t, vl_low_val))} << 32 |
                          n.area.number<std::uint32_t>(n.at + offsetof(vl_entry_t, vl_high_val))};
    case node_kind::variable:
    case node_kind::class_variable:
        return {.kind = n.kind, .number = n.area.number<var_id_t>(n.at)};
    case node_kind::dependency:
        return {.kind = n.kind, .number = n.area.number<std::uint16_t>(n.at + offsetof(rsrc_depend_t, rd_class_ID))};
    case node_kind::hash_block:
        return {.kind = n.kind, .number = n.area.number<std::uint32_t>(n.at + offsetof(rc_hash_block_t, rch_class_id))};
    default:
        break;
    }
    bool has_name = n.format != nullptr && n.format->name != nullptr;
    return {.kind = n.kind, .name = has_name ? text_in(n, *n.format->name) : std::string_view()};
}

} // namespace compare
