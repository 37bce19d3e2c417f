/* completion.cpp: what may be written at a place. */

#include "server/completion.h"

#include "format/names.h"
#include "index/expressions.h"
#include "language/expressions.h"
#include "language/names.h"
#include "server/documentation.h"
#include "server/examples.h"
#include "server/places.h"
#include "text/hex.h"

#include <algorithm>
#include <set>

namespace lsp {

namespace {

using source_index::name_kind;
using source_index::stanza;

/* Kinds of items, as the protocol numbers them. */
constexpr int PROPERTY = 10;
constexpr int VALUE = 12;
constexpr int ENUM_MEMBER = 20;
constexpr int STRUCT = 22;
constexpr int VARIABLE = 6;

/* Collects items that replace one part of the source. */
class items {
public:
    items(const session &of, const place_in_source &at, const stretch &part)
        : replaced(part), now(of), place(to_json(at.in.positions(of.client.units).of(part))) {}

    const stretch replaced;

    /* text: what is inserted. Items are shown in the order in which they are added. */
    json &add(std::string_view label, int kind, std::string_view text, const std::string &documentation) {
        constexpr std::size_t DIGITS = 4;
        std::string order = std::to_string(all.size());
        json item = {{"label", label},
                     {"kind", kind},
                     {"sortText", std::string(DIGITS - std::min(DIGITS, order.size()), '0') + order},
                     {"filterText", label},
                     {"textEdit", {{"range", place}, {"newText", text}}}};
        if (!documentation.empty())
            item["documentation"] = {{"kind", "markdown"}, {"value", documentation}};
        all.push_back(std::move(item));
        return all.back();
    }
    /* The text is a snippet if the client supports snippets. */
    json &add_snippet(std::string_view label, int kind, std::string_view text, const std::string &documentation) {
        constexpr int AS_IT_IS = 1; /* insertTextMode: the client does not indent it */
        json &item = add(label, kind, text, documentation);
        item["insertTextMode"] = AS_IT_IS;
        if (takes_snippets())
            item["insertTextFormat"] = 2;
        return item;
    }
    bool takes_snippets() const {
        return now.client.snippets;
    }
    json take() {
        return std::move(all);
    }

private:
    const session &now;
    json place;
    json all = json::array();
};

/* ---- Stanzas ---------------------------------------------------------------------------------------------------- */

bool is_kind_before(const place_in_source &place, int kind) {
    const std::vector<stanza> &all = place.in.index().stanzas;
    return std::any_of(all.begin(), all.end(), [&](const stanza &each) {
        return each.kind == kind && place.in.index().lines[each.first_line].whole.begin < place.offset &&
               each.first_line != place.line;
    });
}

/* The latest stanza before the line. */
const stanza *stanza_before(const place_in_source &place) {
    const stanza *latest = nullptr;
    for (const stanza &each : place.in.index().stanzas)
        if (each.first_line < place.line)
            latest = &each;
    return latest;
}

/* Whether a run of elements may begin or continue after a stanza. */
bool may_follow(const place_in_source &place, const srtable_ctrl &kind, const stanza *before) {
    if (before == nullptr || !before->is_known())
        return false;
    const sd_owner &who = *kind.sc_sd_owner;
    if (&before->row() == &kind)
        return missing_in(*before).empty();
    if (who.of_class != nullptr)
        return true;
    if (who.of_action != nullptr)
        return before->kind == SC_CLASS_ACTION || before->kind == SC_RESOURCE_ACTION ||
               (before->is_element() && before->row().sc_sd_owner->of_action != nullptr &&
                before->owner != source_index::NONE);
    bool structured = before->value(place.text(), "DataType").starts_with("SD");
    bool persistent = before->kind == SC_PERSISTENT_RESOURCE_ATTRIBUTE || before->kind == SC_PERSISTENT_CLASS_ATTRIBUTE;
    return structured && before->row().sc_attr != nullptr && persistent == (who.type == SD_TYPE_PATTR);
}

/* Whether a dynamic attribute of resources before the line has a Range, which one of the class after it would lose. */
bool is_range_before(const place_in_source &place) {
    const std::vector<stanza> &all = place.in.index().stanzas;
    return std::any_of(all.begin(), all.end(), [&](const stanza &each) {
        return each.kind == SC_DYNAMIC_RESOURCE_ATTRIBUTE && each.first_line < place.line &&
               each.find("Range") != nullptr;
    });
}

/* The reverse: whether a dynamic attribute of the class after the line has a Range. */
bool is_range_after(const place_in_source &place) {
    const std::vector<stanza> &all = place.in.index().stanzas;
    return std::any_of(all.begin(), all.end(), [&](const stanza &each) {
        return each.kind == SC_DYNAMIC_CLASS_ATTRIBUTE && each.first_line > place.line && each.find("Range") != nullptr;
    });
}

/* Whether the source has a stanza of a kind, other than on the line. */
bool is_in_source(const place_in_source &place, int kind) {
    const std::vector<stanza> &all = place.in.index().stanzas;
    return std::any_of(all.begin(), all.end(),
                       [&](const stanza &each) { return each.kind == kind && each.first_line != place.line; });
}

/* The first stanza after the line. */
const stanza *stanza_after(const place_in_source &place) {
    const std::vector<stanza> &all = place.in.index().stanzas;
    auto after = std::find_if(all.begin(), all.end(), [&](const stanza &each) { return each.first_line > place.line; });
    return after == all.end() ? nullptr : &*after;
}

/* Whether the line or one below it is an attribute line of the stanza, which a header here would take. */
bool has_lines_below(const place_in_source &place) {
    const stanza *of = place.stanza;
    return of != nullptr && !of->attributes.empty() &&
           place.in.index().lines[of->attributes.back().line].whole.end >= place.offset;
}

bool is_header(const place_in_source &place) {
    return place.stanza != nullptr && place.stanza->first_line == place.line;
}

/* Whether a stanza of a kind may be between two others. A run of elements must not be divided, nor separated from what
 * it describes. Elements of the class must not follow those of an attribute directly. */
bool may_precede(const srtable_ctrl &kind, const stanza *before, const stanza *after) {
    const sd_owner *who = kind.sc_sd_owner;
    bool follows_attribute = before != nullptr && before->is_element() && before->row().sc_sd_owner->is_attribute();
    if (who != nullptr && who->of_class != nullptr && follows_attribute)
        return false;
    if (after == nullptr || !after->is_element())
        return true;
    const sd_owner &next = *after->row().sc_sd_owner;
    bool divides = before != nullptr && before->kind == after->kind;
    if (&after->row() == &kind || divides)
        return false;
    if (next.of_class != nullptr)
        return who == nullptr || who->of_class != nullptr;
    return next.of_action != nullptr && who != nullptr && who->of_action != nullptr;
}

/* Whether all lines below the line are attributes of a kind. */
bool takes_lines_below(const place_in_source &place, const srtable_ctrl &kind) {
    const auto &lines = place.stanza->attributes;
    return std::all_of(lines.begin(), lines.end(), [&](const source_index::attribute &each) {
        return find_attr(kind, each.parts.name.of(place.text())) != nullptr;
    });
}

bool may_begin(const place_in_source &place, int kind) {
    const srtable_ctrl &row = sc_tables[static_cast<std::size_t>(kind)];
    if (is_header(place) && place.stanza->is_known() && has_lines_below(place))
        return place.stanza->kind == kind;
    if (has_lines_below(place) && (!is_header(place) || !takes_lines_below(place, row)))
        return false;
    if (!may_precede(row, stanza_before(place), stanza_after(place)))
        return false;
    switch (kind) {
    case SC_CONTROL_DEFINITION:
    case SC_CLASS_TO_MANAGER_MAPPING:
    case SC_RESOURCE_CLASS:
        return !is_in_source(place, kind) &&
               (kind != SC_RESOURCE_CLASS || is_kind_before(place, SC_CONTROL_DEFINITION));
    case SC_RESOURCE_VARIABLE_CLASS:
        return true;
    case SC_DYNAMIC_RESOURCE_ATTRIBUTE:
        return is_kind_before(place, SC_CONTROL_DEFINITION) && !is_range_after(place);
    case SC_DYNAMIC_CLASS_ATTRIBUTE:
        return is_kind_before(place, SC_CONTROL_DEFINITION) && !is_range_before(place);
    default:
        return is_kind_before(place, SC_CONTROL_DEFINITION) &&
               (row.sc_sd_owner == nullptr || may_follow(place, row, stanza_before(place)));
    }
}

/* Escapes the characters that have a meaning in a snippet. */
std::string escaped(std::string_view text) {
    std::string safe;
    for (char c : text) {
        if (c == '$' || c == '}' || c == '\\')
            safe += '\\';
        safe += c;
    }
    return safe;
}

/* The header and the required lines in order, with values for the author to replace. */
std::string stanza_text(const place_in_source &place, int kind, bool snippet) {
    stanza fresh;
    fresh.kind = kind;
    fresh.first_line = place.line;
    if (has_lines_below(place))
        return fresh.row().sc_name;
    const stanza *before = stanza_before(place);
    fresh.class_number = before == nullptr ? 0 : before->class_number;
    if (fresh.is_element() && before != nullptr && before->kind == kind)
        fresh.run = before->run;
    std::string text = fresh.row().sc_name;
    int number = 0;
    for (const table_attrs *each : missing_in(fresh)) {
        std::string value = example_value(place.text(), place.in.index(), fresh, *each);
        text.append("\n\t").append(each->ta_name).append("=");
        text += snippet ? "${" + std::to_string(++number) + ":" + escaped(value) + "}" : value;
    }
    return text + (snippet ? "$0" : "");
}

void add_stanzas(items &to, const place_in_source &place) {
    for (int kind = 0; kind < SC_COUNT; ++kind) {
        const srtable_ctrl &row = sc_tables[static_cast<std::size_t>(kind)];
        if (may_begin(place, kind))
            to.add_snippet(row.sc_name, STRUCT, stanza_text(place, kind, to.takes_snippets()),
                           stanza_documentation(row));
    }
}

/* ---- Attributes ------------------------------------------------------------------------------------------------- */

bool is_given(const place_in_source &place, const table_attrs &attr) {
    const auto &given = place.stanza->attributes;
    return std::any_of(given.begin(), given.end(),
                       [&](const auto &each) { return each.known == &attr && each.line != place.line; });
}

/* Whether all required attributes come before the line, so that optional ones may follow. */
bool takes_optional(const place_in_source &place) {
    vx_uint32_t seen = 0;
    for (const source_index::attribute &each : place.stanza->attributes)
        if (each.known != nullptr && each.line < place.line && (each.known->req_bit & OPTIONAL) == 0)
            seen |= each.known->req_bit;
    return seen == place.stanza->row().req_mask_cmplt;
}

void add_attributes(items &to, const place_in_source &place) {
    bool has_equals = place.attribute != nullptr && place.attribute->parts.has_equals;
    bool optional_too = takes_optional(place);
    for (const table_attrs *each : language::in_usual_order(place.stanza->row())) {
        bool is_required = (each->req_bit & OPTIONAL) == 0;
        bool fits = is_required || optional_too;
        bool refused = each->ta_type == AT_SD_DEFAULT_VALUE;
        bool again = is_given(place, *each);
        if (!fits || refused || (again && each->dup_allowed == 0))
            continue;
        bool numbered = each->ta_type == AT_ID || each->ta_type == AT_SD_INDEX;
        std::string text = each->ta_name;
        if (!has_equals)
            text += "=";
        if (!has_equals && numbered)
            text += example_value(place.text(), place.in.index(), *place.stanza, *each);
        json &item = to.add(each->ta_name, PROPERTY, text, attribute_documentation(place.stanza->row(), *each));
        item["detail"] = is_required ? "required" : "optional";
    }
}

/* ---- Values ----------------------------------------------------------------------------------------------------- */

void add_values(items &to, const language::name_list &names, const table_attrs &attr, int kind) {
    for (std::string_view name : names)
        to.add(name, kind, name, value_documentation(attr, name));
}

/* The line of a place without the carriage return at its end. */
stretch line_at(const place_in_source &place) {
    if (place.in.index().lines.empty())
        return {};
    stretch line = place.in.index().lines[place.line].whole;
    if (line.of(place.text()).ends_with('\r'))
        --line.end;
    return line;
}

/* Adds an item that gives the attribute this value, with quotes if it needs them. None if the line cannot have it. */
void add_value(items &to, const place_in_source &place, std::string_view value, int kind, const std::string &about) {
    const stretch &part = to.replaced;
    const stretch line = line_at(place);
    std::string_view source = place.text();
    for (const std::string &text : {std::string(value), "\"" + std::string(value) + "\""}) {
        std::string made(stretch{line.begin, part.begin}.of(source));
        made.append(text).append(stretch{part.end, line.end}.of(source));
        if (source_index::has_value(made, value)) {
            to.add(value, kind, text, about);
            return;
        }
    }
}

/* The numbers of the names of a kind that something defines, in order. */
std::vector<std::size_t> defined_names(const place_in_source &place, name_kind kind, std::size_t scope) {
    const source_index::names &names = place.in.names();
    std::set<std::size_t> taken;
    std::vector<std::size_t> found;
    for (const source_index::mention &each : names.mentions) {
        const source_index::named &name = names.all[each.name];
        if (each.defines && name.kind == kind && name.scope == scope && taken.insert(each.name).second)
            found.push_back(each.name);
    }
    return found;
}

void add_names(items &to, const place_in_source &place, name_kind kind, std::size_t scope) {
    for (std::size_t name : defined_names(place, kind, scope))
        add_value(to, place, place.in.names().all[name].text, VARIABLE, name_documentation(place.in, name));
}

/* Properties that the list does not have yet. */
void add_properties(items &to, const place_in_source &place, const stretch &item) {
    const table_attrs &attr = *place.attribute->known;
    std::string_view list = place.attribute->parts.value.of(place.text());
    std::size_t begin = item.begin - place.attribute->parts.value.begin;
    std::string others(list.substr(0, begin));
    std::size_t next = list.find(',', begin);
    others += next == list.npos ? std::string_view() : list.substr(next);
    std::string around = "," + others + ",";
    for (std::string_view name : language::property_names(attr.ta_type))
        if (around.find("," + std::string(name) + ",") == std::string::npos)
            to.add(name, ENUM_MEMBER, name, value_documentation(attr, name));
}

/* A name that is not one word cannot be used in an expression. */
void add_word(items &to, const place_in_source &place, std::size_t name) {
    const std::string &text = place.in.names().all[name].text;
    if (source_index::is_expression_name(text))
        to.add(text, VARIABLE, text, name_documentation(place.in, name));
}

/* Attributes of the class or, after a dot, the elements of the attribute before it. */
void add_expression_names(items &to, const place_in_source &place, const stretch &word) {
    const source_index::names &names = place.in.names();
    const stretch &value = place.attribute->parts.value;
    bool after_quote = word.begin > value.begin && language::is_quote(place.text()[word.begin - 1]);
    if (after_quote || source_index::is_in_quotes(value.of(place.text()), place.offset - value.begin))
        return;
    auto scope = static_cast<std::size_t>(place.stanza->class_number);
    bool member = word.begin > 0 && place.text()[word.begin - 1] == '.';
    if (!member) {
        for (name_kind kind : {name_kind::dynamic_resource, name_kind::persistent_resource, name_kind::dynamic_class,
                               name_kind::persistent_class})
            for (std::size_t name : defined_names(place, kind, scope))
                add_word(to, place, name);
        return;
    }
    const source_index::mention *before = names.at(word.begin - 1);
    for (const source_index::mention &each : names.mentions) {
        const stanza &of = place.in.index().stanzas[each.stanza];
        bool owned = before != nullptr && each.defines && of.is_element() && of.owner != source_index::NONE;
        if (!owned)
            continue;
        std::string_view owner = place.in.index().stanzas[of.owner].value(place.text(), "Name");
        if (owner == names.all[before->name].text)
            add_word(to, place, each.name);
    }
}

/* A default must be one of the stanza's valid values. */
void add_valid_values(items &to, const place_in_source &place) {
    std::set<std::string_view> shown;
    for (const source_index::attribute &each : place.stanza->attributes) {
        bool valid = each.known != nullptr && each.known->ta_type == AT_VALID_VALUE;
        std::string_view value = valid ? each.parts.value.of(place.text()) : std::string_view();
        if (!value.empty() && value.find(',') == value.npos && shown.insert(value).second)
            add_value(to, place, value, VALUE, attribute_documentation(place.stanza->row(), *each.known));
    }
}

void add_by_type(items &to, const place_in_source &place, const stretch &part) {
    const table_attrs &attr = *place.attribute->known;
    const stanza &in = *place.stanza;
    switch (attr.ta_type) {
    case AT_DATA_TYPE:
    case AT_SD_DATA_TYPE:
        return add_values(to, language::data_type_names(in.is_element()), attr, ENUM_MEMBER);
    case AT_VARIABLE_TYPE:
        return add_values(to, language::variable_type_names(), attr, ENUM_MEMBER);
    case AT_CLASS_PROPS:
    case AT_PATTR_PROPS:
    case AT_DATTR_PROPS:
    case AT_ACTION_PROPS:
        return add_properties(to, place, part);
    case AT_LOCATOR:
        return add_names(to, place, name_kind::persistent_resource,
                         static_cast<std::size_t>(place.in.index().stanzas.back().class_number));
    case AT_ID:
    case AT_SD_INDEX: {
        std::string next = example_value(place.text(), place.in.index(), in, attr);
        to.add(next, VALUE, next, attribute_documentation(in.row(), attr))["detail"] =
            in.is_element() ? "the element's place" : "next free number";
        return;
    }
    case AT_PERMISSION:
        for (const valid_perms_t &each : perm_list)
            to.add({&each.permission, 1}, ENUM_MEMBER, {&each.permission, 1},
                   "mask " + text::hex(each.mask) + "\n\n" + attribute_documentation(in.row(), attr));
        return;
    case AT_DEFAULT_VALUE:
    case AT_INITIAL_VALUE:
        return add_valid_values(to, place);
    case AT_STRING:
        if (std::string_view(attr.ta_name) == "VariableClass" && in.kind != SC_RESOURCE_VARIABLE_CLASS)
            add_names(to, place, name_kind::variable_class, 0);
        else if (std::string_view(attr.ta_name).ends_with("Expression"))
            add_expression_names(to, place, part);
        return;
    default:
        return;
    }
}

bool is_in_name(char c) {
    return source_index::is_expression_name("a" + std::string(1, c));
}

/* The part of the value that an item replaces: one item of a list, one word of an expression, or all of it. */
stretch value_part(const place_in_source &place) {
    const table_attrs &attr = *place.attribute->known;
    stretch part = {place.attribute->parts.value.begin, place.offset};
    bool list = attr.ta_type == AT_CLASS_PROPS || attr.ta_type == AT_PATTR_PROPS || attr.ta_type == AT_DATTR_PROPS ||
                attr.ta_type == AT_ACTION_PROPS;
    bool expression = std::string_view(attr.ta_name).ends_with("Expression");
    for (std::size_t at = place.offset; at > part.begin && (list || expression); --at) {
        char before = place.text()[at - 1];
        bool ends = list ? before == ',' : !is_in_name(before);
        if (ends)
            part.begin = at;
    }
    std::size_t last = std::max(place.offset, place.attribute->parts.value.end);
    if (!list && !expression)
        part.end = last;
    while (part.end < last && (list ? place.text()[part.end] != ',' : is_in_name(place.text()[part.end])))
        ++part.end;
    return part;
}

/* Whether the client sees two lines, because a carriage return divides them. */
bool is_in_two_lines(const place_in_source &place, const stretch &part) {
    return part.of(place.text()).find('\r') != std::string_view::npos;
}

/* Whether the place is after the value: after its closing quote, or between it and a comment. */
bool is_after_value(const place_in_source &place) {
    const source_index::attribute_parts &parts = place.attribute->parts;
    if (parts.quoted && parts.closed)
        return place.offset > parts.value.end;
    std::string_view rest = stretch{parts.written.end, line_at(place).end}.of(place.text());
    return place.offset > parts.written.end && rest.find_first_not_of(" \t") != rest.npos;
}

json value_items(const session &now, const place_in_source &place) {
    stretch part = value_part(place);
    part.end = std::max(place.offset, std::min(part.end, line_at(place).end));
    if (is_after_value(place) || is_in_two_lines(place, part))
        return json::array();
    items found(now, place, part);
    add_by_type(found, place, part);
    return found.take();
}

/* Whether a line is indented and has text, so that no header can be put in front of it. */
bool is_indented(std::string_view line) {
    std::size_t text = line.find_first_not_of(" \t");
    return text != line.npos && text > 0;
}

/* The end of the header or the attribute's name in which the place is; otherwise the place. */
std::size_t end_of_word(const place_in_source &place) {
    stretch word = is_header(place) ? place.stanza->header : stretch{place.offset, place.offset};
    if (place.attribute != nullptr)
        word = place.attribute->parts.name;
    if (!word.touches(place.offset))
        return place.offset;
    std::size_t end = std::max(place.offset, std::min(word.end, line_at(place).end));
    std::string_view rest = stretch{place.offset, end}.of(place.text());
    return place.offset + std::min(rest.find_first_of(" \t"), rest.size());
}

} // namespace

json completion(session &now, const json &params) {
    place_in_source place = place_in(now, params);
    std::string_view source = place.text();
    std::size_t begin = place.in.index().lines.empty() ? 0 : place.in.index().lines[place.line].whole.begin;
    if (place.offset > 0 && source[place.offset - 1] == '\n')
        begin = place.offset; /* the empty line at the end of a source */
    std::string_view before = source.substr(begin, place.offset - begin);
    std::size_t word = begin + std::min(before.find_first_not_of(" \t"), before.size());
    if (place.in_comment)
        return json::array();
    bool in_value = place.has_known_attribute() && place.attribute->parts.has_equals &&
                    place.offset >= place.attribute->parts.value.begin && begin != place.offset;
    if (in_value)
        return value_items(now, place);
    stretch part = {word, end_of_word(place)};
    bool before_name = place.attribute != nullptr && place.offset < place.attribute->parts.name.begin;
    bool before_text = place.offset == begin && is_indented(source.substr(begin, source.find('\n', begin) - begin));
    if (before_text || is_in_two_lines(place, part))
        return json::array();
    items found(now, place, part);
    if (word == begin)
        add_stanzas(found, place);
    else if (place.stanza != nullptr && place.stanza->is_known() && !before_name && before.find('=') == before.npos)
        add_attributes(found, place);
    return found.take();
}

} // namespace lsp
