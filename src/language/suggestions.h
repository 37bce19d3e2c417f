/* suggestions.h: which known name a misspelt one may stand for. Pure functions of texts. */
#ifndef CDGEN_LANGUAGE_SUGGESTIONS_H
#define CDGEN_LANGUAGE_SUGGESTIONS_H

#include "language/words.h"

#include <string>
#include <string_view>

namespace language {

/* How a text is like the name that it was meant to be. */
enum class likeness { one_edit, few_edits, word };

/* What a text was meant to be. */
struct guess {
    /* The one name; empty if there is none, or several. */
    std::string_view name() const {
        return names.size() == 1 ? names.front() : std::string_view();
    }
    /* No other name is in sight. */
    bool is_certain() const {
        return names.size() == 1 && how == likeness::one_edit;
    }

    name_list names = {}; /* at most three, one of which was meant */
    likeness how = likeness::word;
};

/* The one name that the text is most like: the one that takes the fewest letters added, dropped, replaced or swapped
 * with a neighbour. Case does not count. Empty if no name is near enough, or if two are equally near. */
std::string_view near_miss(std::string_view text, const name_list &names);

/* All names that take one edit, as above, or none but the case of letters. */
name_list one_edit_from(std::string_view text, const name_list &names);

/* The near miss of a text; without one, the names that it is a part of. */
guess meant_by(std::string_view text, const name_list &names);

/* Begins a list of names. It is longer than other notes, and the same for all misspelt names of one kind. */
inline constexpr std::string_view KNOWN_NAMES = "known are ";

/* "did you mean `Name`?" if there is a guess; else "known are `Name` and `Id`", which is empty if there are no names,
 * or too many to read. */
std::string suggestion(const guess &meant, const name_list &names);

/* The same for what a text is meant by. */
std::string suggestion(std::string_view text, const name_list &names);

/* The data types that the compiler accepts for an attribute, or for an element. */
name_list data_type_names(bool element);

/* The data type that a text was meant to be, if the compiler accepts it. It may be one of another language. */
guess type_meant_by(std::string_view text, bool element);

/* As suggestion(), for a data type; for a text near a type that is not accepted it says so. */
std::string type_suggestion(std::string_view text, bool element);

name_list variable_type_names();

/* "`Name`" */
std::string quoted(std::string_view text);

/* "`Name`, `Id` and `DataType`", or with another word before the last one. */
std::string listed(const name_list &names, const char *last = "and");

} // namespace language

#endif
