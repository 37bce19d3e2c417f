/* facts.cpp: the fields of databases as facts. */

#include "cdef/support/facts.h"

#include "format/names.h"
#include "format/sections.h"
#include "report/json_writer.h"
#include "text/append.h"
#include "text/hex.h"
#include "text/number.h"
#include "text/utf8.h"

#include <nlohmann/json.hpp>

#include <array>
#include <charconv>
#include <chrono>
#include <cmath>

namespace cdef::facts {

namespace {

using enum cdb::meaning;

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

template <class Number> void append_digits(std::string &to, Number number) {
    std::array<char, 24> digits;
    to.append(digits.data(), std::to_chars(digits.data(), digits.data() + digits.size(), number).ptr);
}

/* Numbers that JSON cannot write become text. The conversion uses the decimal digits, so that 0.1 as a 32-bit number
 * does not become 0.10000000149011612. */
template <class Real> void append_real(std::string &to, Real number) {
    std::string digits = text::shortest(number);
    if (!std::isfinite(number))
        return report::append_json(to, digits);
    double same = 0;
    std::from_chars(digits.data(), digits.data() + digits.size(), same);
    to += nlohmann::json(same).dump();
}

/* Appends a fact's value, by its kind. */
struct appender {
    std::string &to;

    void operator()(none) const {
        to += "null";
    }
    void operator()(std::int64_t number) const {
        append_digits(to, number);
    }
    void operator()(std::uint64_t number) const {
        append_digits(to, number);
    }
    void operator()(float number) const {
        append_real(to, number);
    }
    void operator()(double number) const {
        append_real(to, number);
    }
    void operator()(bits b) const {
        append_digits(to, b.number);
    }
    void operator()(const word &w) const {
        report::append_json(to, w.text);
    }
    void operator()(const named_bits &b) const {
        to += '[';
        std::string_view comma;
        take_names(b, [&](std::string_view name) {
            report::append_json(to += comma, name);
            comma = ",";
        });
        to += ']';
    }
    void operator()(binary b) const {
        to += "{\"bytes\":\"";
        text::append_hex(to, b.bytes);
        to += "\"}";
    }
    void operator()(any_text t) const {
        if (text::is_utf8(t.bytes))
            report::append_json(to, t.bytes);
        else
            (*this)(binary{std::as_bytes(std::span(t.bytes))});
    }
    void operator()(const vx_resource_handle_t &h) const {
        text::appendf(to, "{\"header\":%u,\"id\":[%u,%u,%u,%u]}", h.header, h.id.id1, h.id.id2, h.id.id3, h.id.id4);
    }
    void operator()(const named &n) const {
        bool known = !n.kind.empty();
        append_digits(to += "{\"number\":", n.number);
        to += ",\"kind\":";
        known ? report::append_json(to, n.kind) : (*this)(none{});
        to += ",\"name\":";
        known ? (*this)(any_text{n.name}) : (*this)(none{});
        to += '}';
    }
    void operator()(const checksum &c) const {
        to += c.found.empty() ? "{\"correct\":true" : "{\"correct\":false,\"found\":";
        if (!c.found.empty()) {
            append_digits(to, std::strtoul(c.found.c_str(), nullptr, 16));
            append_digits(to += ",\"expected\":", std::strtoul(c.expected.c_str(), nullptr, 16));
        }
        to += '}';
    }
};

} // namespace

std::string_view name_of_bit(cdb::meaning as, std::uint32_t bit) {
    if (as == PERMISSIONS) {
        for (const valid_perms_t &known : perm_list)
            if (known.mask == bit)
                return {&known.permission, 1};
        return {};
    }
    for (const props_t &known : cdb::properties_of(as))
        if (known.p == bit)
            return known.s;
    return {};
}

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
    case PERMISSIONS:
        return named_bits{as, number};
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

void append_json(std::string &to, const fact &f) {
    std::visit(appender{to}, f);
}

} // namespace cdef::facts
