/* value_keys.cpp: the values of a source as keys that compare as the values do, and sets of ranges of them. */

#include "check/value_keys.h"

#include "check/numbers.h"
#include "format/data_types.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstdlib>
#include <iterator>
#include <limits>
#include <utility>

namespace check {

namespace {

std::optional<value_key> key_of_float(double value) {
    if (std::isnan(value))
        return std::nullopt;
    auto bits = std::bit_cast<std::int64_t>(value == 0 ? 0.0 : value); /* -0.0 is 0.0 */
    return value_key{bits < 0 ? std::numeric_limits<std::int64_t>::min() - bits : bits, {}};
}

vx_uint64_t unsigned_in(std::string_view text) {
    constexpr int BITS = 32;
    return is_plain(text, BITS) ? static_cast<vx_uint64_t>(number(text, 10).value)
                                : std::strtoull(std::string(text).c_str(), nullptr, 10);
}

/* Without 0x the first bytes are lost, which has a warning of its own. */
std::optional<value_key> key_of_binary(std::string_view text) {
    if (!text.empty() && !text.starts_with("0x"))
        return std::nullopt;
    std::string bytes;
    for (size_t at = 2; at + 1 < text.size(); at += 2)
        bytes += static_cast<char>(std::strtol(std::string(text.substr(at, 2)).c_str(), nullptr, 16));
    return value_key{0, bytes};
}

} // namespace

std::optional<value_key> key_of(vx_data_type_t type, std::string_view text) {
    switch (scalar_vx(type)) {
    case VX_INT32:
        return value_key{static_cast<vx_int32_t>(number(text, 10).value), {}};
    case VX_UINT32:
        return value_key{static_cast<vx_uint32_t>(unsigned_in(text)), {}};
    case VX_INT64:
        return value_key{number(text, 10).value, {}};
    case VX_UINT64: /* half of them would be negative */
        return value_key{std::bit_cast<std::int64_t>(unsigned_in(text) ^ (vx_uint64_t{1} << 63)), {}};
    case VX_FLOAT32:
        return key_of_float(std::strtof(std::string(text).c_str(), nullptr));
    case VX_FLOAT64:
        return key_of_float(std::strtod(std::string(text).c_str(), nullptr));
    case VX_CHAR_PTR:
        return value_key{0, std::string(text)};
    case VX_BINARY_PTR:
        return key_of_binary(text);
    default:
        return std::nullopt;
    }
}

std::optional<value_key> default_key(vx_data_type_t type) {
    bool numeric = is_numeric(type);
    return key_of(type, numeric ? "0" : "");
}

key_ranges::range key_ranges::add(range given) {
    if (given.high < given.low)
        return {};
    if (empty()) {
        single = std::move(given);
        return {};
    }
    if (single) {
        add_to_map(std::move(*single));
        single.reset();
    }
    return add_to_map(std::move(given));
}

key_ranges::range key_ranges::add_to_map(range given) {
    range earlier;
    auto after = by_low.upper_bound(given.high);
    while (after != by_low.begin()) {
        auto each = std::prev(after);
        if (each->second.high < given.low)
            break;
        earlier = {each->first, each->second.high, each->second.line};
        given.low = std::min(given.low, each->first);
        given.high = std::max(given.high, each->second.high);
        given.line = std::min(given.line, each->second.line);
        after = by_low.erase(each);
    }
    by_low.emplace_hint(after, std::move(given.low), rest{std::move(given.high), given.line});
    return earlier;
}

bool key_ranges::has(const value_key &key) const {
    if (single)
        return single->low <= key && key <= single->high;
    auto after = by_low.upper_bound(key);
    return after != by_low.begin() && key <= std::prev(after)->second.high;
}

} // namespace check
