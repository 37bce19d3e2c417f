/* ownership.cpp: decides who owns a list of valid values or a bound if the reference alone does not show it. */

#include "reader/ownership.h"

namespace cdb {

namespace {

constexpr std::size_t ALIGNMENT = 8; /* of whatever is stored in the strings */

/* No source gives a valid value that is an empty text. */
bool is_given(const value &v, const bytes &strings) {
    if (v.type() >= VX_INT32 && v.type() <= VX_FLOAT64)
        return true;
    std::optional<std::uint32_t> place = v.place();
    if (!place || *place % ALIGNMENT != 0)
        return false;
    if (v.type() == VX_CHAR_PTR)
        return strings.number<std::uint8_t>(*place) != 0;
    return v.type() == VX_BINARY_PTR &&
           strings.holds(*place + value::BINARY_BYTES, strings.number<std::uint32_t>(*place));
}

/* The latest suspect whose name comes before its texts. */
std::optional<std::size_t> owner_of_texts(std::span<const suspect> suspects) {
    std::optional<std::size_t> latest;
    for (std::size_t i = 0; i < suspects.size(); ++i) {
        const suspect &s = suspects[i];
        bool fits = s.can_have_it && s.text && s.name < *s.text;
        if (fits && (!latest || s.name > suspects[*latest].name))
            latest = i;
    }
    return latest;
}

std::optional<std::size_t> earliest(std::span<const suspect> suspects) {
    std::optional<std::size_t> first;
    for (std::size_t i = 0; i < suspects.size(); ++i)
        if (suspects[i].can_have_it && (!first || suspects[i].began < suspects[*first].began))
            first = i;
    return first;
}

} // namespace

bool can_have_list(const valid_value_list &list, const bytes &strings, bool is_complete) {
    return is_complete && !list.empty() && std::all_of(list.begin(), list.end(), [&](const valid_value &v) {
               return is_given(v.low, strings) && is_given(v.high, strings);
           });
}

std::optional<std::uint32_t> first_text(const valid_value_list &list) {
    return list.empty() ? std::nullopt : list[0].low.place();
}

std::optional<std::size_t> owner_of_first_list(std::span<const suspect> suspects, const first_list_evidence &others) {
    if (others.has_owner)
        return std::nullopt;
    std::optional<std::size_t> owner = owner_of_texts(suspects);
    if (!owner)
        owner = earliest(suspects);
    return owner && suspects[*owner].began < others.later_list ? owner : std::nullopt;
}

std::optional<std::size_t> stray_of(const finding &f) {
    bool is_stray = f.broken->code == CODE_CUT_SHORT || f.broken->code == CODE_RANGE_ASTRAY;
    return is_stray ? std::optional(f.offset) : std::nullopt;
}

ownership::ownership(const database &db, std::vector<std::size_t> found)
    : start(db.file().raw().data()), strays(std::move(found)) {
    std::sort(strays.begin(), strays.end());
}

} // namespace cdb
