/* diagnosis.h: which findings in a database are consequences of which others. */
#ifndef CDGEN_READER_DIAGNOSIS_H
#define CDGEN_READER_DIAGNOSIS_H

#include "cdb_view.h"

namespace cdb {

/* The code for a number that no rule of verify() is about, but that contradicts the rest of the file. */
inline constexpr std::string_view CODE_CONTRADICTING = "CDB108";

/* The rule of that code. It is not among rules(), because verify() cannot find such a number, only the contradictions.
 */
const rule &contradicting_rule();

/* A finding, and which one it is a consequence of. */
struct diagnosed {
    finding found;
    std::size_t cause; /* position of its cause in the diagnosis; a cause has its own position here */
};

/* What verify() finds, each cause followed by its consequences.
 *
 * If there are several errors and one corrected number of the file removes all of them, the number is the cause of all:
 * the finding at its field, or, if there is none, one of CODE_CONTRADICTING. The numbers that are tried are those that
 * would make the checksum right, and those that a finding or a neighbouring table expects.
 *
 * Otherwise an error in a reference, a list, a table or a section is the cause of the later findings in the same
 * section, and the first error is the cause of a wrong checksum.
 *
 * Takes the time of verify(), and if there are several errors that of some hundred more, but for at most 64 MB. */
std::vector<diagnosed> diagnose(const database &db);

/* The same of what verify() has found. */
std::vector<diagnosed> diagnose(const database &db, std::vector<finding> &&found);

/* Findings of a database that may have millions: the first ones, and how many there are. */
struct first_findings {
    std::vector<finding> kept;
    std::size_t count = 0;
    bool sound = true; /* none of them all is an error */
};

/* Takes the time of verify(). */
first_findings find_first(const database &db, std::size_t most_kept);

} // namespace cdb

#endif
