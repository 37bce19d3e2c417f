/* stanzas.cpp: the stanzas of a source and their attributes. */

#include "index/stanzas.h"

#include <algorithm>
#include <charconv>
#include <limits>
#include <set>
#include <system_error>

namespace source_index {

namespace {

/* The stanza whose structure a run of elements after these stanzas describes. */
std::size_t owner_of_run(const std::vector<stanza> &before, const srtable_ctrl &kind) {
    bool of_attribute = kind.sc_sd_owner->is_attribute();
    bool of_action = kind.sc_sd_owner->of_action != nullptr;
    for (std::size_t at = before.size(); at-- > 0 && (of_attribute || of_action);) {
        const stanza &earlier = before[at];
        if (earlier.is_element() && of_action) {
            if (earlier.row().sc_sd_owner->of_action != nullptr) /* both follow the same action, if any */
                return earlier.owner;
            continue;
        }
        bool is_attribute = earlier.is_known() && earlier.row().sc_attr != nullptr;
        bool is_action = earlier.kind == SC_CLASS_ACTION || earlier.kind == SC_RESOURCE_ACTION;
        return (of_attribute ? is_attribute : is_action) ? at : NONE;
    }
    return NONE;
}

void begin_stanza(index &to, std::string_view source, std::size_t line_number) {
    stanza one;
    one.header = to.lines[line_number].text;
    one.kind = set_table_id(one.header.of(source));
    one.first_line = one.last_line = line_number;
    one.class_number = to.stanzas.empty() ? 0 : to.stanzas.back().class_number;
    if (one.kind == SC_CONTROL_DEFINITION)
        ++one.class_number;
    if (one.is_element()) {
        bool continues = !to.stanzas.empty() && to.stanzas.back().kind == one.kind;
        one.run = continues ? to.stanzas.back().run : to.stanzas.size();
        one.owner = continues ? to.stanzas.back().owner : owner_of_run(to.stanzas, one.row());
    }
    to.stanzas.push_back(std::move(one));
}

void add_attribute(index &to, std::string_view source, std::size_t line_number) {
    if (to.stanzas.empty())
        return;
    stanza &current = to.stanzas.back();
    attribute one;
    one.line = current.last_line = line_number;
    one.parts = parts_of(source, to.lines[line_number].text);
    if (current.is_known())
        one.known = find_attr(current.row(), one.parts.name.of(source));
    current.attributes.push_back(one);
}

/* Kinds that share their numbers are in one family. */
int number_family(int kind) {
    switch (kind) {
    case SC_DYNAMIC_RESOURCE_ATTRIBUTE:
        return SC_PERSISTENT_RESOURCE_ATTRIBUTE;
    case SC_DYNAMIC_CLASS_ATTRIBUTE:
        return SC_PERSISTENT_CLASS_ATTRIBUTE;
    default:
        return kind;
    }
}

bool shares_numbers(const stanza &one, const stanza &other) {
    return &one != &other && one.class_number == other.class_number &&
           number_family(one.kind) == number_family(other.kind);
}

/* The Id that a record gets: the low 32 bits. Nothing for a text that is not a number. As for the compiler, 0x means
 * hexadecimal, and 0 in front of other digits octal. */
std::optional<vx_int32_t> number_in(std::string_view text) {
    constexpr int DECIMAL = 10;
    constexpr int OCTAL = 8;
    constexpr int HEXADECIMAL = 16;
    int base = text.starts_with('0') && text.size() > 1 ? OCTAL : DECIMAL;
    if (text.starts_with("0x") || text.starts_with("0X")) {
        base = HEXADECIMAL;
        text.remove_prefix(2);
    }
    long long number = 0;
    auto error = std::from_chars(text.data(), text.data() + text.size(), number, base).ec;
    return error == std::errc() ? std::optional(static_cast<vx_int32_t>(number)) : std::nullopt;
}

} // namespace

const attribute *stanza::find(std::string_view name) const {
    auto found = std::find_if(attributes.begin(), attributes.end(), [&](const attribute &each) {
        return each.known != nullptr && std::string_view(each.known->ta_name) == name;
    });
    return found == attributes.end() ? nullptr : &*found;
}

std::string_view stanza::value(std::string_view source, std::string_view name) const {
    const attribute *found = find(name);
    return found == nullptr ? std::string_view() : found->parts.value.of(source);
}

vx_uint32_t stanza::required_seen() const {
    vx_uint32_t seen = 0;
    for (const attribute &each : attributes)
        if (each.known != nullptr && (each.known->req_bit & OPTIONAL) == 0)
            seen |= each.known->req_bit;
    return seen;
}

std::size_t index::line_at(std::size_t offset) const {
    auto after = std::upper_bound(lines.begin(), lines.end(), offset,
                                  [](std::size_t at, const line &each) { return at < each.whole.begin; });
    return after == lines.begin() ? 0 : static_cast<std::size_t>(after - lines.begin()) - 1;
}

std::size_t index::stanza_at(std::size_t line_number) const {
    auto after = std::upper_bound(stanzas.begin(), stanzas.end(), line_number,
                                  [](std::size_t at, const stanza &each) { return at < each.first_line; });
    return after == stanzas.begin() ? NONE : static_cast<std::size_t>(after - stanzas.begin()) - 1;
}

const attribute *index::attribute_at(std::size_t line_number) const {
    std::size_t at = stanza_at(line_number);
    if (at == NONE)
        return nullptr;
    const std::vector<attribute> &all = stanzas[at].attributes;
    auto found = std::lower_bound(all.begin(), all.end(), line_number,
                                  [](const attribute &each, std::size_t line) { return each.line < line; });
    return found != all.end() && found->line == line_number ? &*found : nullptr;
}

span index::extent_of(const stanza &of) const {
    return {lines[of.first_line].whole.begin, lines[of.last_line].whole.end};
}

std::optional<long long> index::next_id(std::string_view source, const stanza &of) const {
    if (of.is_element())
        return std::count_if(stanzas.begin(), stanzas.end(), [&](const stanza &each) {
            return of.run != NONE && each.run == of.run && each.first_line < of.first_line;
        });
    if (!of.is_known() || find_attr(of.row(), "Id") == nullptr)
        return std::nullopt;
    std::set<vx_int32_t> used;
    for (const stanza &each : stanzas)
        if (shares_numbers(each, of))
            used.insert(number_in(each.value(source, "Id")).value_or(-1));
    vx_int32_t highest = used.empty() ? -1 : *used.rbegin();
    if (highest < std::numeric_limits<vx_int32_t>::max())
        return std::max(highest, -1) + 1LL;
    long long gap = 0;
    while (used.contains(static_cast<vx_int32_t>(gap)))
        ++gap;
    return gap;
}

bool index::is_free_id(std::string_view source, const stanza &of) const {
    std::optional<vx_int32_t> number = number_in(of.value(source, "Id"));
    return number && std::none_of(stanzas.begin(), stanzas.end(), [&](const stanza &each) {
               return shares_numbers(each, of) && number_in(each.value(source, "Id")) == number;
           });
}

index index_of(std::string_view source) {
    index made;
    made.lines = lines_of(source);
    for (std::size_t at = 0; at < made.lines.size(); ++at) {
        if (made.lines[at].kind == line_kind::header)
            begin_stanza(made, source, at);
        else if (made.lines[at].kind == line_kind::attribute)
            add_attribute(made, source, at);
    }
    return made;
}

} // namespace source_index
