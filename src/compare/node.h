/* node.h: the records of a database and the entries of its lists, as nodes for comparisons. Nodes are made when they
 * are needed; only their places are kept. */
#ifndef CDGEN_COMPARE_NODE_H
#define CDGEN_COMPARE_NODE_H

#include "compare/kinds.h"
#include "compare/value.h"

#include <optional>
#include <variant>

namespace compare {

/* A database that is compared. Both must outlive all that comes from it. */
struct origin {
    const cdb::database &db;
    const cdb::ownership &owners;
};

/* A section, as far as its records need it. */
struct section_tables {
    cdb::class_tables tables = {};
    std::string_view first_text = {}; /* the text at 0; it is read only once, because any number of references may lead
                                       * to it */
};

/* A record, or an entry of a list. */
struct node {
    node_kind kind;
    const origin *from = nullptr;
    const cdb::record_format *format = nullptr; /* of its record; null: it has no facts except those of an anchor */
    cdb::bytes area{};                          /* that the record is in */
    std::size_t at = 0;                         /* where */
    std::size_t index = 0;                      /* of an element in its structure; of a section among the anchors */
    vx_data_type_t type = VX_UNKNOWN;           /* of a valid value */
    const cdb::field_fact *field = nullptr;     /* of an element: leads to its structure; null for any other kind */
    const section_tables *section = nullptr;    /* null: the whole database, or one of its sections */

    /* The name of its kind in reports: "PersistentResourceAttribute", "valid value", "input element". */
    std::string_view label() const {
        return field != nullptr ? field->label() : row_of(kind).text;
    }
};

/* The place of an element in its structure, which no field holds. */
inline constexpr cdb::field_fact ELEMENT_INDEX = {.field = "ElementIndex", .words = "index"};

/* The content of one field of a record. */
struct fact {
    const cdb::field_fact *what; /* must outlive the fact */
    std::variant<std::uint32_t, std::string_view, owned_value> is;
};

/* ---- Whole databases and sections ------------------------------------------------------------------------------ */

node database_node(const origin &from);

/* A section as a part of its database: it has a name, but neither facts nor parts. room: for its tables. */
node section_node(const origin &from, std::size_t index, section_tables &room);

/* ---- Facts ----------------------------------------------------------------------------------------------------- */

/* The number in a field of the record, or in a part of a reference that is a number. */
inline std::uint32_t number_in(const node &n, const cdb::field &f) {
    cdb::bytes area = f.stays ? cdb::bytes(n.area.raw(), std::endian::native) : n.area; /* stays: never reversed */
    bool is_short = f.width == sizeof(std::uint16_t);
    return is_short ? area.number<std::uint16_t>(n.at + f.offset) : area.number<std::uint32_t>(n.at + f.offset);
}

/* The text that a reference of the record leads to; empty if it leads to nothing. */
std::string_view text_in(const node &n, const cdb::field &f);

/* The data type that the record names for its values; VX_UNKNOWN if it names none. */
vx_data_type_t data_type_of(const node &n);

/* The content of the field at a position in the record's format. No value if the field is not content, or if it leads
 * to parts. */
std::optional<fact> fact_in(const node &n, std::size_t field_index);

/* ---- Parts ----------------------------------------------------------------------------------------------------- */

/* Parts that follow each other in the file. */
struct family {
    node first;
    std::size_t count = 0;
    std::size_t size = 0; /* bytes of one */

    node at(std::size_t index) const;
};

/* The most families of one record: a class has inputs and tables. */
inline constexpr std::size_t FAMILIES_MAX = 16;

struct families {
    std::array<family, FAMILIES_MAX> all;
    std::size_t count = 0;

    void add(const family &one) {
        all.at(count++) = one;
    }
    void clear() {
        count = 0;
    }
};

/* True if nodes of this kind can have parts. */
constexpr bool may_have_parts(node_kind kind) {
    return kind < node_kind::variety || kind == node_kind::element;
}

/* The parts of a record (not of a database). Two nodes of the same kind have families of the same kinds in the same
 * order, some of which may be empty. */
void add_families(const node &n, families &to);

} // namespace compare

#endif
