/* sections.h: the walks over all sections but classes. */
#ifndef CDGEN_READER_SECTIONS_H
#define CDGEN_READER_SECTIONS_H

#include "reader/report.h"

namespace cdb {

/* at: of the section's record. */
void walk_manager(reporter &out, const location &at, const bytes &section);
void walk_map(reporter &out, const location &at, const bytes &section);
void walk_class_hash(reporter &out, const location &at, const bytes &section);
/* dynamic_ids: of all dynamic attributes, sorted. */
void walk_variable_class(reporter &out, const location &at, const bytes &section,
                         std::span<const var_id_t> dynamic_ids);

} // namespace cdb

#endif
