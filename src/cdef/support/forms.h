/* forms.h: the option for the output format, which is the same in all subcommands. */
#ifndef CDGEN_CDEF_FORMS_H
#define CDGEN_CDEF_FORMS_H

#include "cdef/support/command.h"

#include <string>
#include <vector>

namespace cdef {

/* Adds --format, which takes one of the forms, the first of which is the default; also --json, and --hex if there is
 * that form, as short names. The chosen form is stored in `form`, which must outlive the command. */
void add_forms(command &to, std::string &form, const std::vector<std::string> &forms, const std::string &help);

/* Adds --color, which is stored in `colour`; wants_colour() says what it means. */
void add_colour(command &to, std::string &colour);

} // namespace cdef

#endif
