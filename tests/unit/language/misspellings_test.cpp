/* Measures how many misspelled names are recognised, with all texts that are one edit away from a name. */

#include "format/names.h"
#include "language/names.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cctype>
#include <functional>
#include <map>
#include <set>
#include <string>
#include <vector>

namespace {

using language::guess;
using language::name_list;

constexpr std::string_view LETTERS = "abcdefghijklmnopqrstuvwxyz";

/* What one letter added, dropped, replaced or swapped with its neighbour makes of a name. */
std::set<std::string> one_edit_of(const std::string &name) {
    std::set<std::string> texts;
    for (size_t at = 0; at <= name.size(); ++at)
        for (char letter : LETTERS) {
            texts.insert(std::string(name).insert(at, 1, letter));
            if (at < name.size())
                texts.insert(std::string(name).replace(at, 1, 1, letter));
        }
    for (size_t at = 0; at < name.size(); ++at) {
        texts.insert(std::string(name).erase(at, 1));
        std::string swapped = name;
        std::swap(swapped[at], swapped[std::min(at + 1, name.size() - 1)]);
        texts.insert(swapped);
    }
    return texts;
}

bool is_same(std::string_view a, std::string_view b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end(),
                      [](unsigned char x, unsigned char y) { return std::tolower(x) == std::tolower(y); });
}

struct tally {
    size_t texts = 0;
    size_t found = 0;
    std::vector<std::string> wrong;
};

/* Misspells each of the names that a source may have in one place, or in several alike, and asks which one was meant.
 */
void misspell(tally &count, const name_list &names, const std::function<guess(const std::string &)> &ask,
              size_t places = 1) {
    for (std::string_view name : names)
        for (const std::string &text : one_edit_of(std::string(name))) {
            if (std::any_of(names.begin(), names.end(), [&](std::string_view each) { return is_same(each, text); }))
                continue; /* another name, or the same in other letters */
            std::string_view meant = ask(text).name();
            count.texts += places;
            count.found += meant == name ? places : 0;
            if (!meant.empty() && meant != name)
                count.wrong.push_back(text + " for " + std::string(name) + ": " + std::string(meant));
        }
}

tally measure() {
    tally count;
    auto among = [](const name_list &names) {
        return [&names](const std::string &text) { return language::meant_by(text, names); };
    };
    name_list stanzas = language::stanza_names();
    misspell(count, stanzas, among(stanzas));
    std::map<name_list, size_t> of_kinds; /* with the number of kinds that have these attributes */
    for (const srtable_ctrl &kind : std::span(sc_tables).first(SC_COUNT))
        ++of_kinds[language::attribute_names(kind)];
    for (const srtable_ctrl &kind : std::span(sc_tables).first(SC_COUNT))
        if (auto names = of_kinds.extract(language::attribute_names(kind)); !names.empty())
            misspell(
                count, names.key(), [&](const std::string &text) { return language::attribute_meant_by(text, kind); },
                names.mapped());
    for (int type : {AT_CLASS_PROPS, AT_PATTR_PROPS, AT_DATTR_PROPS, AT_ACTION_PROPS}) {
        name_list properties = language::property_names(type);
        misspell(count, properties, among(properties));
    }
    name_list variable_types = language::variable_type_names();
    misspell(count, variable_types, among(variable_types));
    for (bool element : {false, true})
        misspell(count, language::data_type_names(element),
                 [&](const std::string &text) { return language::type_meant_by(text, element); });
    return count;
}

TEST(Misspellings, OfOneEditFindTheirNameAndNeverAnother) {
    tally count = measure();
    EXPECT_GT(count.texts, 40000u);
    EXPECT_GE(static_cast<double>(count.found), 0.996 * static_cast<double>(count.texts))
        << count.found << " of " << count.texts;
    EXPECT_EQ(count.wrong, std::vector<std::string>());
}

} // namespace
