/* check.cpp: all that is wrong with sources, and what is odd in them. */

#include "check/check.h"

#include "cdef/cdef.h"
#include "cdef/check/fix.h"
#include "cdef/support/failure.h"
#include "cdef/support/forms.h"
#include "cdef/support/input.h"
#include "cdef/support/output.h"
#include "report/report.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <cstdio>
#include <memory>
#include <string>
#include <string_view>
#include <unistd.h>
#include <vector>

namespace cdef {

namespace {

using check::warning;

struct check_options {
    std::vector<std::string> sources;
    std::string form;
    std::vector<std::string> wanted;
    std::vector<std::string> unwanted;
    bool warnings_count = false; /* as errors do */
    bool fixes = false;
    bool changes_nothing = false; /* only shows what would be fixed */
    report::text_settings text = {.shown_max = 100};
    std::string colour = "auto";
};

std::vector<std::string> warning_names() {
    std::vector<std::string> names;
    names.emplace_back("all");
    for (const warning &known : check::warnings) {
        names.emplace_back(known.name);
        names.emplace_back(known.code);
    }
    return names;
}

void switch_warnings(check::warning_set &set, const std::vector<std::string> &names, bool on) {
    for (const std::string &name : names)
        for (const warning &known : check::warnings)
            if (name == "all" || name == known.name || name == known.code)
                set[known.id] = on;
}

/* All but the unwanted ones; a name that is given both ways is wanted. */
check::warning_set chosen(const check_options &options) {
    check::warning_set set;
    set.fill(true);
    switch_warnings(set, options.unwanted, false);
    switch_warnings(set, options.wanted, true);
    return set;
}

void show_text(std::string_view text) {
    if (std::fwrite(text.data(), 1, text.size(), stderr) != text.size())
        throw failure("standard error: cannot write");
}

std::unique_ptr<report::writer> form_of(const check_options &options) {
    if (options.form == "json")
        return report::json_form(print);
    if (options.form == "sarif")
        return report::sarif_form(print);
    if (options.form == "github")
        return report::github_form(print);
    if (options.form == "gitlab")
        return report::gitlab_form(print);
    report::text_settings settings = options.text;
    settings.coloured = wants_colour(options.colour, STDERR_FILENO);
    return report::text_form(show_text, settings);
}

check::totals check_source(const std::string &source, const check_options &options, report::writer &to) {
    check::warning_set wanted = chosen(options);
    auto add = [&to](const check::finding &found) { to.add(found); };
    if (is_database(source))
        throw check::cannot_check(source + ": a database, not a source; 'cdef verify' checks databases");
    if (options.fixes)
        return check::check_bytes(fix_source(source, wanted, options.changes_nothing), source, wanted, add);
    return check::check_file(source, wanted, add);
}

/* Standard output takes the findings in most forms, so the fixed source or the diff cannot go there too. */
void require_output(const check_options &options) {
    bool from_input = std::find(options.sources.begin(), options.sources.end(), "-") != options.sources.end();
    if (options.fixes && (options.changes_nothing || from_input) && options.form != "text")
        throw failure("--fix writes to standard output here, and so does --format " + options.form);
}

/* Checks all sources. */
int check_all(const check_options &options) {
    require_output(options);
    std::unique_ptr<report::writer> form = form_of(options);
    bool pass = true;
    bool read = true;
    for (const std::string &source : options.sources) {
        form->begin_source(source);
        try {
            check::totals count = check_source(source, options, *form);
            form->end_source(count);
            pass = pass && count.errors == 0 && (count.warnings == 0 || !options.warnings_count);
        } catch (const check::cannot_check &unreadable) {
            if (options.form != "text") /* which shows it itself */
                print_error(unreadable.what());
            form->fail_source(unreadable.what());
            read = false;
        }
    }
    form->close();
    return !read ? FAILED : pass ? OK : FOUND;
}

} // namespace

void add_check(CLI::App &app, int &status) {
    auto options = std::make_shared<check_options>();
    CLI::App *command = app.add_subcommand("check", "Checks sources and reports every mistake, not just the first");
    command->add_option("SOURCE", options->sources, "Source to check; - is standard input")->required();
    add_forms(*command, options->form, {"text", "json", "sarif", "github", "gitlab"},
              "Form of the findings; text is written to standard error");
    command->add_option("--max", options->text.shown_max, "Show at most N findings as text, errors first; 0: all")
        ->type_name("N")
        ->check(CLI::NonNegativeNumber)
        ->capture_default_str();
    command->add_flag("-q,--quiet", options->text.quiet, "Show errors only, without a summary, as text");
    add_colour(*command, options->colour);
    command->add_option("--warn", options->wanted, "Turn on warning NAME, or all")
        ->type_name("NAME")
        ->allow_extra_args(false)
        ->check(CLI::IsMember(warning_names()));
    command->add_option("--no-warn", options->unwanted, "Turn off warning NAME, or all")
        ->type_name("NAME")
        ->allow_extra_args(false)
        ->check(CLI::IsMember(warning_names()));
    command->add_flag("--werror", options->warnings_count, "Count warnings as errors");
    CLI::Option *fix = command->add_flag("--fix", options->fixes, "Correct what is surely meant otherwise");
    command->add_flag("--dry-run", options->changes_nothing, "Show as a diff what --fix would change")->needs(fix);
    command->footer(
        "Exit status: 0 without errors, 1 with errors (with --werror: or warnings), 2 if a source cannot be "
        "read.");
    command->callback([options, &status] { status = check_all(*options); });
}

} // namespace cdef
