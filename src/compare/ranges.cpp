/* ranges.cpp: sets of numbers, given as ranges. */

#include "compare/ranges.h"

#include <bit>
#include <cmath>

namespace compare {

namespace {

constexpr std::uint64_t HIGHEST_BIT = std::uint64_t{1} << 63;

/* The larger a negative number's bits, the smaller the number. Both zeros are one number. */
ordinal ordinal_of_real(double number) {
    auto bits = std::bit_cast<std::uint64_t>(number == 0 ? 0.0 : number);
    return (bits & HIGHEST_BIT) != 0 ? ~bits : bits | HIGHEST_BIT;
}

} // namespace

std::optional<ordinal> ordinal_of(const cdb::value &value) {
    switch (value.type()) {
    case VX_INT32:
    case VX_INT64:
        return static_cast<std::uint64_t>(value.integer()) ^ HIGHEST_BIT;
    case VX_UINT32:
    case VX_UINT64:
        return value.natural();
    case VX_FLOAT32:
    case VX_FLOAT64:
        return std::isnan(value.real()) ? std::nullopt : std::optional(ordinal_of_real(value.real()));
    default:
        return std::nullopt;
    }
}

range_set::range_set(std::vector<range> ranges, bool are_whole_numbers) {
    std::erase_if(ranges, [](const range &r) { return r.low > r.high; });
    std::sort(ranges.begin(), ranges.end(), [](const range &a, const range &b) { return a.low < b.low; });
    for (const range &r : ranges) {
        bool continues =
            !merged.empty() && (r.low <= merged.back().high || (are_whole_numbers && r.low - 1 == merged.back().high));
        if (continues)
            merged.back().high = std::max(merged.back().high, r.high);
        else
            merged.push_back(r);
    }
}

bool range_set::has(const range &r) const {
    auto after = std::upper_bound(merged.begin(), merged.end(), r.low,
                                  [](ordinal low, const range &one) { return low < one.low; });
    return after != merged.begin() && std::prev(after)->high >= r.high;
}

} // namespace compare
