/* notes.h: what helps to understand an error: the name that was meant, where something was first given, what is
 * missing. */
#ifndef CDGEN_CHECK_NOTES_H
#define CDGEN_CHECK_NOTES_H

#include "check/view.h"

#include <optional>
#include <string>
#include <string_view>

namespace check {

/* kind: that of the stanza at fault; NO_KIND: none. */
void add_notes(finding &found, const fatal_exit &failure, int kind, const view &see);

/* Whether a value was refused only because an earlier number overflowed, which the notes then say. */
bool blames_overflow(const fatal_exit &failure, const view &see);

/* Where the cause of an error is, if that is known and not where the compiler meets it: an earlier line. */
std::optional<mention> cause_of(const fatal_exit &failure, int kind, const view &see);

/* The note for the line in which the compiler meets an error that is reported at its cause. */
std::string stops_here(const fatal_exit &failure, const view &see);

/* The value of an attribute of the ClassToManagerMapping; null if it was not given. */
const mention *map_value(const knowledge &known, std::string_view attribute);

} // namespace check

#endif
