/* words.h: names that consist of words, as `DataType` does of `Data` and `Type`. Pure functions of texts. */
#ifndef CDGEN_LANGUAGE_WORDS_H
#define CDGEN_LANGUAGE_WORDS_H

#include <string_view>
#include <vector>

namespace language {

using name_list = std::vector<std::string_view>;

/* The words of a name: "PAttrSDDefinition" has "P", "Attr", "SD" and "Definition". */
name_list words_of(std::string_view name);

/* True if a text is a name with words left out or shortened, in upper or lower case: "desc" is a part of
 * "ReArmDescription", and "PersistentAttribute" of "PersistentResourceAttribute". */
bool is_part(std::string_view text, std::string_view name);

/* The names that a text of at least three letters is a part of. */
name_list names_with_part(std::string_view text, const name_list &names);

} // namespace language

#endif
