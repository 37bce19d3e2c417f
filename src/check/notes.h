/* notes.h: notes that help to understand an error: the name that was meant, the place where something was first given,
 * what is missing. */
#ifndef CDGEN_CHECK_NOTES_H
#define CDGEN_CHECK_NOTES_H

#include "check/view.h"

#include <optional>
#include <string>
#include <string_view>

namespace check {

/* kind: that of the stanza at fault; NO_KIND: none. */
void add_notes(finding &found, const fatal_exit &failure, int kind, const view &see);

/* True if a value was refused only because an earlier number overflowed. The notes then say so. */
bool blames_overflow(const fatal_exit &failure, const view &see);

/* The place of the cause of an error, if it is known and is in an earlier line than the compiler reports. */
std::optional<mention> cause_of(const fatal_exit &failure, int kind, const view &see);

/* The note for the line in which the compiler meets an error that is reported at its cause. */
std::string stops_here(const fatal_exit &failure, const view &see);

/* The value of an attribute of the ClassToManagerMapping; null if it was not given. */
const mention *map_value(const knowledge &known, std::string_view attribute);

} // namespace check

#endif
