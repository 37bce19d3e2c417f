/* words.cpp: names that consist of words. */

#include "language/words.h"

#include <algorithm>
#include <cctype>
#include <cstddef>
#include <iterator>

namespace language {

namespace {

bool is_upper(char c) {
    return std::isupper(static_cast<unsigned char>(c)) != 0;
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

} // namespace

name_list words_of(std::string_view name) {
    name_list words;
    std::size_t begin = 0;
    for (std::size_t at = 1; at <= name.size(); ++at)
        if (at == name.size() || begins_word(name, at)) {
            words.push_back(name.substr(begin, at - begin));
            begin = at;
        }
    return words;
}

bool is_part(std::string_view text, std::string_view name) {
    name_list wanted = words_of(text);
    std::size_t found = 0;
    for (std::string_view word : words_of(name))
        if (found < wanted.size() && starts_with(word, wanted[found]))
            ++found;
    return found == wanted.size();
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
