/* facts.cpp: what fields of databases state. */

#include "cdef/support/facts.h"

#include "format/names.h"
#include "format/sections.h"
#include "report/json_text.h"
#include "text/append.h"
#include "text/hex.h"
#include "text/number.h"
#include "text/utf8.h"

#include <nlohmann/json.hpp>

#include <charconv>
#include <chrono>
#include <cmath>

namespace cdef::facts {

namespace {

using enum cdb::meaning;

/* The bits' names, the lowest first; what has no name follows as one number. */
template <class NameOf> words names_of(std::uint32_t set, NameOf name_of) {
    words names;
    std::uint32_t unknown = 0;
    for (std::uint32_t bit = 1; bit != 0; bit <<= 1) {
        std::string name = (set & bit) != 0 ? name_of(bit) : std::string();
        if (!name.empty())
            names.list.push_back(std::move(name));
        else
            unknown |= set & bit;
    }
    if (unknown != 0)
        names.list.push_back(text::hex(unknown));
    return names;
}

words properties(std::span<const props_t> table, std::uint32_t set) {
    return names_of(set, [table](std::uint32_t bit) {
        auto found = std::find_if(table.begin(), table.end(), [bit](const props_t &p) { return p.p == bit; });
        return std::string(found == table.end() ? "" : found->s);
    });
}

words permissions(std::uint32_t set) {
    return names_of(set, [](std::uint32_t bit) {
        char letter = permission_letter(bit);
        return letter == '\0' ? std::string() : std::string{letter};
    });
}

/* The characters of a mark, the first one in the highest byte. */
fact mark(std::uint32_t number) {
    std::string characters;
    for (int shift = 24; shift >= 0; shift -= 8)
        characters += static_cast<char>(number >> shift & 0xFF);
    bool readable = std::all_of(characters.begin(), characters.end(), [](char c) { return c > ' ' && c <= '~'; });
    if (readable)
        return word{characters};
    return bits{number};
}

fact time(std::uint32_t seconds) {
    using namespace std::chrono;
    if (seconds == 0)
        return none{};
    sys_seconds moment{std::chrono::seconds(seconds)};
    auto day = floor<days>(moment);
    year_month_day date(day);
    hh_mm_ss clock(moment - day);
    word w;
    text::appendf(w.text, "%04d-%02u-%02uT%02d:%02d:%02dZ", int{date.year()}, unsigned{date.month()},
                  unsigned{date.day()}, static_cast<int>(clock.hours().count()),
                  static_cast<int>(clock.minutes().count()), static_cast<int>(clock.seconds().count()));
    return w;
}

fact name_in(std::span<const char *const> names, std::uint32_t number) {
    if (number < names.size())
        return word{names[number]};
    return bits{number};
}

fact section_type(std::uint32_t number) {
    if (number < std::size(cdb::section_kinds))
        return word{std::string(cdb::section_kinds[number].spelling)};
    return bits{number};
}

/* ---- JSON ------------------------------------------------------------------------------------------------------ */

using json = nlohmann::ordered_json;

json json_of(none) {
    return nullptr;
}
json json_of(std::int64_t number) {
    return number;
}
json json_of(std::uint64_t number) {
    return number;
}
/* What JSON has no number for becomes text. The number goes through its digits, so that 0.1 of 32 bits does not become
 * 0.10000000149011612. */
template <class Real> json json_of_real(Real number) {
    std::string digits = text::shortest(number);
    if (!std::isfinite(number))
        return digits;
    double same = 0;
    std::from_chars(digits.data(), digits.data() + digits.size(), same);
    return same;
}
json json_of(float number) {
    return json_of_real(number);
}
json json_of(double number) {
    return json_of_real(number);
}
json json_of(bits b) {
    return b.number;
}
json json_of(const word &w) {
    return w.text;
}
json json_of(const words &w) {
    return w.list;
}
json json_of(binary b) {
    json data;
    data["bytes"] = text::hex_of(b.bytes);
    return data;
}
json json_of(any_text t) {
    return text::is_utf8(t.bytes) ? json(t.bytes) : json_of(binary{std::as_bytes(std::span(t.bytes))});
}
json json_of(const vx_resource_handle_t &h) {
    json data;
    data["header"] = h.header;
    for (std::uint32_t part : {h.id.id1, h.id.id2, h.id.id3, h.id.id4})
        data["id"].push_back(part);
    return data;
}
json json_of(const named &n) {
    bool known = !n.kind.empty();
    json data;
    data["number"] = n.number;
    data["kind"] = known ? json(n.kind) : json();
    data["name"] = known ? json_of(any_text{n.name}) : json();
    return data;
}
json json_of(const checksum &c) {
    json data;
    data["correct"] = c.found.empty();
    if (c.found.empty())
        return data;
    data["found"] = std::strtoul(c.found.c_str(), nullptr, 16);
    data["expected"] = std::strtoul(c.expected.c_str(), nullptr, 16);
    return data;
}

} // namespace

fact fact_of(cdb::meaning as, std::uint32_t number) {
    if (number == cdb::none_of(as))
        return none{};
    switch (as) {
    case SIGNED:
        return std::int64_t{static_cast<std::int32_t>(number)};
    case BITS:
    case CHECKSUM:
        return bits{number};
    case MARK:
        return mark(number);
    case TIME:
        return time(number);
    case SECTION_TYPE:
        return section_type(number);
    case CLASS_PROPERTIES:
    case PERSISTENT_PROPERTIES:
    case DYNAMIC_PROPERTIES:
    case ACTION_PROPERTIES:
        return properties(cdb::properties_of(as), number);
    case PERMISSIONS:
        return permissions(number);
    case DATA_TYPE:
        return name_in(vxTypeStr, number);
    case VARIABLE_TYPE:
        return name_in(vxVarStr, number);
    case VERSION:
        return word{text::dotted(number)};
    case PLAIN:
    case NONE_IS_0:
    case NONE_IS_255:
    case NONE_IS_65535:
    case LOCATOR:
    case BOUND:
    case MANAGER:
    case OFFSET:
    case UNUSED:
        break;
    }
    return std::uint64_t{number};
}

fact fact_of(const cdb::value &value) {
    if (!value.present())
        return none{};
    switch (value.type()) {
    case VX_INT32:
    case VX_INT64:
        return value.integer();
    case VX_UINT32:
    case VX_UINT64:
        return value.natural();
    case VX_FLOAT32:
        return static_cast<float>(value.real());
    case VX_FLOAT64:
        return value.real();
    case VX_CHAR_PTR:
        return any_text{value.text()};
    case VX_BINARY_PTR:
        return binary{value.binary()};
    default: /* of those with elements these are facts of their own */
        return value.handle();
    }
}

std::string json_of(const fact &f) {
    return report::json_line(std::visit([](const auto &some) { return json_of(some); }, f));
}

} // namespace cdef::facts
