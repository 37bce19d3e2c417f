/* suggestions.h: which known name a misspelt one may stand for. Pure functions of texts. */
#ifndef CDGEN_LANGUAGE_SUGGESTIONS_H
#define CDGEN_LANGUAGE_SUGGESTIONS_H

#include <string>
#include <string_view>
#include <vector>

namespace language {

using name_list = std::vector<std::string_view>;

/* The one name that the text is most like: the one that takes the fewest letters added, dropped, replaced or swapped
 * with a neighbour. Case does not count. Empty if no name is near enough, or if two are equally near. */
std::string_view near_miss(std::string_view text, const name_list &names);

/* What a text was meant to be. */
struct guess {
    std::string_view name; /* empty: nothing is like the text */
    bool certain = false;  /* one edit makes the name of the text, and only this name */
};

/* The near miss of a text, and how sure it is. */
guess meant_by(std::string_view text, const name_list &names);

/* "did you mean `Name`?" if there is a near miss, or else "known are `Name` and `Id`"; empty if there are no names, or
 * too many to read. */
std::string suggestion(std::string_view text, const name_list &names);

/* The data types that the compiler accepts for an attribute, or for an element. */
name_list data_type_names(bool element);

/* As suggestion(), for a data type; for a text near a type that is not accepted it says so. */
std::string type_suggestion(std::string_view text, bool element);

/* The data type that a text was meant to be, if the compiler accepts it. */
guess type_meant_by(std::string_view text, bool element);

name_list variable_type_names();

/* "`Name`" */
std::string quoted(std::string_view text);

/* "`Name`, `Id` and `DataType`" */
std::string listed(const name_list &names);

} // namespace language

#endif
