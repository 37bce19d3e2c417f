/* forms.h: the option that chooses the form of what a subcommand shows. It is spelled alike in all of them. */
#ifndef CDGEN_CDEF_FORMS_H
#define CDGEN_CDEF_FORMS_H

#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace cdef {

/* Adds --format, which takes one of the forms, the first of which is the default; and --json, and --hex where there is
 * that form, which are short for it. The chosen form is stored in `form`, which must stay as long as the command. */
void add_forms(CLI::App &command, std::string &form, const std::vector<std::string> &forms, const std::string &help);

/* Adds --color, which is stored in `colour`; wants_colour() says what it means. */
void add_colour(CLI::App &command, std::string &colour);

} // namespace cdef

#endif
