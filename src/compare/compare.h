/* compare.h: what a database means, as a tree that can be compared: nothing of where things stand in the file, of its
 * byte order, or of when it was made. */
#ifndef CDGEN_COMPARE_H
#define CDGEN_COMPARE_H

#include "cdb_view.h"
#include "format/facts.h"
#include "reader/ownership.h"

#include <array>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace cdef {

/* One thing that is known of a record. */
struct fact {
    const cdb::field_fact *what; /* outlives the fact */
    std::string text;            /* printable */
};

/* The place of an element in its structure, which no field holds. */
inline constexpr cdb::field_fact ELEMENT_INDEX = {.field = "ElementIndex", .words = "index"};

/* A record, or an entry of a list, and what belongs to it. */
struct thing {
    std::string kind; /* "PersistentResourceAttribute", "valid value" */
    std::string name; /* printable, a text in quotes; may be empty */
    std::vector<fact> facts;
    std::vector<thing> parts;
};

/* The tables of a class that have a stanza for each record; those of attributes first. */
enum class table : std::uint8_t {
    persistent_class_attributes,
    dynamic_class_attributes,
    persistent_attributes,
    dynamic_attributes,
    class_actions,
    actions,
    inputs /* no table: the class record's five inputs */
};
constexpr std::size_t ATTRIBUTE_TABLES = 4;
constexpr std::size_t RECORD_TABLES = 6;

constexpr cdb::level level_of(table t) {
    return t == table::persistent_class_attributes || t == table::dynamic_class_attributes || t == table::class_actions
               ? cdb::level::of_class
               : cdb::level::of_resource;
}

/* Thrown for a database made by hand whose references lead to the same texts or values so often that writing them all
 * would fill the memory. */
struct too_entangled : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/* Throws too_entangled. */
thing meaning_of(const cdb::database &db, const cdb::ownership &owners);

/* Writes values as a person reads them: 5, 0.1, 'text', 0x0102, [1, 2], {Int32 0}, nothing, misplaced 5.
 *
 * In a database that was compiled each value and each text has one owner, so all of them together are no larger than
 * the file. One made by hand may lead to the same ones again and again; a limit keeps that from filling the memory. */
class teller {
public:
    explicit teller(std::size_t file_size);

    /* strings: of the value's class. */
    std::string text_of(const cdb::value &value, const cdb::bytes &strings);
    std::string text_of(std::string_view text);
    /* is_own: the bound is the attribute's own. */
    std::string text_of_bound(const cdb::value &bound, bool is_own, const cdb::bytes &strings,
                              const cdb::ownership &owners);

private:
    void spend(std::size_t amount);
    std::string text_of_elements(const cdb::value &value, const cdb::bytes &strings);

    std::size_t left;
};

/* How a change shows: what is gone, what is new, what is otherwise. */
enum class change : std::uint8_t { removed, added, changed };

struct difference {
    change what;
    std::vector<const thing *> path; /* from the outermost thing to the one that it is about */
    const fact *before = nullptr;    /* changed only */
    const fact *after = nullptr;     /* changed only */
};

/* In the order of the first one; what is new in a thing after what was there before. */
std::vector<difference> differences(const thing &before, const thing &after);

/* Why a difference keeps readers of the older database from reading the newer one; empty if it does not. */
std::string_view breach(const difference &d);

} // namespace cdef

#endif
