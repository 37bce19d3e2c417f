/* forms.cpp: the option for the output format of a subcommand. */

#include "cdef/support/forms.h"

#include <CLI/CLI.hpp>

#include <algorithm>

namespace cdef {

void add_forms(CLI::App &command, std::string &form, const std::vector<std::string> &forms, const std::string &help) {
    form = forms.front();
    CLI::Option *format = command.add_option("--format", form, help)->check(CLI::IsMember(forms));
    CLI::Option *former = nullptr;
    for (const std::string short_form : {"json", "hex"}) {
        if (std::find(forms.begin(), forms.end(), short_form) == forms.end())
            continue;
        auto choose = [&form, short_form] { form = short_form; };
        CLI::Option *flag = command.add_flag_callback("--" + short_form, choose, "Short for --format " + short_form);
        flag->excludes(format);
        if (former != nullptr)
            flag->excludes(former);
        former = flag;
    }
}

void add_colour(CLI::App &command, std::string &colour) {
    colour = "auto";
    command.add_option("--color", colour, "Whether text has colours; auto: on a terminal")
        ->check(CLI::IsMember({"auto", "always", "never"}));
}

} // namespace cdef
