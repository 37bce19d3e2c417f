/* fields.cpp: what the fields of records mean. */

#include "cdef/dump/dump.h"

#include "format/names.h"
#include "format/sections.h"
#include "text/append.h"
#include "text/hex.h"
#include "text/number.h"

#include <chrono>

namespace cdef::dump {

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

} // namespace

std::uint32_t number_in(const cdb::bytes &area, std::size_t at, const cdb::field &f) {
    bool is_short = f.width == sizeof(std::uint16_t);
    return is_short ? area.number<std::uint16_t>(at + f.offset) : area.number<std::uint32_t>(at + f.offset);
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

vx_data_type_t data_type_in(const cdb::record_format &format, const cdb::bytes &area, std::size_t at) {
    return format.type == nullptr ? VX_UNKNOWN : static_cast<vx_data_type_t>(number_in(area, at, *format.type));
}

const cdb::bytes &lists_of(const cdb::class_tables &tables, cdb::target to) {
    return to == cdb::target::variety_lists ? tables.variety_lists
           : to == cdb::target::valid_vals  ? tables.valid_vals
                                            : tables.sd_defs;
}

} // namespace cdef::dump
