/* rules.cpp: what verification checks. */

#include "reader/rules.h"

#include <iterator>

namespace cdb {

namespace {

using enum severity;

/* By check. */
constexpr rule all_rules[] = {
    {"CDB101", error, "file too short for a header"},
    {"CDB102", error, "length in the header is not the file's size less 4"},
    {"CDB103", error, "no format word"},
    {CODE_CHECKSUM, error, "wrong checksum"},
    {"CDB105", error, "unknown record size in the header"},
    {CODE_RESERVED, error, "reserved bytes or filling not zero"},
    {"CDB107", error, "not the largest ID"},
    {"CDB201", error, "anchors beyond the end of the file"},
    {"CDB202", error, "section beyond the end of the file"},
    {"CDB203", error, "gap or overlap between sections"},
    {"CDB204", error, "unknown section type"},
    {"CDB205", warning, "section of an unused type"},
    {"CDB206", error, "wrong section length"},
    {"CDB207", error, "section out of order"},
    {"CDB301", error, "wrong record identifier"},
    {"CDB302", error, "table not where the one before it ends"},
    {"CDB303", error, "table beyond the end of the section"},
    {"CDB304", error, "reference is none"},
    {"CDB305", error, "reference out of its table"},
    {"CDB306", error, "reference to no multiple of 8"},
    {"CDB307", error, "list beyond the end of its table"},
    {"CDB308", error, "list with two owners, or overlapping lists"},
    {"CDB309", error, "text out of its table, or without end"},
    {"CDB310", error, "no data type"},
    {"CDB311", error, "no variable type"},
    {"CDB312", error, "variable ID of no dynamic attribute"},
    {"CDB351", warning, "unknown data type"},
    {"CDB352", warning, "text missing"},
    {CODE_CUT_SHORT, warning, "attribute cut short by a new class: the valid values are not its own"},
    {"CDB354", warning, "structured data without definition, or of another length than it"},
    {"CDB355", warning, "bytes in a table of lists that nothing refers to"},
    {"CDB401", error, "value out of the strings"},
    {"CDB402", error, "value at no multiple of 8"},
    {"CDB403", error, "value with two owners, or overlapping values"},
    {"CDB404", error, "values nested too deep"},
    {"CDB405", error, "element of no data type"},
    {"CDB451", warning, "value missing"},
    {CODE_RANGE_ASTRAY, warning, "range of another attribute's type"},
    {"CDB453", warning, "structured data differ from their definition"},
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
