/* catalogue.cpp: the catalogue while a program runs: its rows, and looking names up in them. */

#include "language/catalogue_rows.h"
#include "language/fields.h"
#include "language/same_bytes.h"

#include <bit>

namespace {

using language::rows::catalogue;

constexpr auto stanza_names = [] {
    std::array<std::string_view, SC_COUNT> names;
    for (std::size_t i = 0; i < names.size(); ++i)
        names[i] = catalogue[i].sc_name;
    return names;
}();
constexpr name_index stanza_index(SC_COUNT, [](std::size_t i) { return stanza_names[i]; });

/* The kinds of stanza that the compiler finds by index instead of by name. */
constexpr bool named(stanza_id id, std::string_view name) {
    return catalogue[id].sc_name == name;
}
static_assert(named(SC_RESOURCE_CLASS, "ResourceClass"), "ResourceClass table not found");
static_assert(named(SC_PERSISTENT_RESOURCE_ATTRIBUTE, "PersistentResourceAttribute"),
              "PersistentResourceAttribute table not found; PersistentResourceAttribute table missing");
static_assert(named(SC_PERSISTENT_CLASS_ATTRIBUTE, "PersistentClassAttribute"),
              "PersistentClassAttribute table not found");
static_assert(named(SC_DYNAMIC_RESOURCE_ATTRIBUTE, "DynamicResourceAttribute"),
              "DynamicResourceAttribute table not found");
static_assert(named(SC_DYNAMIC_CLASS_ATTRIBUTE, "DynamicClassAttribute"), "DynamicClassAttribute table not found");
static_assert(named(SC_RESOURCE_ACTION, "ResourceAction"), "Resource Action table not found");
static_assert(named(SC_CLASS_ACTION, "ClassAction"), "Class Action table not found");

/* ---- What every row must keep to; a row that does not will not compile ---------------------------------------- */

/* The bits of required and of optional attributes are in separate masks. */
constexpr bool has_bits_of_their_own(std::span<const table_attrs> attrs) {
    vx_uint32_t required = 0;
    vx_uint32_t optional = 0;
    for (const table_attrs &attr : attrs) {
        vx_uint32_t &taken = (attr.req_bit & OPTIONAL) == 0 ? required : optional;
        vx_uint32_t bit = attr.req_bit & ~OPTIONAL;
        if (!std::has_single_bit(bit) || (taken & bit) != 0)
            return false;
        taken |= bit;
    }
    return true;
}

constexpr bool fills_field_that_names_it(const srtable_ctrl &stanza, const table_attrs &attr) {
    std::size_t offset = static_cast<std::size_t>(attr.ta_offset) - language::record_start(stanza);
    return language::fills(attr, language::record_of(stanza).fact_at(offset)) != language::stores_nothing(attr);
}

consteval bool each_stanza(bool (*keeps)(const srtable_ctrl &)) {
    return std::all_of(catalogue.begin(), catalogue.begin() + SC_COUNT, keeps);
}

static_assert(each_stanza([](const srtable_ctrl &stanza) { return has_bits_of_their_own(stanza.sc_attrs); }),
              "two required or two optional attributes of a stanza share a bit");
static_assert((language::rows::required_mask(language::rows::sd_attrs) & language::rows::BITS_OF_NO_ATTRIBUTE) == 0,
              "a bit of ACTION_OUT_MASK that no attribute may have is an attribute's");
static_assert(each_stanza([](const srtable_ctrl &stanza) {
                  return std::all_of(stanza.sc_attrs.begin(), stanza.sc_attrs.end(),
                                     [&](const table_attrs &attr) { return fills_field_that_names_it(stanza, attr); });
              }),
              "an attribute is not in the `lines` of the row in format/facts.h of the field that it fills");

} // namespace

constinit const std::array<srtable_ctrl, SC_COUNT + 1> sc_tables = catalogue;

int set_table_id(std::string_view name) {
    int id = stanza_index.candidate(name);
    return id >= 0 && language::same_text(stanza_names[static_cast<std::size_t>(id)], name) ? id : -1;
}

const table_attrs *find_attr(const srtable_ctrl &scp, std::string_view name) {
    int at = scp.sc_attr_names.candidate(name);
    if (at < 0)
        return nullptr;
    const table_attrs &attr = scp.sc_attrs[static_cast<std::size_t>(at)];
    return language::same_text({attr.ta_name, attr.ta_length}, name) ? &attr : nullptr;
}
