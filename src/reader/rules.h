/* rules.h: the rules that verification checks, by name. */
#ifndef CDGEN_READER_RULES_H
#define CDGEN_READER_RULES_H

#include "cdb_view.h"

namespace cdb {

/* In the order of rules(). */
enum class check : std::size_t {
    FILE_SHORT,
    FILE_LENGTH,
    FORMAT,
    CHECKSUM,
    RECORD_SIZE,
    RESERVED,
    LARGEST_ID,
    ANCHORS_OUTSIDE,
    SECTION_OUTSIDE,
    SECTION_PLACE,
    SECTION_TYPE,
    SECTION_UNUSED,
    SECTION_LENGTH,
    SECTION_ORDER,
    RECORD_ID,
    TABLE_PLACE,
    TABLE_OUTSIDE,
    REFERENCE_NONE,
    REFERENCE_OUTSIDE,
    REFERENCE_UNALIGNED,
    LIST_OUTSIDE,
    LIST_SHARED,
    TEXT_OUTSIDE,
    DATA_TYPE,
    VARIABLE_TYPE,
    VARIABLE_ID,
    UNKNOWN_TYPE,
    TEXT_MISSING,
    CUT_SHORT,
    SD_MISSING,
    LIST_UNREACHED,
    VALUE_OUTSIDE,
    VALUE_UNALIGNED,
    VALUE_SHARED,
    VALUE_NESTING,
    VALUE_TYPE,
    VALUE_MISSING,
    RANGE_ASTRAY,
    SD_DIFFERS,
    COUNT
};

const rule &rule_of(check broken);

} // namespace cdb

#endif
