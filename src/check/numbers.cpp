/* numbers.cpp: numbers in a source, as the C library reads them. */

#include "check/numbers.h"

#include "compiler/cdgen.h"
#include "format/data_types.h"

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <string>
#include <utility>

namespace check {

/* Plain numbers are read without the C library. */
number::number(std::string_view given, int base) : text(given) {
    constexpr size_t SAFE_DIGITS = 18;
    bool plain = !text.empty() && text.size() <= SAFE_DIGITS && (text[0] != '0' || text.size() == 1 || base == 10);
    for (; plain && read < text.size() && text[read] >= '0' && text[read] <= '9'; ++read)
        value = value * 10 + (text[read] - '0');
    if (read == 0 || read < text.size())
        convert(base);
}

void number::convert(int base) {
    std::string copy(text);
    errno = 0;
    char *stop = nullptr;
    value = std::strtoll(copy.c_str(), &stop, base);
    overflow = errno == ERANGE;
    read = static_cast<size_t>(stop - copy.c_str());
}

std::string_view number::rest() const {
    std::string_view left = text.substr(read);
    return left.substr(std::min(left.find_first_not_of(" \t"), left.size()));
}

bool is_plain(std::string_view text, int bits) {
    constexpr size_t MOST_DIGITS = 9;
    if (text.empty() || text.size() > MOST_DIGITS || (text[0] == '0' && text.size() > 1))
        return false;
    unsigned value = 0;
    for (char c : text) {
        if (c < '0' || c > '9')
            return false;
        value = value * 10 + static_cast<unsigned>(c - '0');
    }
    return bits != 16 || value <= 0xFFFF;
}

bounds::bounds(std::string_view text) : low(text), high(text) {
    size_t comma = text.find(',');
    if (comma == std::string_view::npos)
        return;
    low = text.substr(0, comma);
    high = text.substr(comma + 1);
    offset = comma + 1;
}

bool is_numeric(vx_data_type_t type) {
    vx_data_type_t scalar = scalar_vx(type);
    return scalar >= VX_INT32 && scalar <= VX_FLOAT64;
}

bool number_part::is_plain() const {
    switch (form) {
    case number_form::BITS16:
        return check::is_plain(text, 16);
    case number_form::INDEX: /* 65535 is the first that an attribute cannot store */
        return check::is_plain(text, 16) && text != "65535";
    case number_form::BITS32:
    case number_form::ID:
    case number_form::INT32:
    case number_form::UINT32:
    case number_form::UINT64:
        return check::is_plain(text, 32);
    default:
        return false;
    }
}

namespace {

/* The compiler itself refuses wrong numbers of other types. */
void add_typed(number_parts &parts, vx_data_type_t type, std::string_view text, size_t offset) {
    switch (scalar_vx(type)) {
    case VX_INT32:
        return parts.add({text, offset, number_form::INT32});
    case VX_UINT32:
        return parts.add({text, offset, number_form::UINT32});
    case VX_UINT64:
        return parts.add({text, offset, number_form::UINT64});
    default:
        return;
    }
}

void add_bounds(number_parts &parts, vx_data_type_t type, const bounds &both) {
    add_typed(parts, type, both.low, 0);
    if (both.two())
        add_typed(parts, type, both.high, both.offset);
}

void add_varieties(number_parts &parts, const bounds &both) {
    parts.add({both.low, 0, number_form::BITS32});
    parts.add({both.high, both.offset, number_form::BITS32});
}

void add_version(number_parts &parts, std::string_view text) {
    size_t offset = 0;
    for (int part = 0; part < 4 && offset <= text.size(); ++part) {
        size_t dot = std::min(text.find('.', offset), text.size());
        parts.add({text.substr(offset, dot - offset), offset, number_form::VERSION_PART});
        offset = dot + 1;
    }
    if (offset <= text.size())
        parts.add({text.substr(offset), offset, number_form::VERSION_REST});
}

} // namespace

number_parts numbers_in(int attr_type, vx_data_type_t type, std::string_view value) {
    number_parts parts;
    switch (attr_type) {
    case AT_UINT16:
    case AT_SD_DESCRIPTION:
    case AT_SD_DISPLAY:
    case AT_VALUE_DISPLAY:
    case AT_SD_VALUE_DISPLAY:
        parts.add({value, 0, number_form::BITS16});
        break;
    case AT_ID:
        parts.add({value, 0, number_form::ID});
        break;
    case AT_SD_INDEX:
        parts.add({value, 0, number_form::INDEX});
        break;
    case AT_VARIETY:
        add_varieties(parts, bounds(value));
        break;
    case AT_VERSION:
        add_version(parts, value);
        break;
    case AT_DEFAULT_VALUE:
    case AT_INITIAL_VALUE:
        add_typed(parts, type, value, 0);
        break;
    case AT_VALID_VALUE:
    case AT_SD_VALID_VALUE:
    case AT_RANGE:
        add_bounds(parts, type, bounds(value));
        break;
    default:
        break;
    }
    return parts;
}

bool is_low_above_high(bool variety, vx_data_type_t type, std::string_view value) {
    bounds both(value);
    auto low = [&] { return std::string(both.low); };
    auto high = [&] { return std::string(both.high); };
    if (is_plain(both.low, 32) && is_plain(both.high, 32)) /* the same in all types and bases */
        return std::pair(both.low.size(), both.low) > std::pair(both.high.size(), both.high);
    switch (variety ? VX_UINT32 : scalar_vx(type)) {
    case VX_FLOAT32:
    case VX_FLOAT64:
        return std::strtod(low().c_str(), nullptr) > std::strtod(high().c_str(), nullptr);
    case VX_UINT64:
        return std::strtoull(low().c_str(), nullptr, 10) > std::strtoull(high().c_str(), nullptr, 10);
    default:
        int base = variety ? 0 : 10;
        return number(both.low, base).value > number(both.high, base).value;
    }
}

} // namespace check
