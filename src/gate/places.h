/* places.h: finds the lines of a source that a difference between databases is about. */
#ifndef CDGEN_GATE_PLACES_H
#define CDGEN_GATE_PLACES_H

#include "check/check.h"
#include "compare/compare.h"
#include "index/stanzas.h"

#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <tuple>
#include <utility>
#include <vector>

namespace gate {

/* A place, and the line that it is in. */
struct located {
    check::place at;
    std::string line;
};

class source_places {
public:
    /* The source of the newer database, which must stay; empty if there is none. It has no errors. */
    explicit source_places(std::string_view text) : source(text), parts(source_index::index_of(text)) {}

    /* The line of a difference: that of the field that changed, or the header of what is new, or of what has lost a
     * part. Without a source, no place. */
    located of(const compare::difference &d) const;

    /* The line of an attribute in the stanza of an attribute or action that has this name; without such a line, the
     * stanza's header. attribute: must stay as long as this. */
    located of(int kind, std::string_view name, std::string_view attribute) const;

private:
    /* A stanza by what it is called: by its ElementName if it is an element, else by its Name. */
    struct called_stanza {
        int kind;
        std::string_view name; /* empty: it has none */
        std::size_t position;  /* in the index */

        bool operator<(const called_stanza &other) const {
            return std::tie(kind, name, position) < std::tie(other.kind, other.name, other.position);
        }
    };
    /* What places are looked up in. */
    struct tables {
        std::vector<called_stanza> by_name;
        std::vector<std::size_t> newlines;       /* offsets */
        const source_index::stanza *first_class; /* null if there is none */
    };

    const tables &lookup() const;
    const source_index::stanza *first_called(int kind, std::string_view name, std::size_t from) const;
    std::size_t begin_of_class(int class_number) const;
    const source_index::stanza *stanza_of(std::span<const compare::node *const> path) const;
    const source_index::stanza *class_stanza(std::string_view name) const;
    const source_index::stanza *named(int kind, std::string_view name, int class_number) const;
    const source_index::stanza *element(const compare::node &part, const source_index::stanza *owner) const;
    const source_index::attribute *first_attribute(const source_index::stanza &in, std::string_view names) const;
    located of_attribute(const source_index::stanza &in, std::string_view names) const;
    located of_header(const source_index::stanza &of) const;
    located at(const source_index::span &part, std::size_t line) const;

    std::string_view source;
    source_index::index parts;
    mutable std::optional<tables> made; /* when the first place is looked up */
    /* By stanza and names. Null: the stanza has no such attribute. */
    mutable std::map<std::pair<const source_index::stanza *, std::string_view>, const source_index::attribute *>
        attributes;
};

/* The kind of stanza that makes records of a kind; -1 if none does. */
int stanza_kind_of(compare::node_kind kind);

} // namespace gate

#endif
