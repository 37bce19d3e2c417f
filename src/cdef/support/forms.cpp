/* forms.cpp: the option for the output format of a subcommand. */

#include "cdef/support/forms.h"

#include <algorithm>

namespace cdef {

void add_forms(command &to, std::string &form, const std::vector<std::string> &forms, const std::string &help) {
    form = forms.front();
    option format = to.add("--format", form, help + " (default: " + form + ")").called("FORM").one_of(forms);
    std::optional<option> former;
    for (const std::string short_form : {"json", "hex"}) {
        if (std::find(forms.begin(), forms.end(), short_form) == forms.end())
            continue;
        auto choose = [&form, short_form] { form = short_form; };
        option flag = to.add_flag("--" + short_form, choose, "Short for --format " + short_form).excludes(format);
        if (former)
            flag.excludes(*former);
        former = flag;
    }
}

void add_colour(command &to, std::string &colour) {
    colour = "auto";
    to.add("--color", colour, "Whether text has colours; auto: on a terminal (default: auto)")
        .called("WHEN")
        .one_of({"auto", "always", "never"});
}

} // namespace cdef
