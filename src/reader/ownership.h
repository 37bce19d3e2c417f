/* ownership.h: decides who owns a list of valid values or a bound if the reference alone does not show it.
 *
 * Two kinds of references may lead to something that another record owns. An attribute that a following class cut short
 * refers to the first list of valid values (offset 0) even if it has no list. And the bounds of a dynamic resource
 * attribute may be the range of a class attribute of another type. verify() decides both cases, and every subcommand
 * asks for the decision here. */
#ifndef CDGEN_READER_OWNERSHIP_H
#define CDGEN_READER_OWNERSHIP_H

#include "cdb_view.h"

namespace cdb {

/* ---- The decision ---------------------------------------------------------------------------------------------- */

/* An attribute that was cut short and refers to the first list of valid values of its class. It may own the list or
 * have no list. */
struct suspect {
    bool can_have_it;                  /* see can_have_list */
    std::uint32_t began;               /* offset of its variety list; these are made in the order of the stanzas */
    std::uint32_t name;                /* offset of its name in the strings */
    std::optional<std::uint32_t> text; /* offset of the first value in the strings, if such values are stored there */
};

/* What the other records of the class say about its first list of valid values. */
struct first_list_evidence {
    bool has_owner = false;             /* a record refers to it whose reference would be "none" if it had no list */
    std::uint32_t later_list = SIZE_32; /* variety list of the first attribute that has a later list of valid values,
                                           for itself or for its elements */
    static constexpr std::uint32_t SIZE_32 = 0xFFFFFFFF;
};

/* True if the entries of the list can come from an attribute of this type. Only a stanza that has all its required
 * lines (is_complete) can have valid values. */
bool can_have_list(const valid_value_list &list, const bytes &strings, bool is_complete);

/* Offset of the list's first value in the strings; no value if its values are stored in the list itself. */
std::optional<std::uint32_t> first_text(const valid_value_list &list);

/* The suspect that owns the first list; no value if another record owns it, or no record does.
 *
 * Valid values follow the name in their stanza, and so do their texts in the strings: texts belong to the latest
 * suspect whose name comes before them. Numbers leave no such trace; they belong to the earliest suspect, whose list is
 * made first. */
std::optional<std::size_t> owner_of_first_list(std::span<const suspect> suspects, const first_list_evidence &others);

/* ---- The answer ------------------------------------------------------------------------------------------------ */

/* If the finding is about a reference or a cell that leads to something another record owns, the offset of that
 * reference or cell in the file. */
std::optional<std::size_t> stray_of(const finding &f);

/* Knows which references and value cells lead to something that their own record owns. */
class ownership {
public:
    /* found: the offsets of the others, which verify() found in the database, in any order. */
    ownership(const database &db, std::vector<std::size_t> found);

    /* offset: of the reference or the cell, in the file. */
    bool is_own(std::size_t offset) const {
        return !std::binary_search(strays.begin(), strays.end(), offset);
    }
    /* The same for a reference or cell in a part of the database. */
    bool is_own(const bytes &part, std::size_t at) const {
        return part.size() == 0 || is_own(static_cast<std::size_t>(part.raw().data() - start) + at);
    }

private:
    const std::byte *start;
    std::vector<std::size_t> strays; /* sorted offsets in the file */
};

} // namespace cdb

#endif
