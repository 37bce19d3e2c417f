/* names.h: the names that a source defines, and the places where it uses them. */
#ifndef CDGEN_INDEX_NAMES_H
#define CDGEN_INDEX_NAMES_H

#include "index/stanzas.h"

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace source_index {

enum class name_kind : std::uint8_t {
    resource_class,
    persistent_resource,
    persistent_class,
    dynamic_resource,
    dynamic_class,
    resource_action,
    class_action,
    variable_class,
    element
};

/* A name in a source. Names of attributes and actions are distinct in each kind and class, those of elements in each
 * run. */
struct named {
    name_kind kind;
    std::size_t scope = 0; /* the number of the class; of an element its run; 0 for variable classes */
    std::string text;
    bool in_expressions = false; /* some expression uses it */
};

/* A place where a name is written. */
struct mention {
    span at;
    std::size_t name = 0;   /* in names::all */
    std::size_t stanza = 0; /* in index::stanzas */
    bool defines = false;
};

struct names {
    std::vector<named> all;
    std::vector<mention> mentions; /* in the order of the source */

    /* The mention at an offset; null if there is none. */
    const mention *at(std::size_t offset) const;
    /* All mentions of a name, in order. */
    std::vector<mention> of(std::size_t name) const;
};

/* index: that of the source */
names names_of(std::string_view source, const index &of);

/* The kind of name that stanzas of this kind define; null: none. */
const name_kind *defined_by(int stanza_kind);

} // namespace source_index

#endif
