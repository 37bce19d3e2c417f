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
    if (single)
        add_to_chunks(*std::exchange(single, std::nullopt));
    return add_to_chunks(given);
}

key_ranges::range key_ranges::add_to_chunks(const range &given) {
    size_t texts_before = texts.size();
    packed low = pack(given.low);
    entry added = {low, given.high == given.low ? low : pack(given.high), given.line};
    range earlier;
    bool is_within = false;
    position after = first_above(view_of(added.high));
    for (; after.index > 0; after = first_above(view_of(added.high))) {
        position at = {after.chunk, after.index - 1};
        entry each = chunks[at.chunk][at.index];
        if (view_of(each.high) < view_of(added.low))
            break;
        earlier = {unpack(each.low), unpack(each.high), each.line};
        bool begins = view_of(each.low) <= view_of(added.low);
        bool ends = view_of(added.high) <= view_of(each.high);
        is_within = begins && ends;
        added = {begins ? each.low : added.low, ends ? each.high : added.high, std::min(added.line, each.line)};
        erase(at);
    }
    if (is_within)
        texts.resize(texts_before);
    insert(after, added);
    return earlier;
}

key_ranges::packed key_ranges::pack(const value_key &key) {
    if (key.text.empty())
        return key.number;
    auto length = static_cast<std::uint16_t>(key.text.size());
    auto begin = static_cast<packed>(texts.size() + 1);
    texts += static_cast<char>(length >> 8);
    texts += static_cast<char>(length & 0xFF);
    texts += key.text;
    return begin;
}

key_ranges::key_view key_ranges::view_of(packed key) const {
    if (texts.empty())
        return {key, {}};
    if (key == 0)
        return {0, {}};
    auto at = static_cast<size_t>(key) - 1;
    size_t length = size_t{static_cast<unsigned char>(texts[at])} << 8 | static_cast<unsigned char>(texts[at + 1]);
    return {0, std::string_view(texts).substr(at + 2, length)};
}

value_key key_ranges::unpack(packed key) const {
    key_view view = view_of(key);
    return {view.number, std::string(view.text)};
}

/* Where the first range that begins above a key is, or would be. The range before it, if there is one, is in the same
 * chunk. */
key_ranges::position key_ranges::first_above(const key_view &key) const {
    auto is_below = [this](const key_view &wanted, const entry &each) { return wanted < view_of(each.low); };
    auto next = std::upper_bound(chunks.begin(), chunks.end(), key, [&](const key_view &wanted, const chunk &each) {
        return is_below(wanted, each.front());
    });
    if (next == chunks.begin())
        return {0, 0};
    const chunk &in = *std::prev(next);
    auto at = std::upper_bound(in.begin(), in.end(), key, is_below);
    return {static_cast<size_t>(next - chunks.begin()) - 1, static_cast<size_t>(at - in.begin())};
}

/* A full chunk is halved, except at the end of all: most values ascend. */
void key_ranges::insert(position at, const entry &added) {
    bool at_end = at.chunk + 1 >= chunks.size() && (chunks.empty() || at.index == chunks.back().size());
    if (at_end && (chunks.empty() || at.index == CHUNK_MAX)) {
        chunks.push_back({added});
        return;
    }
    chunk &in = chunks[at.chunk];
    in.insert(in.begin() + static_cast<std::ptrdiff_t>(at.index), added);
    if (in.size() <= CHUNK_MAX)
        return;
    auto middle = in.begin() + CHUNK_MAX / 2;
    chunk second(middle, in.end());
    in.erase(middle, in.end());
    chunks.insert(chunks.begin() + static_cast<std::ptrdiff_t>(at.chunk) + 1, std::move(second));
}

void key_ranges::erase(position at) {
    chunk &in = chunks[at.chunk];
    in.erase(in.begin() + static_cast<std::ptrdiff_t>(at.index));
    if (in.empty())
        chunks.erase(chunks.begin() + static_cast<std::ptrdiff_t>(at.chunk));
}

bool key_ranges::has(const value_key &key) const {
    if (single)
        return single->low <= key && key <= single->high;
    position after = first_above(view_of(key));
    return after.index > 0 && view_of(key) <= view_of(chunks[after.chunk][after.index - 1].high);
}

void key_ranges::clear() {
    single.reset();
    if (chunks.empty())
        return;
    chunks.clear();
    texts.clear();
}

} // namespace check
