/* meanings.h: what the names of the language mean, in words for authors of sources. docs/language.md says the same in
 * the same words. `Names of the language` are in backquotes. */
#ifndef CDGEN_LANGUAGE_MEANINGS_H
#define CDGEN_LANGUAGE_MEANINGS_H

#include "language/catalogue.h"

#include <string_view>

namespace language {

struct attribute_meaning {
    unsigned groups; /* of stanzas */
    std::string_view attribute;
    std::string_view meaning;
    std::string_view range = {};   /* which values make sense; empty: what the form says */
    std::string_view without = {}; /* what holds without this line; empty: nothing to say */
};

/* attr: one of the kind's */
const attribute_meaning &meaning_of(const srtable_ctrl &kind, const table_attrs &attr);

/* How an attribute's value is written, such as "number16", by attr_type, and what that means. */
struct value_form {
    std::string_view name;
    std::string_view text;
};
const value_form &form_of(int attr_type);

struct stanza_meaning {
    int kind; /* stanza_id */
    std::string_view meaning;
};
std::string_view meaning_of(const srtable_ctrl &kind);

struct type_meaning {
    std::string_view name;
    std::string_view value;   /* the text of a value */
    std::string_view without; /* the value without one */
};
/* Null for a name that is not that of a data type. */
const type_meaning *type_called(std::string_view name);

/* What a variable type, or a property that the language itself knows, means; empty for other words. */
std::string_view meaning_of_word(std::string_view word);

} // namespace language

#endif
