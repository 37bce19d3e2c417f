/* finding_options.cpp: the options of subcommands that check sources. */

#include "cdef/support/finding_options.h"

#include "cdef/support/failure.h"
#include "cdef/support/forms.h"
#include "cdef/support/input.h"
#include "cdef/support/output.h"
#include "check/switches.h"

#include <CLI/CLI.hpp>

#include <cstdio>
#include <string_view>
#include <unistd.h>

namespace cdef {

namespace {

using check::warning;

std::vector<std::string> warning_names() {
    std::vector<std::string> names;
    names.emplace_back("all");
    for (const warning &known : check::warnings) {
        names.emplace_back(known.name);
        names.emplace_back(known.code);
    }
    return names;
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
    if (form != "text") /* which shows it itself */
        print_error(why);
    to.fail_source(why);
}

void add_report_options(CLI::App &command, finding_options &options) {
    add_forms(command, options.form, {"text", "json", "sarif", "github", "gitlab"},
              "Form of the findings; text is written to standard error");
    command.add_option("--max", options.text.shown_max, "Show at most N findings as text, errors first; 0: all")
        ->type_name("N")
        ->check(CLI::NonNegativeNumber)
        ->capture_default_str();
    command.add_flag("-q,--quiet", options.text.quiet, "Show errors only, without a summary, as text");
    add_colour(command, options.colour);
}

void add_project_rules(CLI::App &command, finding_options &options) {
    auto set_count = [&options](bool count) { return [&options, count] { options.warnings_count = count; }; };
    CLI::Option *werror = command.add_flag_callback("--werror", set_count(true), "Count warnings as errors");
    command
        .add_flag_callback("--no-werror", set_count(false),
                           "Do not count warnings as errors, even if cdef.toml says so")
        ->excludes(werror);
    add_project_options(command, options.project);
}

void add_finding_options(CLI::App &command, finding_options &options) {
    add_report_options(command, options);
    command.add_option("--warn", options.wanted, "Turn on warning NAME ('cdef explain' lists names and codes), or all")
        ->type_name("NAME")
        ->allow_extra_args(false)
        ->check(CLI::IsMember(warning_names()).description(""));
    command.add_option("--no-warn", options.unwanted, "Turn off warning NAME, or all")
        ->type_name("NAME")
        ->allow_extra_args(false)
        ->check(CLI::IsMember(warning_names()).description(""));
    add_project_rules(command, options);
}

void require_source(const std::string &path) {
    if (is_database(path))
        throw check::cannot_check(path + ": a database, not a source; 'cdef verify' checks databases");
}

} // namespace cdef
