/* suggestions.h: finds the known name that a misspelt one was meant to be. Pure functions of texts. */
#ifndef CDGEN_LANGUAGE_SUGGESTIONS_H
#define CDGEN_LANGUAGE_SUGGESTIONS_H

#include "language/words.h"

#include <string>
#include <string_view>

namespace language {

/* How a text resembles the name that it was meant to be. */
enum class likeness { one_edit, few_edits, word };

/* The name that a text was meant to be. */
struct guess {
    /* the suggested name; empty if there is no suggestion or more than one */
    std::string_view name() const {
        return names.size() == 1 ? names.front() : std::string_view();
    }
    /* True if no other name is similar. */
    bool is_certain() const {
        return names.size() == 1 && how == likeness::one_edit;
    }

    name_list names = {}; /* up to three names, one of which was probably meant */
    likeness how = likeness::word;
};

/* The name that is most similar to the text: the one with the smallest number of letters added, dropped, replaced or
 * swapped with a neighbour. Case does not count. Empty if no name is similar enough, or if two are equally similar. */
std::string_view near_miss(std::string_view text, const name_list &names);

/* All names that differ from the text by one such edit, or only by case. */
name_list one_edit_from(std::string_view text, const name_list &names);

/* The most similar name; if there is none, the names that the text is a part of. */
guess meant_by(std::string_view text, const name_list &names);

/* Begins a note with a list of names. Such a note is longer than others, and the same for all misspelt names of one
 * kind. */
inline constexpr std::string_view KNOWN_NAMES = "known are ";

/* "did you mean `Name`?" if there is a guess; else "known are `Name` and `Id`", which is empty if there are no names,
 * or too many to read. */
std::string suggestion(const guess &meant, const name_list &names);

/* The same for what a text was meant to be. */
std::string suggestion(std::string_view text, const name_list &names);

/* The data types that the compiler accepts for an attribute, or for an element. */
name_list data_type_names(bool element);

/* The data type that a text was meant to be, if the compiler accepts it. The text may be a type of another language. */
guess type_meant_by(std::string_view text, bool element);

/* Like suggestion(), for a data type. If the text is similar to a type that is not accepted, the note says so. */
std::string type_suggestion(std::string_view text, bool element);

name_list variable_type_names();

/* "`Name`" */
std::string quoted(std::string_view text);

/* "`Name`, `Id` and `DataType`", or with another word before the last one. */
std::string listed(const name_list &names, const char *last = "and");

} // namespace language

#endif
