/* compare.h: what a database means, as a tree that can be compared: nothing of where records are in the file, of its
 * byte order, or of when it was made. */
#ifndef CDGEN_COMPARE_H
#define CDGEN_COMPARE_H

#include "cdb_view.h"
#include "compare/kinds.h"
#include "reader/ownership.h"

#include <string>
#include <string_view>
#include <vector>

namespace compare {

/* What a record says in one field. */
struct fact {
    const cdb::field_fact *what; /* outlives the fact */
    std::string text;            /* printable */
};

/* The place of an element in its structure, which no field holds. */
inline constexpr cdb::field_fact ELEMENT_INDEX = {.field = "ElementIndex", .words = "index"};

/* A record, or an entry of a list, and what belongs to it. */
struct node {
    node_kind kind;
    std::string name = {}; /* printable, a text in quotes; may be empty */
    std::vector<fact> facts = {};
    std::vector<node> parts = {};
    const cdb::field_fact *field = nullptr; /* of an element: leads to its structure; null for any other kind */

    /* What a report calls its kind: "PersistentResourceAttribute", "valid value", "input element". */
    std::string_view label() const {
        return field != nullptr ? field->label() : row_of(kind).text;
    }
};

/* Throws too_entangled. */
node meaning_of(const cdb::database &db, const cdb::ownership &owners);

enum class change : std::uint8_t { removed, added, changed };

struct difference {
    change what;
    std::vector<const node *> path; /* from the database to the node that differs */
    const fact *before = nullptr;   /* changed only */
    const fact *after = nullptr;    /* changed only */
};

/* In the order of the first tree. In each node, new parts come after those that were there before. */
std::vector<difference> differences(const node &before, const node &after);

/* Why a difference keeps readers of the older database from reading the newer one; empty if it does not. */
std::string_view breach(const difference &d);

} // namespace compare

#endif
