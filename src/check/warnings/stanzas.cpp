/* warn.cpp: what the compiler takes without a word, though hardly anybody means it. */

#include "check/recovery.h"

#include <algorithm>
#include <utility>

namespace cdef::check {

namespace {

bool is_attribute_kind(int kind) {
    return kind >= 0 && sc_tables[index_of(kind)].sc_attr != nullptr;
}

bool is_attribute_run(int kind) {
    return kind == SC_PATTR_SD_DEFINITION || kind == SC_DATTR_SD_DEFINITION;
}

bool is_action_run(int kind) {
    return kind == SC_ACTION_IN_SD_DEFINITION || kind == SC_ACTION_OUT_SD_DEFINITION;
}

} // namespace

std::string_view session::value_text() const {
    return std::string_view(raw).substr(value_part(0, 0).column - 1, latest.length);
}

/* ---- Lines ---------------------------------------------------------------------------------------------------- */

void session::watch_line(const source_line &source) {
    bool whole_piece = compiler.is_cut(source) && raw.size() == LINE_MAX_CHARS;
    rest_of_line = seen.piece != 0;
    if (rest_of_line && !seen.piece_told)
        warn_at(
            LONG_LINE, {seen.piece, 0, 0}, {},
            "line of more than 253 characters: the rest is read as a line of its own, and later lines count one more");
    seen.piece_told = rest_of_line;
    seen.piece = whole_piece ? compiler.line_number() : 0;
    if (!seen.carriage_returns)
        watch_returns(source);
}

/* Where the next one stands is found once, however many lines stand before it; as the reader's marks are. */
void session::watch_returns(const source_line &source) {
    bool cut = compiler.is_cut(source);
    bool filled_anew = compiler.begins_buffer(source);
    if (cut || filled_anew || seen.next_return < source.begin) {
        const char *end = cut ? source.end : compiler.buffer_end();
        const void *found = memchr(source.begin, '\r', static_cast<size_t>(end - source.begin));
        seen.next_return = found == nullptr ? end : static_cast<const char *>(found);
    }
    const char *next = cut ? std::exchange(seen.next_return, nullptr) : seen.next_return;
    if (next >= source.end)
        return;
    auto at = static_cast<size_t>(next - source.begin);
    seen.carriage_returns = true;
    const char *where = at + 1 == raw.size() ? "carriage return at the end of a line" : "carriage return within a line";
    warn(CARRIAGE_RETURN, {compiler.line_number(), at + 1, 1},
         std::string(where) + ", which belongs to the line's text");
}

/* ---- Stanzas -------------------------------------------------------------------------------------------------- */

/* Those that the compiler itself does not look at. */
static name_list unchecked_missing(session &check) {
    int kind = check.kind;
    const srtable_ctrl &table = sc_tables[index_of(kind)];
    vx_uint32_t given = check.compiler.required_seen(kind);
    name_list names = missing_names(table, given);
    if (is_sd_kind(kind))
        return (given & ELEMENT_INDEX) == 0 && names.size() == 1 ? names : name_list();
    if (is_attribute_kind(kind) || kind == SC_CLASS_ACTION || kind == SC_RESOURCE_ACTION)
        return {};
    std::erase(names, "ResourceManager"); /* an error of its own */
    return names;
}

void session::watch_complete() {
    name_list names = unchecked_missing(*this);
    const stanza_note &stanza = stanzas[index_of(kind)];
    if (names.empty())
        return;
    std::string text = quoted(sc_tables[index_of(kind)].sc_name) + " lacks " + listed(names);
    if (!warn_at(INCOMPLETE, stanza.header, stanza.source, std::move(text)))
        return;
    if (is_sd_kind(kind))
        index_missing = stanza.header.line;
    bool unnamed = std::find(names.begin(), names.end(), "VariableClass") != names.end();
    seen.variable_class_unnamed = seen.variable_class_unnamed || unnamed;
}

void session::watch_stanza_end(int next_kind) {
    bool map_again = kind == SC_CLASS_TO_MANAGER_MAPPING && next_kind == kind; /* which is an error */
    if (kind >= 0 && !skipping && !map_again && !stanzas[index_of(kind)].broken)
        watch_complete();
    bool runs_on = next_kind >= 0 && is_attribute_run(next_kind);
    bool reported = seen.sd_attribute.line == 0;
    if (reported || runs_on) {
        seen.sd_run = seen.sd_run || runs_on;
        return;
    }
    if (!seen.sd_run && out.errors == 0)
        warn_at(SD_WITHOUT_RUN, seen.sd_attribute, seen.sd_source,
                "attribute of structured data without elements: it has no value");
    if (seen.sd_run && line.line == nullptr && compiler.run_makes_value())
        warn_at(SD_RUN_AT_END, seen.sd_attribute, seen.sd_source,
                "the elements end the file: the attribute is completed before them and has no value");
    seen.sd_attribute = {};
    seen.sd_run = false;
}

void session::watch_header(int new_kind) {
    bool begins_run = is_sd_kind(new_kind) && (!compiler.run_is_open() || kind != new_kind);
    if (begins_run)
        seen.known[index_of(new_kind)].names.clear();
    if (begins_run && is_action_run(new_kind) && !owner_lost && !compiler.is_open(SC_RESOURCE_ACTION) &&
        !compiler.is_open(SC_CLASS_ACTION))
        warn(STRAY_RUN, all_of_line(), "no action is open: these elements belong to nothing");
    if (new_kind != SC_CONTROL_DEFINITION || !compiler.class_is_open())
        return;
    for (int each : {SC_PERSISTENT_RESOURCE_ATTRIBUTE, SC_PERSISTENT_CLASS_ATTRIBUTE, SC_DYNAMIC_RESOURCE_ATTRIBUTE,
                     SC_DYNAMIC_CLASS_ATTRIBUTE}) {
        if (compiler.is_open(each) && !class_forged && !stanzas[index_of(each)].broken)
            warn(CUT_SHORT, all_of_line(),
                 "a second class ends the latest " + quoted(sc_tables[index_of(each)].sc_name) +
                     " unchecked and without its defaults",
                 {stanzas[index_of(each)].header, "begun here"});
    }
    for (known_values &known : seen.known) {
        known.names.clear();
        known.ids.clear();
    }
}

/* In place: this is done for each attribute and element. */
void session::note_type(std::string_view text) {
    mention &type = stanzas[index_of(kind)].data_type;
    type.at = value_part(0, text.size());
    type.text = text;
    type.source = raw;
}

/* ---- Attributes ----------------------------------------------------------------------------------------------- */

void session::watch_permission(std::string_view text, const place &at) {
    bool known = std::any_of(std::begin(perm_list), std::end(perm_list),
                             [&](const valid_perms_t &each) { return each.permission == text[0]; });
    if (!known)
        warn(PERMISSION, at, "no permission has this letter, so that none is needed",
             {at, "the letters are q, l, e, v, d, c, s, o, a and x"});
    else if (text.size() > 1)
        warn(PERMISSION, at, "only the first letter of a Permission counts");
}

/* Where the element's default is asked for, the compiler may refuse the type at the run's end. */
void session::watch_element_type(std::string_view text, const place &at) {
    bool unknown = compiler.data_type() == VX_UNKNOWN;
    note_type(text);
    if (compiler.run_makes_value() && (unknown || text == "SBS"))
        odd_elements.push_back({at, std::string(text), raw});
    else if (unknown)
        warn(ELEMENT_TYPE, at, "unknown data type: the element gets none", {at, language::type_suggestion(text, true)});
}

void session::watch_attribute() {
    const table_attrs &attr = *latest.attr;
    std::string_view text = value_text();
    place at = value_part(0, latest.length);
    watch_quotes();
    if (stanzas[index_of(kind)].misplaced)
        return; /* the value may be another attribute's */
    watch_numbers();
    switch (attr.ta_type) {
    case AT_STRING:
    case AT_SD_NAME:
        return watch_name();
    case AT_LOCATOR:
        seen.locator = mention{at, std::string(text), raw};
        return;
    case AT_RANGE:
        return watch_range();
    case AT_DEFAULT_VALUE:
        if (kind == SC_PERSISTENT_CLASS_ATTRIBUTE)
            warn(UNUSED_DEFAULT, here(mark_kind::name),
                 "the default of a class attribute is that of its type: this one is never used");
        return;
    case AT_PERMISSION:
        return watch_permission(text, at);
    case AT_DATA_TYPE:
        note_type(text);
        if (scalar_vx(compiler.data_type()) == VX_SD_PTR) {
            seen.sd_attribute = stanzas[index_of(kind)].header;
            seen.sd_source = stanzas[index_of(kind)].source;
            seen.sd_run = false;
        }
        return;
    case AT_SD_DATA_TYPE:
        return watch_element_type(text, at);
    default:
        return;
    }
}

/* ---- Names, ranges, quotes ------------------------------------------------------------------------------------ */

void session::watch_name() {
    std::string_view text = value_text();
    place at = value_part(0, latest.length);
    std::string_view attr = latest.attr->ta_name;
    if (attr == "VariableClass" && kind == SC_RESOURCE_VARIABLE_CLASS)
        seen.defined_variable_classes.of(text) = compiler.line_number();
    if (attr == "VariableClass" && kind != SC_RESOURCE_VARIABLE_CLASS)
        watch_variable_class(text, at);
    known_values &known = seen.known[index_of(kind)];
    if ((attr == "Name" || attr == "ElementName") && kind != SC_RESOURCE_CLASS)
        watch_first(SAME_NAME, known.names.of(text), at, "name");
}

void session::watch_variable_class(std::string_view text, const place &at) {
    int &first = seen.variable_class_names.of(text);
    if (first == 0)
        seen.variable_classes.push_back({at, std::string(text), raw});
    first = compiler.line_number();
}

void session::watch_first(warning_id id, int &first, const place &at, const char *what) {
    if (first != 0)
        warn(id, at, "another " + quoted(sc_tables[index_of(kind)].sc_name) + " has the same " + what,
             {{first, 0, 0}, "first given here"});
    else
        first = compiler.line_number();
}

void session::watch_range() {
    place at = here(mark_kind::text);
    if (!is_numeric(compiler.data_type()))
        return;
    if (kind == SC_DYNAMIC_CLASS_ATTRIBUTE && compiler.is_open(SC_DYNAMIC_RESOURCE_ATTRIBUTE))
        warn(RANGE_ELSEWHERE, at, "this Range goes to the `DynamicResourceAttribute` that is still open",
             {stanzas[SC_DYNAMIC_RESOURCE_ATTRIBUTE].header, "begun here"});
    else
        seen.ranges.push_back({at, kind, raw});
}

/* After what may have completed dynamic attributes: the completion of either kind settles all ranges. */
void session::ranges_settled(bool resource_was_open, bool class_was_open, int next_kind) {
    bool of_resource = resource_was_open &&
                       (next_kind == SC_DYNAMIC_RESOURCE_ATTRIBUTE || !compiler.is_open(SC_DYNAMIC_RESOURCE_ATTRIBUTE));
    bool of_class =
        class_was_open && (next_kind == SC_DYNAMIC_CLASS_ATTRIBUTE || !compiler.is_open(SC_DYNAMIC_CLASS_ATTRIBUTE));
    if ((!of_resource && !of_class) || next_kind == SC_CONTROL_DEFINITION)
        return;
    int completed = of_resource ? SC_DYNAMIC_RESOURCE_ATTRIBUTE : SC_DYNAMIC_CLASS_ATTRIBUTE;
    bool lost = may_be_lost(SC_DYNAMIC_RESOURCE_ATTRIBUTE) || may_be_lost(SC_DYNAMIC_CLASS_ATTRIBUTE);
    for (const pending_range &range : seen.ranges)
        if (range.kind != completed && !lost)
            warn_at(RANGE_ELSEWHERE, range.at, range.source,
                    "this Range is lost: a " + quoted(sc_tables[index_of(completed)].sc_name) + " is completed first",
                    {stanzas[index_of(completed)].header, "begun here"});
    seen.ranges.clear();
}

void session::watch_quotes() {
    size_t begin = value_part(0, 0).column - 1;
    if (begin == 0 || raw[begin - 1] != '"')
        return;
    std::string_view text = value_text();
    for (size_t at = text.find('"'); at != std::string_view::npos; at = text.find('"', at + 1))
        if (at == 0 || text[at - 1] != '\\') {
            warn(TEXT_AFTER_QUOTE, value_part(at, text.size() - at),
                 "a value ends with its last quote: this one and what follows belong to it");
            return;
        }
}

/* ---- The end of the source ------------------------------------------------------------------------------------ */

void session::watch_variable_classes() {
    constexpr size_t SEARCHED_MAX = 1'000'000; /* names that are compared, for the work not to be quadratic */
    name_list defined = seen.defined_variable_classes.all();
    size_t searched = 0;
    for (const mention &named : seen.variable_classes) {
        if (seen.defined_variable_classes.has(named.text))
            continue;
        bool search = (searched += defined.size()) <= SEARCHED_MAX;
        warn_at(UNKNOWN_VARIABLE_CLASS, named.at, named.source, "no `ResourceVariableClass` has this name",
                {named.at, search ? suggestion(named.text, defined) : std::string()});
    }
}

/* What names something is looked at only if everything that could be named has been read. */
void session::watch_end() {
    if (out.errors > 0)
        return;
    const first_lines &attributes = seen.known[SC_PERSISTENT_RESOURCE_ATTRIBUTE].names;
    if (seen.locator && !attributes.has(seen.locator->text))
        warn_at(UNKNOWN_LOCATOR, seen.locator->at, seen.locator->source,
                "no `PersistentResourceAttribute` has this name",
                {seen.locator->at, suggestion(seen.locator->text, attributes.all())});
    if (!seen.variable_class_unnamed)
        watch_variable_classes();
}

} // namespace cdef::check
