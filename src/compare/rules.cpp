/* rules.cpp: the rules of compatibility. */

#include "compare/rules.h"

#include <algorithm>
#include <array>
#include <iterator>

namespace compare {

namespace {

using enum level;

constexpr breach_rule rows[] = {
    {breach::GONE, "CMP101", READERS, "a class, attribute or action is gone or renamed", "readers miss it"},
    {breach::NUMBER, "CMP102", READERS, "the `Id` of an attribute or action changed", "readers know it by its number"},
    {breach::NUMBER_TAKEN, "CMP103", READERS, "an attribute or action takes an `Id` in use",
     "readers know another one by its number"},
    {breach::TYPE, "CMP104", READERS, "the data type of an attribute or element changed", "values of another type"},
    {breach::LAYOUT, "CMP105", READERS, "an element is gone or new, or has another index",
     "another layout of the structure"},
    {breach::NEW_REQUIRED, "CMP201", CLIENTS, "a new attribute is `ReqdForDefine`", "clients do not give it"},
    {breach::NOW_REQUIRED, "CMP202", CLIENTS, "an attribute becomes `ReqdForDefine`", "clients may leave it out"},
    {breach::VALUE_GONE, "CMP203", CLIENTS, "a valid value is gone", "clients may use the value"},
    {breach::VALUES_LIMITED, "CMP204", CLIENTS, "an attribute or element without valid values gets some",
     "clients may use other values"},
    {breach::VARIETY_GONE, "CMP205", CLIENTS, "a variety is gone", "clients may use the variety"},
    {breach::PROPERTY_GONE, "CMP206", CLIENTS, "a property is gone", "clients may rely on the property"},
    {breach::READ_ONLY, "CMP207", CLIENTS, "an attribute becomes `ReadOnly`", "clients may set it"},
    {breach::RANGE_NARROWER, "CMP208", CLIENTS, "a range becomes narrower", "clients may use values outside"},
    {breach::PERMISSION, "CMP209", CLIENTS, "an action or class needs another permission",
     "clients may lack the permission"},
    {breach::STORED_NAME, "CMP301", STORED, "an `Id` is used again for another name",
     "stored values are those of another name"},
    {breach::STORED_KIND, "CMP302", STORED, "an `Id` is used again for another kind of attribute",
     "stored values are those of another kind"},
    {breach::STORED_TYPE, "CMP303", STORED, "an `Id` is used again for another type",
     "stored values are those of another type"},
};

constexpr bool rows_are_in_order() {
    for (std::size_t i = 0; i < std::size(rows); ++i)
        if (rows[i].is != static_cast<breach>(i))
            return false;
    return std::size(rows) == static_cast<std::size_t>(breach::COUNT);
}
static_assert(rows_are_in_order());

} // namespace

std::string_view name_of(level l) {
    constexpr std::array<std::string_view, 3> names = {"readers", "clients", "stored"};
    return names[static_cast<std::size_t>(l)];
}

std::span<const breach_rule> breach_rules() {
    return rows;
}

const breach_rule &rule_of(breach b) {
    return rows[static_cast<std::size_t>(b)];
}

} // namespace compare
