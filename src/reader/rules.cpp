/* rules.cpp: what verification checks. */

#include "reader/rules.h"

#include <iterator>

namespace cdb {

namespace {

using enum severity;

/* By check. */
constexpr rule all_rules[] = {
    {"CDB101", error, "file too short for a header"},
    {"CDB102", error, "length in the header is not the file's size minus 4"},
    {"CDB103", error, "missing format word"},
    {CODE_CHECKSUM, error, "wrong checksum"},
    {"CDB105", error, "unknown record size in the header"},
    {CODE_RESERVED, error, "reserved bytes or padding not zero"},
    {"CDB107", error, "ID in the header is not the largest"},
    {"CDB201", error, "anchors extend beyond the end of the file"},
    {"CDB202", error, "section extends beyond the end of the file"},
    {"CDB203", error, "gap or overlap between sections"},
    {"CDB204", error, "unknown section type"},
    {"CDB205", warning, "section of an unused type"},
    {"CDB206", error, "wrong section length"},
    {"CDB207", error, "section out of order"},
    {"CDB301", error, "wrong record identifier"},
    {"CDB302", error, "table does not start where the previous one ends"},
    {"CDB303", error, "table extends beyond the end of the section"},
    {"CDB304", error, "missing reference"},
    {"CDB305", error, "reference outside its table"},
    {"CDB306", error, "reference is not a multiple of 8"},
    {"CDB307", error, "list extends beyond the end of its table"},
    {"CDB308", error, "list with two owners, or overlapping lists"},
    {"CDB309", error, "text outside its table, or unterminated"},
    {"CDB310", error, "invalid data type"},
    {"CDB311", error, "invalid variable type"},
    {"CDB312", error, "variable ID that no dynamic attribute has"},
    {"CDB351", warning, "unknown data type"},
    {"CDB352", warning, "missing text"},
    {CODE_CUT_SHORT, warning, "attribute cut short by a new class: the valid values are not its own"},
    {"CDB354", warning, "structured data without a definition, or of another length than its definition"},
    {"CDB355", warning, "unreferenced bytes in a table of lists"},
    {"CDB401", error, "value outside the strings table"},
    {"CDB402", error, "offset of a value is not a multiple of 8"},
    {"CDB403", error, "value with two owners, or overlapping values"},
    {"CDB404", error, "values nested too deep"},
    {"CDB405", error, "element with an invalid data type"},
    {"CDB451", warning, "missing value"},
    {CODE_RANGE_ASTRAY, warning, "range that follows another attribute's type"},
    {"CDB453", warning, "structured data that differs from its definition"},
};
static_assert(std::size(all_rules) == static_cast<std::size_t>(check::COUNT));

} // namespace

const rule &rule_of(check broken) {
    return all_rules[static_cast<std::size_t>(broken)];
}

std::span<const rule> rules() {
    return all_rules;
}

} // namespace cdb
