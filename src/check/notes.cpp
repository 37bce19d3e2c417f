/* notes.cpp: notes that help to understand an error. */

#include "check/notes.h"

#include "check/edits.h"
#include "check/meant.h"
#include "check/numbers.h"
#include "check/value_notes.h"
#include "format/data_types.h"
#include "format/names.h"
#include "language/names.h"

#include <algorithm>
#include <cstdlib>
#include <optional>
#include <utility>
#include <vector>

namespace check {

namespace {

using language::listed;
using language::quoted;
using language::suggestion;

mention header_of(const stanza_record &stanza) {
    return {stanza.header, {}, stanza.source};
}

/* An error to which notes are added. */
struct noting {
    const view &see;
    finding &found;
    int kind; /* of the stanza at fault */

    void add(const place &at, std::string text) {
        found.notes.push_back({at, std::move(text)});
    }
    void add_here(std::string text) {
        add(found.at, std::move(text));
    }
    /* Shows the line, for an error in another line or without a line. */
    void show(const mention &shown, std::string text) {
        bool is_shown = shown.at.line == found.at.line && found.at.column != 0;
        found.notes.push_back({shown.at, std::move(text), is_shown ? "" : shown.source});
    }
    /* The correction replaces the marked part by what was meant. */
    void replace(const language::guess &meant) {
        found.fix = see.line.renamed(found.at, found.source, meant);
    }
    /* Adds to the correction: the type that was meant replaces an element's type. */
    void replace_type(const mention &given) {
        check::add(found.fix, see.line.renamed(given.at, given.source, language::type_meant_by(given.text, true)));
    }
    void suggest(std::string_view given, const language::name_list &names) {
        language::guess meant = language::meant_by(given, names);
        add_here(suggestion(meant, names));
        replace(meant);
    }
    void first_given(int line) {
        if (line != 0)
            add({line, 0, 0}, "first given here");
    }
    void show_missing() {
        show(header_of(stanza()), "this " + kind_name() + " lacks " + listed(missing()));
    }

