/* finding_options.cpp: the options of subcommands that check sources. */

#include "cdef/support/finding_options.h"

#include "cdef/support/failure.h"
#include "cdef/support/forms.h"
#include "cdef/support/input.h"
#include "cdef/support/output.h"
#include "check/switches.h"
#include "language/suggestions.h"

#include <algorithm>
#include <cstdio>
#include <string_view>
#include <unistd.h>

namespace cdef {

namespace {

using check::warning;

std::string check_warning(const std::string &name) {
    language::name_list names = {"all"};
    for (const warning &known : check::warnings)
        names.insert(names.end(), {known.name, known.code});
    if (std::find(names.begin(), names.end(), name) != names.end())
        return {};
    std::string meant = language::suggestion(name, names);
    return "unknown warning " + language::quoted(name) + "; " + (meant.empty() ? "" : meant + " ") +
           "'cdef explain' lists all";
}

void show_text(std::string_view text) {
    if (std::fwrite(text.data(), 1, text.size(), stderr) != text.size())
        throw failure("standard error: cannot write");
}

} // namespace

finding_rules finding_options::rules(const config::settings &settings) const {
    finding_rules all = {settings.warnings(), warnings_count.value_or(settings.warnings_count)};
    check::switch_warnings(all.wanted, unwanted, false);
    check::switch_warnings(all.wanted, wanted, true);
    return all;
}

std::unique_ptr<report::writer> finding_options::writer(const std::vector<report::rule> &more) const {
    if (form == "json")
        return report::json_form(print);
    if (form == "sarif")
        return report::sarif_form(print, more);
    if (form == "github")
        return report::github_form(print);
    if (form == "gitlab")
        return report::gitlab_form(print);
    report::text_settings settings = text;
    settings.coloured = wants_colour(colour, STDERR_FILENO);
    return report::text_form(show_text, settings);
}

void finding_options::fail_source(report::writer &to, const std::string &why) const {
    if (form != "text") /* that form shows the reason itself */
        print_error(why);
    to.fail_source(why);
}

void add_report_options(command &to, finding_options &options) {
    add_forms(to, options.form, {"text", "json", "sarif", "github", "gitlab"},
              "Form of the findings; text is written to standard error");
    to.add_count("--max", options.text.shown_max,
                 "Show at most N findings as text, leaving out warnings first; 0: all");
    to.add_flag("-q,--quiet", options.text.quiet, "Show errors only, without a summary, as text");
    add_colour(to, options.colour);
}

void add_project_rules(command &to, finding_options &options) {
    auto set_count = [&options](bool count) { return [&options, count] { options.warnings_count = count; }; };
    option werror = to.add_flag("--werror", set_count(true), "Count warnings as errors");
    to.add_flag("--no-werror", set_count(false), "Do not count warnings as errors, even if cdef.toml says so")
        .excludes(werror);
    add_project_options(to, options.project);
}

void add_finding_options(command &to, finding_options &options) {
    add_report_options(to, options);
    to.add("--warn", options.wanted, "Turn on warning NAME ('cdef explain' lists names and codes), or all")
        .called("NAME")
        .one_value_each()
        .checked(check_warning);
    to.add("--no-warn", options.unwanted, "Turn off warning NAME, or all")
        .called("NAME")
        .one_value_each()
        .checked(check_warning);
    add_project_rules(to, options);
}

void require_source(const std::string &path) {
    if (is_database(path))
        throw check::cannot_check(path + ": a database, not a source; 'cdef verify' checks databases");
}

} // namespace cdef
