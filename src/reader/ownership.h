/* ownership.h: whose a list of valid values or a bound is, where the reference alone does not say.
 *
 * Two references may lead to what is not their record's own. An attribute that a following class cut short refers to
 * the first list of valid values (offset 0) whether it has that list or none. And the bounds of a dynamic resource
 * attribute may be the range of a class attribute of another type. The walk of verify() decides both, and every
 * subcommand asks for its decision here. */
#ifndef CDGEN_READER_OWNERSHIP_H
#define CDGEN_READER_OWNERSHIP_H

#include "cdb_view.h"

namespace cdb {

/* ---- The decision ---------------------------------------------------------------------------------------------- */

/* An attribute that was cut short and refers to the first list of valid values of its class: the list is its own, or
 * it has none. */
struct suspect {
    bool can_have_it;                  /* see can_have_list */
    std::uint32_t began;               /* offset of its variety list; these are made in the order of the stanzas */
    std::uint32_t name;                /* offset of its name in the strings */
    std::optional<std::uint32_t> text; /* offset of the first value in the strings, if such values are stored there */
};

/* What the other records of the class say about its first list of valid values. */
struct first_list_evidence {
    bool has_owner = false;             /* a record refers to it that would otherwise refer to none */
    std::uint32_t later_list = SIZE_32; /* variety list of the first attribute that has a later list of valid values,
                                           for itself or for its elements */
    static constexpr std::uint32_t SIZE_32 = 0xFFFFFFFF;
};

/* Whether an attribute of a type can have given the list, entry for entry; with is_complete: only a stanza that has all
 * its required lines can have valid values. */
bool can_have_list(const valid_value_list &list, const bytes &strings, bool is_complete);

/* Offset of the list's first value in the strings; nothing if its values are stored in the list itself. */
std::optional<std::uint32_t> first_text(const valid_value_list &list);

/* The suspect that has the first list; nothing if it belongs to another record or to none.
 *
 * Valid values follow the name in their stanza, and so do their texts in the strings: texts belong to the latest
 * suspect whose name comes before them. Numbers leave no such trace; they belong to the earliest suspect, whose list is
 * made first. */
std::optional<std::size_t> owner_of_first_list(std::span<const suspect> suspects, const first_list_evidence &others);

/* ---- The answer ------------------------------------------------------------------------------------------------ */

/* The offset in the file of a reference or a cell that leads to what is not its record's own, if that is what verify()
 * found. */
std::optional<std::size_t> stray_of(const finding &f);

/* Which references and value cells lead to what is their record's own. */
class ownership {
public:
    /* found: the strays among all that verify() finds in the database, in any order. */
    ownership(const database &db, std::vector<std::size_t> found);

    /* offset: of the reference or the cell, in the file. */
    bool is_own(std::size_t offset) const {
        return !std::binary_search(strays.begin(), strays.end(), offset);
    }
    /* The same of a reference or cell in a part of the database. */
    bool is_own(const bytes &part, std::size_t at) const {
        return part.size() == 0 || is_own(static_cast<std::size_t>(part.raw().data() - start) + at);
    }

private:
    const std::byte *start;
    std::vector<std::size_t> strays; /* sorted offsets in the file */
};

} // namespace cdb

#endif