    std::string kind_name() const {
        return quoted(table_of(kind).sc_name);
    }
    const stanza_record &stanza() const {
        return see.known.stanzas[index_of(kind)];
    }
    language::name_list missing() const {
        return see.compiler.missing(kind);
    }
    std::string marked() const {
        return std::string(see.line.at(found.at));
    }
};

/* The only kind that has the attribute. */
std::string belongs_to(const kind_set &kinds) {
    int kind = 0;
    while (!kinds.test(index_of(kind)))
        ++kind;
    return "it is an attribute of " + quoted(table_of(kind).sc_name) + ", whose header may be missing";
}

void no_stanza(noting &n) {
    std::string text = n.marked();
    kind_set kinds = language::kinds_with(std::string_view(text).substr(0, text.find('=')));
    if (kinds.count() == 1)
        n.add_here(belongs_to(kinds));
}

void unknown_name(noting &n) {
    std::string given = n.marked();
    const srtable_ctrl &table = table_of(n.kind);
    std::string_view trimmed = std::string_view(given).substr(0, given.find_last_not_of(" \t") + 1);
    kind_set others = language::kinds_with(given);
    language::guess meant = attribute_meant(n.see.known, n.kind, trimmed);
    if (meant.names.empty() && others.count() == 1)
        return n.add_here(belongs_to(others));
    if (trimmed.size() < given.size() && !meant.names.empty())
        n.add_here("blanks in front of the = belong to the name");
    if (meant.name() != trimmed)
        n.add_here(suggestion(meant, language::attribute_names(table)));
    n.replace(meant);
}

void too_early(noting &n) {
    if (n.kind == SC_ACTION_OUT_SD_DEFINITION)
        n.add(n.stanza().header, "`ActionOutSDDefinition` takes its five required attributes only");
    else
        n.add(n.stanza().header, "this stanza's " + listed(n.missing()) + " must come first");
}

void repeated(noting &n) {
    auto at = static_cast<size_t>(&n.see.attr() - table_of(n.kind).sc_attrs.data());
    n.first_given(n.stanza().given[at]);
}

void no_sd_attribute(noting &n) {
    n.add_here("it must directly follow an attribute whose DataType is `SD` or `SDArray`");
}

void incomplete(noting &n) {
    n.show_missing();
}

void no_class(noting &n) {
    n.add_here("`ControlDefinition` begins a class and must come first");
}

void second_map(noting &n) {
    n.first_given(n.see.known.map_line);
}

void unknown_property(noting &n) {
    n.suggest(n.marked(), language::property_names(n.see.attr().ta_type));
}

void unknown_type(noting &n) {
    n.add_here(language::type_suggestion(n.marked(), false));
    n.replace(language::type_meant_by(n.marked(), false));
}

void unknown_variable_type(noting &n) {
    n.suggest(n.marked(), language::variable_type_names());
}

void overflowed(noting &n) {
    n.add({n.see.known.overflow_line, 0, 0},
          "the number that overflows here makes later ones that are 0, or the limit of their type, invalid");
}

void unknown_element_type(noting &n, const mention &given) {
    n.add(given.at, "unknown data type: " + language::type_suggestion(given.text, true));
    n.replace_type(given);
}

void bad_value(noting &n) {
    vx_data_type_t type = n.see.compiler.data_type();
    const mention &given_type = n.stanza().data_type;
    if (is_numeric(type) && n.see.known.overflow_line != 0)
        overflowed(n);
    else if (type == VX_UNKNOWN)
        unknown_element_type(n, given_type);
    else
        n.add_here(value_note(n.see.attr(), type, n.see.value()));
}

void no_equals(noting &n) {
    if (n.kind >= 0)
        n.add_here(no_equals_note(table_of(n.kind), n.marked()));
}

/* The quote is not the last character if a carriage return follows. */
void open_quote(noting &n) {
    std::optional<edit> removal = n.see.line.without_returns();
    if (!removal || !n.see.line.whole().ends_with("\"" + removal->removed))
        return n.add_here(open_quote_note(n.marked()));
    n.add_here("the line ends with a carriage return, which belongs to the value");
    n.found.fix = {certainty::certain, {std::move(*removal)}};
}

void no_value(noting &n) {
    std::string_view line = n.see.line.raw;
    n.add_here(no_value_note(n.see.attr(), line.substr(std::min(line.find('='), line.size() - 1) + 1)));
}

void wrong_varieties(noting &n) {
    n.add_here(variety_note(n.see.value()));
}

void one_bound(noting &n) {
    n.add_here("write both bounds with a comma between them: `Range=low,high`");
}

void value_of_structure(noting &n) {
    n.add_here("remove this line: the value is made of the defaults of the elements' types, and an element takes no "
               "`DefaultValue` either");
}

void value_of_element(noting &n) {
    n.add_here("remove this line: an element has the default of its type");
}

void no_class_at_all(noting &n) {
    n.add_here("begin the source with a `ControlDefinition`");
}

void no_map(noting &n) {
    n.add_here("add a `ClassToManagerMapping`, which names the resource manager of the class");
}

bool is_expected_index(const view &see) {
    std::string text(see.value());
    return std::strtoll(text.c_str(), nullptr, 10) == see.compiler.expected_index();
}

std::string expected_index(const view &see) {
    return "expected is " + std::to_string(see.compiler.expected_index());
}

void wrong_index(noting &n) {
    if (n.see.known.overflow_line != 0 && is_expected_index(n.see))
        overflowed(n);
    else if (n.found.at.line == n.see.line.number)
        n.add_here(expected_index(n.see));
    for (const mention &header : n.see.known.run.without_index)
        n.show(header, "this " + n.kind_name() + " lacks `ElementIndex`");
}

void bad_default(noting &n) {
    constexpr const char *NO_SBS = "only elements of inputs and responses can be of type `SBS`: choose another type";
    if (!is_sd_kind(n.kind))
        return n.show(n.stanza().data_type, NO_SBS);
    for (const mention &odd : n.see.known.run.odd_types) {
        n.show(odd, odd.text == "SBS" ? NO_SBS : "unknown data type: " + language::type_suggestion(odd.text, true));
        n.replace_type(odd);
    }
}

void no_manager(noting &n) {
    n.kind = SC_CLASS_TO_MANAGER_MAPPING;
    n.show(header_of(n.stanza()), "this `ClassToManagerMapping` lacks `ResourceManager`");
}

void keys(noting &n) {
    n.kind = SC_CLASS_TO_MANAGER_MAPPING;
    if (const mention *first = map_value(n.see.known, "FirstKey");
        first != nullptr && first->at.line != n.found.at.line)
        n.show(*first, "the first key");
    if (const mention *last = map_value(n.see.known, "LastKey"))
        n.show(*last, "the last key, which may not be less: swap the two");
    else
        n.show_missing();
}

void invalid_output(noting &n) {
    const stanza_record &stanza = n.see.known.class_stanza();
    n.show({stanza.header, {}, stanza.source}, "this class has no `Name`, and is called after its database");
}

struct notes_of {
    message_id id;
    void (*add)(noting &);
};

constexpr notes_of table[] = {
    {MSG_NO_STANZA, no_stanza},
    {MSG_NO_EQUALS, no_equals},
    {MSG_UNMATCHED_QUOTES, open_quote},
    {MSG_UNKNOWN_ATTRIBUTE, unknown_name},
    {MSG_NO_VALUE, no_value},
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
    {MSG_INVALID_VARIETY, wrong_varieties},
    {MSG_TOO_MANY_VARIETIES, wrong_varieties},
    {MSG_RANGE_NEEDS_TWO, one_bound},
    {MSG_INVALID_VALUE, bad_value},
    {MSG_SD_DEFAULT, value_of_structure},
    {MSG_ELEMENT_DEFAULT, value_of_element},
    {MSG_INDEX_NOT_CONSECUTIVE, wrong_index},
    {MSG_SBS_TYPE, bad_default},
    {MSG_NO_ELEMENT_DEFAULT, bad_default},
    {MSG_NO_ELEMENT_INITIAL, bad_default},
    {MSG_NO_CLASSES, no_class_at_all},
    {MSG_NO_MAPS, no_map},
    {MSG_NO_MANAGER, no_manager},
    {MSG_KEYS_REVERSED, keys},
    {MSG_INVALID_OUTPUT_NAME, invalid_output},
};

} // namespace

void add_notes(finding &found, const fatal_exit &failure, int kind, const view &see) {
    noting n = {see, found, kind};
    for (const notes_of &each : table)
        if (each.id == failure.id)
            each.add(n);
}

bool blames_overflow(const fatal_exit &failure, const view &see) {
    if (see.known.overflow_line == 0)
        return false;
    if (failure.id == MSG_INDEX_NOT_CONSECUTIVE)
        return is_expected_index(see);
    return failure.id == MSG_INVALID_VALUE && is_numeric(see.compiler.data_type());
}

/* ---- Where an error's cause is ---------------------------------------------------------------------------------- */

namespace {

/* An index that is wrong only because elements before it have none: the first of them. */
std::optional<mention> element_without_index(const view &see) {
    const std::vector<mention> &without = see.known.run.without_index;
    long left_out = see.compiler.element_index() - long{see.compiler.expected_index()};
    if (without.empty() || left_out != static_cast<long>(without.size()))
        return std::nullopt;
    return without.front();
}

/* The DataType that is unknown, or that cannot be used in its place. */
std::optional<mention> wrong_type(int kind, const view &see) {
    const std::vector<mention> &odd = see.known.run.odd_types;
    if (is_sd_kind(kind) && !odd.empty())
        return odd.front();
    return is_sd_kind(kind) ? std::nullopt : std::optional(see.known.stanzas[index_of(kind)].data_type);
}

std::optional<mention> unknown_type_of_value(int kind, const view &see) {
    bool overflow = is_numeric(see.compiler.data_type()) && see.known.overflow_line != 0;
    if (overflow || see.compiler.data_type() != VX_UNKNOWN)
        return std::nullopt;
    return see.known.stanzas[index_of(kind)].data_type;
}

std::optional<mention> reversed_key(const view &see) {
    const mention *first = map_value(see.known, "FirstKey");
    if (first == nullptr || map_value(see.known, "LastKey") == nullptr)
        return header_of(see.known.stanzas[SC_CLASS_TO_MANAGER_MAPPING]);
    return *first;
}

} // namespace

std::optional<mention> cause_of(const fatal_exit &failure, int kind, const view &see) {
    switch (failure.id) {
    case MSG_INDEX_NOT_CONSECUTIVE:
        return element_without_index(see);
    case MSG_INVALID_VALUE:
        return unknown_type_of_value(kind, see);
    case MSG_SBS_TYPE:
    case MSG_NO_ELEMENT_DEFAULT:
    case MSG_NO_ELEMENT_INITIAL:
        return wrong_type(kind, see);
    case MSG_NO_MANAGER:
        return header_of(see.known.stanzas[SC_CLASS_TO_MANAGER_MAPPING]);
    case MSG_KEYS_REVERSED:
        return reversed_key(see);
    default:
        return std::nullopt;
    }
}

std::string stops_here(const fatal_exit &failure, const view &see) {
    std::string text = "the compiler stops here";
    return failure.id == MSG_INDEX_NOT_CONSECUTIVE ? text + ": " + expected_index(see) : text;
}

const mention *map_value(const knowledge &known, std::string_view attribute) {
    auto found = std::find_if(known.map_values.begin(), known.map_values.end(),
                              [&](const mention &each) { return each.text == attribute; });
    return found == known.map_values.end() ? nullptr : &*found;
}

} // namespace check
