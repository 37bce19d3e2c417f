/* words.cpp: names that consist of words. */

#include "language/words.h"

#include <algorithm>
#include <cctype>
#include <cstddef>
#include <iterator>

namespace language {

namespace {

bool is_upper(char c) {
    return c >= 'A' && c <= 'Z';
}

bool starts_with(std::string_view word, std::string_view beginning) {
    auto same = [](char a, char b) {
        return std::tolower(static_cast<unsigned char>(a)) == std::tolower(static_cast<unsigned char>(b));
    };
    return beginning.size() <= word.size() && std::equal(beginning.begin(), beginning.end(), word.begin(), same);
}

/* A capital begins a word unless it follows one; of several capitals the last one does if a small letter follows. */
bool begins_word(std::string_view name, std::size_t at) {
    bool after_capital = is_upper(name[at - 1]);
    bool before_small = at + 1 < name.size() && !is_upper(name[at + 1]);
    return is_upper(name[at]) && (!after_capital || before_small);
}

/* Removes the first word of a name, which is not empty. */
std::string_view take_word(std::string_view &name) {
    std::size_t end = 1;
    while (end < name.size() && !begins_word(name, end))
        ++end;
    std::string_view word = name.substr(0, end);
    name.remove_prefix(end);
    return word;
}

} // namespace

name_list words_of(std::string_view name) {
    name_list words;
    while (!name.empty())
        words.push_back(take_word(name));
    return words;
}

/* Makes no lists of words, because a source may have very many names. */
bool is_part(std::string_view text, std::string_view name) {
    while (!text.empty()) {
        std::string_view wanted = take_word(text);
        do {
            if (name.empty())
                return false;
        } while (!starts_with(take_word(name), wanted));
    }
    return true;
}

name_list names_with_part(std::string_view text, const name_list &names) {
    constexpr std::size_t SHORTEST = 3;
    name_list parts;
    if (text.size() >= SHORTEST)
        std::copy_if(names.begin(), names.end(), std::back_inserter(parts),
                     [&](std::string_view name) { return is_part(text, name); });
    return parts;
}

} // namespace language
