/* suggestions.cpp: finds the known name that a misspelt one was meant to be. */

#include "language/suggestions.h"

#include "format/names.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <cstddef>
#include <iterator>
#include <utility>

namespace language {

namespace {

char lower(char c) {
    return static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
}

constexpr size_t LONGEST_NAME = 64; /* characters; a longer text is not compared */
constexpr size_t FARTHEST = 4;      /* a text with this many edits or more is not similar to a name */
constexpr size_t LISTED_MAX = 40;   /* names in a list; more would not be read */
constexpr size_t MEANT_MAX = 3;     /* at most this many names are suggested for a text */

/* Data types of other languages, in lower case, and their names here. */
struct foreign_type {
    std::string_view name;
    std::array<std::string_view, 2> here;
};
constexpr foreign_type foreign_types[] = {
    {"bool", {"UInt32", "Int32"}}, {"boolean", {"UInt32", "Int32"}},
    {"byte", {"Binary"}},          {"bytes", {"Binary"}},
    {"char", {"String"}},          {"double", {"Float64"}},
    {"float", {"Float32"}},        {"int", {"Int32"}},
    {"integer", {"Int32"}},        {"long", {"Int64"}},
    {"short", {"Int32"}},          {"text", {"String"}},
    {"uint", {"UInt32"}},          {"unsigned", {"UInt32"}},
};

/* The edits between two texts: letters added, dropped, replaced or swapped with a neighbour; case does not count.
 * Returns at most the limit. Only the diagonal band below the limit is computed, because a source may have very many
 * names. */
size_t distance(std::string_view a, std::string_view b, size_t limit) {
    using row = std::array<size_t, LONGEST_NAME + FARTHEST + 1>;
    if (std::max(a.size(), b.size()) - std::min(a.size(), b.size()) >= limit)
        return limit;
    row before, above, current;
    before.fill(limit);
    current.fill(limit);
    for (size_t j = 0; j <= std::min(b.size(), limit); ++j)
        current[j] = j;
    for (size_t i = 1; i <= a.size(); ++i) {
        before = std::exchange(above, current);
        size_t first = i > limit ? i - limit : 0;
        size_t last = std::min(b.size(), i + limit);
        current.fill(limit);
        if (first == 0)
            current[0] = std::min(i, limit);
        for (size_t j = std::max<size_t>(first, 1); j <= last; ++j) {
            bool same = lower(a[i - 1]) == lower(b[j - 1]);
            current[j] = std::min({above[j] + 1, current[j - 1] + 1, above[j - 1] + (same ? 0 : 1), limit});
            if (i > 1 && j > 1 && lower(a[i - 1]) == lower(b[j - 2]) && lower(a[i - 2]) == lower(b[j - 1]))
                current[j] = std::min(current[j], before[j - 2] + 1);
        }
        if (*std::min_element(current.begin() + static_cast<ptrdiff_t>(first),
                              current.begin() + static_cast<ptrdiff_t>(last) + 1) >= limit)
            return limit;
    }
    return current[b.size()];
}

name_list named_types() {
    return {std::begin(vxTypeStr) + 1, std::end(vxTypeStr)}; /* the first type means "none" */
}

/* Types that have a name but are not accepted, anywhere or in an element. */
bool is_refused(std::string_view type, bool element) {
    return type == "SBS" || (element && (type == "SD" || type == "SDArray"));
}

/* The most similar name, or an empty guess. */
guess near_guess(std::string_view text, const name_list &names) {
    if (text.size() > LONGEST_NAME)
        return {};
    std::string_view best;
    size_t least = std::clamp<size_t>(text.size() / 3, 1, FARTHEST - 1) + 1;
    for (std::string_view name : names) {
        size_t far = distance(text, name, least + 1);
        if (far < least) {
            least = far;
            best = name;
        } else if (far == least && name != best) {
            best = {}; /* as near as the one before */
        }
    }
    if (best.empty())
        return {};
    return {{best}, least <= 1 ? likeness::one_edit : likeness::few_edits};
}

/* The data type of arrays of a type. */
std::string_view array_of(std::string_view type) {
    for (std::string_view each : named_types())
        if (each.starts_with(type) && each.substr(type.size()) == "Array")
            return each;
    return {};
}

/* "int", "IntArray" and "int[]" */
guess foreign_guess(std::string_view text) {
    std::string small(text);
    std::transform(small.begin(), small.end(), small.begin(), lower);
    std::string_view type = small;
    for (std::string_view suffix : {"array", "[]"})
        if (type.ends_with(suffix))
            type.remove_suffix(suffix.size());
    guess meant;
    for (const foreign_type &each : foreign_types)
        for (std::string_view here : each.here)
            if (each.name == type && !here.empty())
                meant.names.push_back(type.size() < small.size() ? array_of(here) : here);
    return meant;
}

} // namespace

std::string_view near_miss(std::string_view text, const name_list &names) {
    return near_guess(text, names).name();
}

name_list one_edit_from(std::string_view text, const name_list &names) {
    name_list near;
    if (text.size() > LONGEST_NAME)
        return near;
    std::copy_if(names.begin(), names.end(), std::back_inserter(near),
                 [text](std::string_view name) { return distance(text, name, 2) <= 1; });
    return near;
}

guess meant_by(std::string_view text, const name_list &names) {
    guess meant = near_guess(text, names);
    if (!meant.names.empty())
        return meant;
    meant.names = names_with_part(text, names);
    if (meant.names.size() > MEANT_MAX)
        meant.names.clear();
    return meant;
}

std::string suggestion(const guess &meant, const name_list &names) {
    if (!meant.names.empty())
        return "did you mean " + listed(meant.names, "or") + "?";
    if (names.empty() || names.size() > LISTED_MAX)
        return {};
    return std::string(KNOWN_NAMES) + listed(names);
}

std::string suggestion(std::string_view text, const name_list &names) {
    return suggestion(meant_by(text, names), names);
}

name_list data_type_names(bool element) {
    name_list names = named_types();
    std::erase_if(names, [&](std::string_view name) { return is_refused(name, element); });
    return names;
}

guess type_meant_by(std::string_view text, bool element) {
    guess meant = near_guess(text, named_types());
    if (is_refused(meant.name(), element))
        return {};
    if (meant.names.empty())
        meant = foreign_guess(text);
    return meant.names.empty() ? meant_by(text, data_type_names(element)) : meant;
}

std::string type_suggestion(std::string_view text, bool element) {
    std::string_view meant = near_miss(text, named_types());
    if (meant.empty() || !is_refused(meant, element))
        return suggestion(type_meant_by(text, element), data_type_names(element));
    if (meant == "SBS")
        return quoted(meant) + " is not supported";
    return "an element cannot be of type " + quoted(meant);
}

name_list variable_type_names() {
    return {std::begin(vxVarStr), std::end(vxVarStr)};
}

std::string quoted(std::string_view text) {
    std::string whole;
    return whole.append("`").append(text).append("`");
}

std::string listed(const name_list &names, const char *last) {
    std::string text;
    for (size_t i = 0; i < names.size(); ++i) {
        if (i > 0)
            text += i + 1 < names.size() ? ", " : " " + std::string(last) + " ";
        text += quoted(names[i]);
    }
    return text;
}

} // namespace language
