/* rules.cpp: the rules that verification checks. */

#include "reader/rules.h"

#include <iterator>

namespace cdb {

namespace {

using enum severity;

constexpr const char *REBUILD = "Compile the source again, or take another copy of the file: this one is damaged.";
constexpr const char *CHECK_SOURCE =
    "If the source is as intended, nothing: readers have to accept such databases. `cdef check` shows what "
    "the source may have meant.";

/* By check. */
constexpr rule all_rules[] = {
    {"CDB101", error, "file too short for a header", "The file has fewer than 80 bytes. Nothing else is checked.",
     "Get the whole file. If this is the whole file, it is not a database."},
    {"CDB102", error, "length in the header is not the file's size minus 4",
     "The file was cut, or something was added to it.", REBUILD},
    {"CDB103", error, "missing format word",
     "The file is not a database, or it is damaged from its start. Nothing after the header is checked.",
     "Make sure that it is the right file, and compile its source again."},
    {CODE_CHECKSUM, error, "wrong checksum", "Something was changed after the file was made.", REBUILD},
    {"CDB105", error, "unknown record size in the header", "The file was made for records of other sizes.", REBUILD},
    {CODE_RESERVED, error, "reserved bytes or padding not zero",
     "Bytes that have no meaning are not 0, although the compiler writes 0 there.", REBUILD},
    {"CDB107", error, "ID in the header is not the largest",
     "The header states another number than the largest one among the classes or managers.", REBUILD},
    {"CDB201", error, "anchors extend beyond the end of the file",
     "The header counts more sections than the file has room for.", REBUILD},
    {"CDB202", error, "section extends beyond the end of the file",
     "An anchor places a section beyond the end of the file.", REBUILD},
    {"CDB203", error, "gap or overlap between sections",
     "A section does not begin where the one before it ends, or the last one does not end with the file.", REBUILD},
    {"CDB204", error, "unknown section type", "An anchor has a type that no section has.", REBUILD},
    {"CDB205", warning, "section of an unused type",
     "An anchor has one of the types 0, 1 and 2, which the compiler never writes. The contents are not checked.",
     "None, if another program adds such sections. Otherwise compile the source again, or take another copy of the "
     "file."},
    {"CDB206", error, "wrong section length",
     "A section is too short for its record, or its length is not the sum of its counts and strings.", REBUILD},
    {"CDB207", error, "section out of order",
     "The sections are not in the order classes, managers, maps, variable classes, class hash.", REBUILD},
    {"CDB301", error, "wrong record identifier", "A record does not begin with the identifier of its kind.", REBUILD},
    {"CDB302", error, "table does not start where the previous one ends",
     "A table of a section does not begin where the one before it ends.", REBUILD},
    {"CDB303", error, "table extends beyond the end of the section", "The counts of a section lead beyond its end.",
     REBUILD},
    {"CDB304", error, "missing reference", "A reference is \"none\" in a place where that is not allowed.", REBUILD},
    {"CDB305", error, "reference outside its table", "A reference to a list leads out of the table of such lists.",
     REBUILD},
    {"CDB306", error, "reference is not a multiple of 8",
     "A reference to a text or a list, or the size of a variable class's strings, is not a multiple of 8.", REBUILD},
    {"CDB307", error, "list extends beyond the end of its table", "The count of a list is too large for its table.",
     REBUILD},
    {"CDB308", error, "list with two owners, or overlapping lists",
     "Two records refer to the same list, or their lists overlap.", REBUILD},
    {"CDB309", error, "text outside its table, or unterminated",
     "A reference leads out of the strings, or the text there does not end.", REBUILD},
    {"CDB310", error, "invalid data type",
     "The number is not a data type: that of an attribute, or of an element of a definition.", REBUILD},
    {"CDB311", error, "invalid variable type", "The number is not a variable type.", REBUILD},
    {"CDB312", error, "variable ID that no dynamic attribute has",
     "A table of variable IDs has one that no dynamic attribute has.", REBUILD},
    {"CDB351", warning, "unknown data type",
     "The type is `UNKNOWN` or `SBS`, which have no values. A source with an element of an unknown type leads to this.",
     "Check the source: S513 names the line."},
    {"CDB352", warning, "missing text", "A reference leads to the first text of an empty table of strings.",
     CHECK_SOURCE},
    {CODE_CUT_SHORT, warning, "attribute cut short by a new class: the valid values are not its own",
     "The source has two classes, and the second one begins before the last attribute of the first is complete.",
     "Check the source: S514 names the attribute."},
    {"CDB354", warning, "structured data without a definition, or of another length than its definition",
     "The source gives an attribute of structured data no elements, or they belong to something else.",
     "Check the source: S502 and S518 name the line."},
    {"CDB355", warning, "unreferenced bytes in a table of lists", "Bytes in a table of lists belong to no list.",
     CHECK_SOURCE},
    {"CDB401", error, "value outside the strings table", "The reference to a value leads out of the strings.", REBUILD},
    {"CDB402", error, "offset of a value is not a multiple of 8", "A value of 8 bytes is not at a multiple of 8.",
     REBUILD},
    {"CDB403", error, "value with two owners, or overlapping values",
     "Two records refer to the same value, or their values overlap. This applies to names and other texts too, except "
     "that a reference that is 0 because no name was given may share the first text.",
     REBUILD},
    {"CDB404", error, "values nested too deep", "More than 64 arrays and structures are inside one another.", REBUILD},
    {"CDB405", error, "element with an invalid data type",
     "An element of structured data has a number that is not a data type.", REBUILD},
    {"CDB451", warning, "missing value", "The cell of a value that is stored out of line is 0.", CHECK_SOURCE},
    {CODE_RANGE_ASTRAY, warning, "range that follows another attribute's type",
     "A `Range` follows an attribute of another kind in the source, and its bounds were stored in the record of the "
     "latest dynamic resource attribute.",
     "Check the source: S503 names the line."},
    {"CDB453", warning, "structured data that differs from its definition",
     "The number or the types of the elements are not those of the definition.", CHECK_SOURCE},
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
