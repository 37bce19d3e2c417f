/* notes.cpp: what helps to understand an error: the name that was meant, where a thing was first given, what
 * is missing. */

#include "check/recovery.h"

#include <bit>
#include <cstdlib>

namespace cdef::check {

namespace {

const char *form_of(vx_data_type_t type) {
    switch (scalar_vx(type)) {
    case VX_INT32:
    case VX_INT64:
        return "a decimal integer";
    case VX_UINT32:
    case VX_UINT64:
        return "a decimal integer without a sign";
    case VX_FLOAT32:
    case VX_FLOAT64:
        return "a floating point number";
    case VX_BINARY_PTR:
        return "0x and pairs of hexadecimal digits";
    case VX_CHAR_PTR:
        return "a text that is not empty";
    default:
        return "no value that could be written";
    }
}

/* One error while its notes are added. */
struct noting {
    session &check;
    finding &found;
    const fatal_exit &failure;
    int kind; /* of the stanza at fault; -1: none */

    void add(const place &at, std::string text) {
        found.notes.push_back({at, std::move(text)});
    }
    /* For an error without a place of its own: the line is shown. */
    void show(const mention &shown, std::string text) {
        found.notes.push_back({shown.at, std::move(text), shown.source});
    }
    mention header() const {
        return {stanza().header, {}, stanza().source};
    }
    void first_given(int line) {
        if (line != 0)
            add({line, 0, 0}, "first given here");
    }
    const srtable_ctrl &table() const {
        return sc_tables[index_of(kind)];
    }
    const stanza_note &stanza() const {
        return check.stanzas[index_of(kind)];
    }
    name_list missing() const {
        return missing_names(table(), check.compiler.required_seen(kind));
    }
    std::string marked() const {
        return check.raw.substr(found.at.column - 1, found.at.length);
    }
};

/* The only kind that has the attribute. */
std::string belongs_to(vx_uint32_t kinds) {
    const char *name = sc_tables[static_cast<size_t>(std::countr_zero(kinds))].sc_name;
    return "it is an attribute of " + quoted(name) + ", whose header may be missing";
}

void no_stanza(noting &n) {
    std::string text = n.marked();
    vx_uint32_t kinds = kinds_with(std::string_view(text).substr(0, text.find('=')));
    if (std::has_single_bit(kinds))
        n.add(n.found.at, belongs_to(kinds));
}

void unknown_name(noting &n) {
    std::string given = n.marked();
    if (given.ends_with(' ') || given.ends_with('\t'))
        if (find_attr(n.table(), std::string_view(given).substr(0, given.find_last_not_of(" \t") + 1)) != nullptr)
            return n.add(n.found.at, "blanks in front of the = belong to the name");
    vx_uint32_t others = kinds_with(given);
    name_list known = attribute_names(n.table());
    if (near_miss(given, known).empty() && std::has_single_bit(others))
        n.add(n.found.at, belongs_to(others));
    else
        n.add(n.found.at, suggestion(given, known));
}

void too_early(noting &n) {
    if (n.kind == SC_ACTION_OUT_SD_DEFINITION)
        n.add(n.stanza().header, "`ActionOutSDDefinition` takes its five required attributes only");
    else
        n.add(n.stanza().header, "this stanza's " + listed(n.missing()) + " must come first");
}

void repeated(noting &n) {
    auto at = static_cast<size_t>(n.check.latest.attr - n.table().sc_attrs.data());
    n.first_given(n.stanza().given[at]);
}

void no_sd_attribute(noting &n) {
    n.add(n.found.at, "it must follow an attribute whose DataType is `SD` or `SDArray` at once");
}

void incomplete(noting &n) {
    n.show(n.header(), "this " + quoted(n.table().sc_name) + " lacks " + listed(n.missing()));
}

void no_class(noting &n) {
    n.add(n.found.at, "`ControlDefinition` begins a class, and must stand in front");
}

void second_map(noting &n) {
    n.first_given(n.check.map_line);
}

void unknown_property(noting &n) {
    n.add(n.found.at, suggestion(n.marked(), property_names(n.check.latest.attr->ta_type)));
}

void unknown_type(noting &n) {
    n.add(n.found.at, language::type_suggestion(n.marked(), false));
}

void unknown_variable_type(noting &n) {
    n.add(n.found.at, suggestion(n.marked(), language::variable_type_names()));
}

void overflowed(noting &n) {
    n.add({n.check.overflow_line, 0, 0},
          "the number that overflows here makes later ones that are 0, or the limit of their type, invalid");
    n.check.overflow_told = true;
}

void bad_value(noting &n) {
    session &check = n.check;
    vx_data_type_t type = check.compiler.data_type();
    bool numeric = scalar_vx(type) >= VX_INT32 && scalar_vx(type) <= VX_FLOAT64;
    if (numeric && check.overflow_line != 0)
        overflowed(n);
    else if (type == VX_UNKNOWN)
        n.add(n.stanza().data_type.at,
              "unknown data type: " + language::type_suggestion(n.stanza().data_type.text, true));
    else
        n.add(n.found.at, quoted(vxTypeStr[type]) + " takes " + form_of(type));
}

void wrong_index(noting &n) {
    session &check = n.check;
    int expected = check.compiler.expected_index();
    bool as_expected = std::strtol(n.marked().c_str(), nullptr, 10) == expected;
    if (check.overflow_line != 0 && as_expected)
        overflowed(n);
    else
        n.add(n.found.at, "expected is " + std::to_string(expected));
    if (check.index_missing != 0)
        n.add({check.index_missing, 0, 0}, "this " + quoted(n.table().sc_name) + " lacks `ElementIndex`");
}

void bad_default(noting &n) {
    if (!is_sd_kind(n.kind))
        n.show(n.stanza().data_type, "the DataType of this " + quoted(n.table().sc_name));
    else
        for (const mention &odd : n.check.odd_elements)
            n.show(odd, odd.text == "SBS" ? "the element's DataType" : language::type_suggestion(odd.text, true));
}

void no_manager(noting &n) {
    n.kind = SC_CLASS_TO_MANAGER_MAPPING;
    n.show(n.header(), "this `ClassToManagerMapping` lacks `ResourceManager`");
}

void keys(noting &n) {
    n.kind = SC_CLASS_TO_MANAGER_MAPPING;
    for (const char *key : {"FirstKey", "LastKey"})
        if (const mention *given = n.check.map_value(key))
            n.show(*given, given->text + " is given here");
        else
            incomplete(n);
}

struct noting_of {
    message_id id;
    void (*add)(noting &);
};

constexpr noting_of notings[] = {
    {MSG_NO_STANZA, no_stanza},
    {MSG_UNKNOWN_ATTRIBUTE, unknown_name},
    {MSG_OPTIONAL_TOO_EARLY, too_early},
    {MSG_REPEATED_ATTRIBUTE, repeated},
    {MSG_NO_SD_ATTRIBUTE, no_sd_attribute},
    {MSG_INCOMPLETE_STANZA, incomplete},
    {MSG_NO_CLASS_FOR_PATTR, no_class},
    {MSG_NO_CLASS_FOR_PATTR_C, no_class},
    {MSG_NO_CLASS_FOR_DATTR, no_class},
    {MSG_NO_CLASS_FOR_ACTION, no_class},
    {MSG_NO_CLASS_FOR_SD, no_class},
    {MSG_NO_STRING_TABLE, no_class},
    {MSG_SECOND_MAP, second_map},
    {MSG_INVALID_PROPERTY, unknown_property},
    {MSG_INVALID_DATA_TYPE, unknown_type},
    {MSG_INVALID_VARIABLE_TYPE, unknown_variable_type},
    {MSG_INVALID_VALUE, bad_value},
    {MSG_INDEX_NOT_CONSECUTIVE, wrong_index},
    {MSG_SBS_TYPE, bad_default},
    {MSG_NO_ELEMENT_DEFAULT, bad_default},
    {MSG_NO_ELEMENT_INITIAL, bad_default},
    {MSG_NO_MANAGER, no_manager},
    {MSG_KEYS_REVERSED, keys},
};

} // namespace

void session::add_notes(finding &found, const fatal_exit &failure, int failed_kind) {
    noting n = {*this, found, failure, failed_kind};
    for (const noting_of &each : notings)
        if (each.id == failure.id)
            each.add(n);
}

} // namespace cdef::check
