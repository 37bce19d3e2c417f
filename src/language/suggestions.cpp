/* suggestions.cpp: which known name a misspelt one may stand for. */

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
constexpr size_t FARTHEST = 4;      /* edits from which on a text is not like a name */
constexpr size_t LISTED_MAX = 40;   /* names; nobody reads more */

/* The edits between two texts: letters added, dropped, replaced or swapped with a neighbour; case does not count. At
 * most the limit. Only the diagonal band below the limit is computed, since a source may have very many names. */
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
    return {std::begin(vxTypeStr) + 1, std::end(vxTypeStr)}; /* the first stands for none */
}

/* Types that have a name but are not accepted, anywhere or in an element. */
bool is_refused(std::string_view type, bool element) {
    return type == "SBS" || (element && (type == "SD" || type == "SDArray"));
}

} // namespace

guess meant_by(std::string_view text, const name_list &names) {
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
    return {best, !best.empty() && least <= 1};
}

std::string_view near_miss(std::string_view text, const name_list &names) {
    return meant_by(text, names).name;
}

std::string suggestion(std::string_view text, const name_list &names) {
    std::string_view meant = near_miss(text, names);
    if (!meant.empty())
        return "did you mean " + quoted(meant) + "?";
    if (names.empty() || names.size() > LISTED_MAX)
        return {};
    return "known are " + listed(names);
}

name_list data_type_names(bool element) {
    name_list names = named_types();
    std::erase_if(names, [&](std::string_view name) { return is_refused(name, element); });
    return names;
}

guess type_meant_by(std::string_view text, bool element) {
    guess meant = meant_by(text, named_types());
    return is_refused(meant.name, element) ? guess() : meant;
}

std::string type_suggestion(std::string_view text, bool element) {
    std::string_view meant = near_miss(text, named_types());
    if (meant.empty() || !is_refused(meant, element))
        return suggestion(text, data_type_names(element));
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

std::string listed(const name_list &names) {
    std::string text;
    for (size_t i = 0; i < names.size(); ++i) {
        text += i == 0 ? "" : i + 1 < names.size() ? ", " : " and ";
        text += quoted(names[i]);
    }
    return text;
}

} // namespace language
