/* class.h: the walk over a class section. */
#ifndef CDGEN_READER_CLASS_H
#define CDGEN_READER_CLASS_H

#include "reader/report.h"

namespace cdb {

/* at: of the class record. is_last: no class follows in the file. dynamic_ids: receives the variable IDs of the class's
 * dynamic attributes. */
void walk_class(reporter &out, const location &at, const bytes &section, bool is_last,
                std::vector<var_id_t> &dynamic_ids);

} // namespace cdb

#endif
