/* fields.cpp: the numbers in fields as texts. */

#include "compare/fields.h"

#include "cdb_view.h"
#include "text/hex.h"
#include "text/number.h"

namespace compare {

namespace {

std::string text_of_permission(std::uint32_t mask) {
    char letter = permission_letter(mask);
    return letter == '\0' ? text_of_bits(mask, {}) : std::string{letter};
}

} // namespace

std::string text_of_bits(std::uint32_t bits, std::span<const props_t> known) {
    std::string text;
    auto add = [&text](const std::string &name) { text += (text.empty() ? "" : "+") + name; };
    std::uint32_t unknown = take_properties(bits, known, add);
    if (unknown != 0)
        add(text::hex(unknown));
    return text.empty() ? "none" : text;
}

std::string text_of_number(std::uint32_t number, cdb::meaning as) {
    switch (as) {
    case cdb::meaning::SIGNED:
        return std::to_string(static_cast<std::int32_t>(number));
    case cdb::meaning::BITS:
    case cdb::meaning::CLASS_PROPERTIES:
    case cdb::meaning::PERSISTENT_PROPERTIES:
    case cdb::meaning::DYNAMIC_PROPERTIES:
    case cdb::meaning::ACTION_PROPERTIES:
        return text_of_bits(number, cdb::properties_of(as));
    case cdb::meaning::VERSION:
        return text::dotted(number);
    case cdb::meaning::DATA_TYPE:
        return std::string(cdb::name_of(static_cast<vx_data_type_t>(number)));
    case cdb::meaning::VARIABLE_TYPE:
        return vxVarStr[number];
    case cdb::meaning::PERMISSIONS:
        return text_of_permission(number);
    case cdb::meaning::NONE_IS_65535:
    case cdb::meaning::LOCATOR:
        return number == cdb::none_of(as) ? "none" : std::to_string(number);
    case cdb::meaning::UNUSED: /* "none" and 0 both lead nowhere */
        return number == CDB_NONE ? "0" : std::to_string(number);
    default:
        return std::to_string(number);
    }
}

} // namespace compare
