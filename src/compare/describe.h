/* describe.h: a difference as a line of text. */
#ifndef CDGEN_COMPARE_DESCRIBE_H
#define CDGEN_COMPARE_DESCRIBE_H

#include "compare/compare.h"
#include "compare/writer.h"

namespace compare {

/* Whether a database has exactly one class. Lines about two such databases leave out which one they are about. */
bool has_one_class(const cdb::database &db);

/* "- DynamicResourceAttribute 'CpuLoad'", without a newline. one_class: both databases have one. */
void describe(const difference &d, bool one_class, writer &to);

} // namespace compare

#endif
