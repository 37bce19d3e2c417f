/* fields.h: the fields that the lines of a stanza fill. */
#ifndef CDGEN_LANGUAGE_FIELDS_H
#define CDGEN_LANGUAGE_FIELDS_H

#include "format/records.h"
#include "language/catalogue.h"

namespace language {

/* The record that a stanza fills; for structured data, the one element that is staged at a time. */
const cdb::record_format &record_of(const srtable_ctrl &stanza);

/* Its offset in what is staged, from which the catalogue's offsets count; in bytes. */
std::size_t record_start(const srtable_ctrl &stanza);

/* Whether the attribute's lines fill the field of this row. An attribute that is only checked, refused or ignored names
 * a field that it does not fill. */
bool fills(const table_attrs &attribute, const cdb::field_fact &row);

} // namespace language

#endif
