/* typed.cpp: names, facts and values of compared databases as JSON. */

#include "cdef/diff/typed.h"

#include "compare/identity.h"

#include <utility>

namespace cdef::diff {

namespace {

using compare::node_kind;
using compare::owned_value;
using compare::shape;

/* A reference in a field that no compiled file uses may be "none" or 0, which are equal. */
facts::fact fact_of_number(std::uint32_t number, cdb::meaning as) {
    if (as == cdb::meaning::UNUSED && number == CDB_NONE)
        return std::uint64_t{0};
    return facts::fact_of(as, number);
}

} // namespace

void typed_values::append(const facts::fact &f) {
    facts::append_json(made, f);
}

void typed_values::append_text(std::string_view text) {
    left.spend(text.size());
    append(facts::any_text{text});
}

void typed_values::append_element_of_structure(const owned_value &element) {
    made += "{\"data_type\": ";
    append(facts::word{std::string(cdb::name_of(element.value.type()))});
    made += ", \"value\": ";
    append_value(element);
    made += '}';
}

void typed_values::append_elements(const owned_value &value, std::size_t count) {
    bool is_structure = value.value.type() == VX_SD_PTR;
    made += '[';
    for (std::size_t i = 0; i < count; ++i) {
        made += i == 0 ? "" : ", ";
        if (is_structure)
            append_element_of_structure(element_of(value, i));
        else
            append_value(element_of(value, i));
    }
    made += ']';
}

void typed_values::append_value(const owned_value &value) {
    compare::look seen = look_at(value);
    switch (seen.is) {
    case shape::NOTHING:
        return append(facts::none{});
    case shape::MISPLACED:
        made.append("{\"misplaced\": ").append(seen.number.text()).append("}");
        return;
    case shape::TEXT:
        return append_text(seen.bytes);
    case shape::BINARY:
        left.spend(seen.bytes.size());
        [[fallthrough]];
    case shape::NUMBER:
    case shape::HANDLE:
        return append(facts::fact_of(value.value));
    case shape::ARRAY:
    case shape::STRUCTURE:
        return append_elements(value, seen.count);
    }
}

void typed_values::append_pair(const owned_value &low, const owned_value &high) {
    if (read_alike(low, high))
        return append_value(low);
    made += "{\"low\": ";
    append_value(low);
    made += ", \"high\": ";
    append_value(high);
    made += '}';
}

void typed_values::append_name(const compare::node &n) {
    std::uint64_t number = identity_of(n).number;
    switch (n.kind) {
    case node_kind::valid_value:
        return append_pair(valid_value_in(n, offsetof(vv_entry_t, vv_low_val)),
                           valid_value_in(n, offsetof(vv_entry_t, vv_high_val)));
    case node_kind::variety:
        made +=
            "{\"low\": " + std::to_string(number >> 32) + ", \"high\": " + std::to_string(number & 0xFFFFFFFF) + "}";
        return;
    case node_kind::class_variable:
        return append(number & ~std::uint64_t{VAR_ID_CLASS_ATTR});
    case node_kind::variable:
    case node_kind::dependency:
    case node_kind::hash_block:
        return append(number);
    default:
        break;
    }
    if (n.format == nullptr || n.format->name == nullptr)
        return append(facts::none{});
    append_text(text_in(n, *n.format->name));
}

std::string typed_values::of_name(const compare::node &n) {
    append_name(n);
    return std::exchange(made, {});
}

std::string typed_values::of_fact(const compare::fact &f) {
    if (const auto *number = std::get_if<std::uint32_t>(&f.is))
        append(fact_of_number(*number, f.what->as));
    else if (const auto *value = std::get_if<owned_value>(&f.is))
        append_value(*value);
    else if (std::string_view text = std::get<std::string_view>(f.is); text.empty())
        append(facts::none{});
    else
        append_text(text);
    return std::exchange(made, {});
}

std::optional<std::string_view> type_of(const compare::fact &f) {
    const auto *value = std::get_if<owned_value>(&f.is);
    return value == nullptr ? std::nullopt : std::optional(cdb::name_of(value->value.type()));
}

} // namespace cdef::diff
