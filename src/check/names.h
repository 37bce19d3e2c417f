/* names.h: what the catalogue of stanzas says about names. */
#ifndef CDGEN_CHECK_NAMES_H
#define CDGEN_CHECK_NAMES_H

#include "check/known.h"
#include "language/suggestions.h"

#include <string_view>

namespace check {

language::name_list stanza_names();
language::name_list attribute_names(const srtable_ctrl &kind);

/* The stanza kinds that have an attribute of this name. */
kind_set kinds_with(std::string_view name);

/* Of an attribute type whose values are properties. */
language::name_list property_names(int attr_type);

/* The required attributes of a kind that a mask lacks. */
language::name_list missing_names(const srtable_ctrl &kind, vx_uint32_t mask);

} // namespace check

#endif
