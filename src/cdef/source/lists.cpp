/* lists.cpp: the lines of varieties and of valid values. */

#include "cdef/source/lists.h"

#include "cdef/source/text.h"

#include <algorithm>

namespace cdef::source {

namespace {

bool is_same(const cdb::value &a, const cdb::value &b) {
    if (a.type() == VX_CHAR_PTR)
        return a.text() == b.text();
    if (a.type() == VX_BINARY_PTR)
        return std::equal(a.binary().begin(), a.binary().end(), b.binary().begin(), b.binary().end());
    if (a.type() == VX_INT32 || a.type() == VX_INT64)
        return a.integer() == b.integer();
    if (a.type() == VX_UINT32 || a.type() == VX_UINT64)
        return a.natural() == b.natural();
    return texts_of(a, true) == texts_of(b, true);
}

std::vector<std::string> texts_of_pair(const cdb::valid_value &v) {
    std::vector<std::string> texts;
    for (const std::string &low : texts_of(v.low, true))
        for (const std::string &high : texts_of(v.high, false))
            if (!low.empty() && !high.empty()) /* the compiler refuses an empty end */
                texts.push_back(std::string(low).append(",").append(high));
    return texts;
}

} // namespace

void write_varieties(source_writer &out, const cdb::variety_list &varieties) {
    for (const cdb::variety &v : varieties) {
        out.line("VarietyRange", std::to_string(v.low) + "," + std::to_string(v.high));
        out.flush_if_full();
    }
}

void write_valid_values(source_writer &out, std::string_view name, const cdb::valid_value_list &values) {
    for (const cdb::valid_value &v : values) {
        out.line_of_any(name, is_same(v.low, v.high) ? texts_of(v.low, true) : texts_of_pair(v));
        out.optional_line("ValueDisplayName", v.message, 0);
    }
}

} // namespace cdef::source
