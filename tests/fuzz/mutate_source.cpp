/* mutate_source.cpp: changes to a source, by stanzas and attribute lines. */

#include "compiler/cdgen.h"
#include "format/data_types.h"
#include "format/names.h"
#include "mutate.h"

#include <algorithm>
#include <array>
#include <utility>

namespace fuzz {

namespace {

using lines = std::vector<std::string>;

struct stanza {
    std::string header; /* empty: there are lines before the first header */
    lines attributes;
};

using document = std::vector<stanza>;

bool is_header(std::string_view line) {
    return !line.empty() && line[0] >= 'A' && line[0] <= 'Z';
}

/* There is always one stanza, which may be empty. */
document parsed(std::string_view source) {
    document all(1);
    while (!source.empty()) {
        std::string_view line = source.substr(0, source.find('\n'));
        source.remove_prefix(std::min(line.size() + 1, source.size()));
        if (is_header(line))
            all.push_back({std::string(line), {}});
        else
            all.back().attributes.emplace_back(line);
    }
    return all;
}

std::string text_of(const document &all) {
    std::string text;
    for (const stanza &each : all) {
        if (!each.header.empty())
            text.append(each.header).append("\n");
        for (const std::string &line : each.attributes)
            text.append(line).append("\n");
    }
    return text;
}

/* ---- Places ----------------------------------------------------------------------------------------------------- */

std::ptrdiff_t some_place(std::size_t size, chance &random) {
    return static_cast<std::ptrdiff_t>(below(size + 1, random));
}

template <class List, class Item> void insert_somewhere(List &list, Item item, chance &random) {
    list.insert(list.begin() + some_place(list.size(), random), std::move(item));
}

template <class List> auto take_some(List &list, chance &random) {
    auto at = list.begin() + static_cast<std::ptrdiff_t>(below(list.size(), random));
    auto taken = std::move(*at);
    list.erase(at);
    return taken;
}

/* An attribute line and the header that it follows; no line if a few tries find none. */
struct found_line {
    std::string_view header;
    std::string *line = nullptr;
};

found_line some_line(document &all, chance &random) {
    constexpr int TRIES = 8;
    for (int i = 0; i < TRIES; ++i)
        if (stanza &in = one_of(all, random); !in.attributes.empty())
            return {in.header, &one_of(in.attributes, random)};
    return {};
}

/* ---- Values ----------------------------------------------------------------------------------------------------- */

constexpr int NO_FORM = -1;

/* The form of an attribute's value, as the catalogue has it. */
int form_of(const found_line &found) {
    const std::string &line = *found.line;
    std::size_t begin = std::min(line.find_first_not_of(" \t"), line.size());
    std::size_t equals = line.find('=');
    int kind = set_table_id(std::string(found.header).c_str());
    if (kind < 0 || equals == std::string::npos || equals < begin)
        return NO_FORM;
    const table_attrs *attr =
        find_attr(sc_tables[static_cast<std::size_t>(kind)], std::string_view(line).substr(begin, equals - begin));
    return attr == nullptr ? NO_FORM : attr->ta_type;
}

std::string value_of(const std::string &line) {
    std::size_t equals = line.find('=');
    return equals == std::string::npos ? std::string() : line.substr(equals + 1);
}

void set_value(std::string &line, std::string_view value) {
    line.resize(std::min(line.find('='), line.size()));
    line.append("=").append(value);
}

/* A line of another document, or of another place, whose value has the same form. */
found_line line_of_form(document &all, int form, const std::string *unlike, chance &random) {
    constexpr int TRIES = 24;
    for (int i = 0; i < TRIES; ++i)
        if (found_line found = some_line(all, random);
            found.line != nullptr && found.line != unlike && form_of(found) == form)
            return found;
    return {};
}

/* What numbers, lists and texts may hold at most, just beyond it, and in odd ways. */
constexpr std::array<std::string_view, 40> odd_values = {
    "",      "0",     "1",     "-1",         "100",        "255",         "256",        "32767",
    "32768", "65535", "65536", "2147483647", "2147483648", "-2147483648", "4294967295", "4294967296",
    "1e39",  "1e-46", "nan",   "-inf",       "0x",         "0x0",         "0x00FF",     "0x1",
    "010",   "08",    "1,2",   "2,1",        ",",          "1,",          "\"\"",       "\"",
    "a b",   "\\101", "\\",    "\\400",      "1.2.3.4.5",  "Public",      "R",          "9223372036854775807"};

std::string some_value(chance &random) {
    constexpr std::size_t LONG = 2000; /* characters: more than a value may have */
    switch (below(8, random)) {
    case 0:
        return vxTypeStr[below(std::size(vxTypeStr), random)];
    case 1:
        return vxVarStr[below(std::size(vxVarStr), random)];
    case 2: {
        std::size_t length = below(LONG, random);
        return std::string(length, "a0,\\\""[below(5, random)]);
    }
    default:
        return std::string(one_of(odd_values, random));
    }
}

/* ---- Changes to one source -------------------------------------------------------------------------------------- */

void move_stanza(document &all, chance &random) {
    stanza moved = take_some(all, random);
    insert_somewhere(all, std::move(moved), random);
}

void copy_stanza(document &all, chance &random) {
    insert_somewhere(all, stanza(one_of(all, random)), random);
}

void remove_stanza(document &all, chance &random) {
    take_some(all, random);
    if (all.empty())
        all.emplace_back();
}

/* A stanza becomes one of another kind, with the same lines. */
void rename_stanza(document &all, chance &random) {
    stanza &in = one_of(all, random);
    in.header = sc_tables[below(SC_COUNT, random)].sc_name;
}

void move_line(document &all, chance &random) {
    stanza &from = one_of(all, random);
    stanza &to = one_of(all, random);
    if (!from.attributes.empty()) {
        std::string moved = take_some(from.attributes, random);
        insert_somewhere(to.attributes, std::move(moved), random);
    }
}

void copy_line(document &all, chance &random) {
    if (found_line found = some_line(all, random); found.line != nullptr)
        insert_somewhere(one_of(all, random).attributes, std::string(*found.line), random);
}

void remove_line(document &all, chance &random) {
    if (stanza &from = one_of(all, random); !from.attributes.empty())
        take_some(from.attributes, random);
}

/* Adds a line for any attribute of the stanza's kind. */
void add_line(document &all, chance &random) {
    stanza &to = one_of(all, random);
    int kind = set_table_id(to.header.c_str());
    if (kind < 0)
        return;
    std::string name(one_of(sc_tables[static_cast<std::size_t>(kind)].sc_attrs, random).ta_name);
    insert_somewhere(to.attributes, "\t" + name + "=" + some_value(random), random);
}

void exchange_values(document &all, chance &random) {
    found_line first = some_line(all, random);
    if (first.line == nullptr)
        return;
    found_line second = line_of_form(all, form_of(first), first.line, random);
    if (second.line == nullptr)
        return;
    std::string value = value_of(*first.line);
    set_value(*first.line, value_of(*second.line));
    set_value(*second.line, value);
}

void change_value(document &all, chance &random) {
    if (found_line found = some_line(all, random); found.line != nullptr)
        set_value(*found.line, some_value(random));
}

constexpr std::array<std::string_view, 12> marks = {"\"", "#", "//", "/*", "*/", "\\", "=", " ", "\t", "\r", ",", "\n"};

void put_mark(document &all, chance &random) {
    stanza &in = one_of(all, random);
    std::string &line = in.attributes.empty() ? in.header : one_of(in.attributes, random);
    std::size_t place = below(line.size() + 1, random);
    line.insert(place, one_of(marks, random));
}

/* Takes one quote away, or whatever the place holds. */
void remove_character(document &all, chance &random) {
    found_line found = some_line(all, random);
    if (found.line == nullptr || found.line->empty())
        return;
    std::size_t quote = found.line->find('"', below(found.line->size(), random));
    found.line->erase(quote == std::string::npos ? below(found.line->size(), random) : quote, 1);
}

using change = void (*)(document &, chance &);

constexpr std::array<change, 12> changes = {move_stanza, copy_stanza,     remove_stanza, rename_stanza,
                                            move_line,   copy_line,       remove_line,   add_line,
                                            put_mark,    exchange_values, change_value,  remove_character};

/* ---- Changes with another source -------------------------------------------------------------------------------- */

void take_stanza(document &all, document &other, chance &random) {
    insert_somewhere(all, stanza(one_of(other, random)), random);
}

void take_line(document &all, document &other, chance &random) {
    if (found_line found = some_line(other, random); found.line != nullptr)
        insert_somewhere(one_of(all, random).attributes, std::string(*found.line), random);
}

void take_value(document &all, document &other, chance &random) {
    found_line target = some_line(all, random);
    if (target.line == nullptr)
        return;
    if (found_line from = line_of_form(other, form_of(target), nullptr, random); from.line != nullptr)
        set_value(*target.line, value_of(*from.line));
}

/* The beginning of the one and the end of the other. */
void take_rest(document &all, document &other, chance &random) {
    all.erase(all.begin() + some_place(all.size(), random), all.end());
    all.insert(all.end(), other.begin() + some_place(other.size(), random), other.end());
    if (all.empty())
        all.emplace_back();
}

using crossing = void (*)(document &, document &, chance &);

constexpr std::array<crossing, 5> crossings = {take_stanza, take_stanza, take_line, take_value, take_rest};

} // namespace

std::string changed_source(std::string_view source, chance &random) {
    constexpr std::size_t MOST = 4;
    document all = parsed(source);
    for (std::size_t left = 1 + below(MOST, random); left > 0; --left)
        one_of(changes, random)(all, random);
    return text_of(all);
}

std::string crossed_source(std::string_view source, std::string_view other, chance &random) {
    document all = parsed(source), more = parsed(other);
    one_of(crossings, random)(all, more, random);
    return text_of(all);
}

} // namespace fuzz
