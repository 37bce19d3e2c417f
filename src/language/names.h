/* names.h: the names in the catalogue, for messages and suggestions. */
#ifndef CDGEN_LANGUAGE_NAMES_H
#define CDGEN_LANGUAGE_NAMES_H

#include "language/catalogue.h"
#include "language/suggestions.h"

#include <bitset>
#include <string_view>
#include <vector>

namespace language {

/* Stanza kinds, by stanza_id. */
using kind_set = std::bitset<SC_COUNT>;

name_list stanza_names();
name_list attribute_names(const srtable_ctrl &kind);

/* The stanza kinds that have an attribute of exactly this name. */
kind_set kinds_with(std::string_view attribute);

/* The attribute of a kind that was probably meant by a text. This is an attribute with a similar name, or one that has
 * the same purpose in this kind as the named attribute in other kinds: for `InitialValue` in a persistent attribute it
 * is `DefaultValue`. */
guess attribute_meant_by(std::string_view text, const srtable_ctrl &kind);

/* The properties that an attribute type, such as AT_PATTR_PROPS, takes. */
name_list property_names(int attr_type);

/* Whether the one of two attributes of a kind usually comes first in a stanza. Required ones are in the order of their
 * bits, except that those that may be repeated are last. Optional ones are in the catalogue's order, except that a name
 * is first. */
bool comes_before(const table_attrs &one, const table_attrs &other);

/* The attributes of a kind in this order. */
std::vector<const table_attrs *> in_usual_order(const srtable_ctrl &kind);

/* The required attributes of a kind that are not in seen, a mask of their req_bits. */
name_list missing_names(const srtable_ctrl &kind, vx_uint32_t seen);

} // namespace language

#endif
