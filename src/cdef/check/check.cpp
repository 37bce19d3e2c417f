/* check.cpp: all that is wrong with sources, and what is odd in them. */

#include "check/check.h"

#include "cdef/cdef.h"
#include "cdef/support/failure.h"
#include "cdef/support/input.h"
#include "cdef/support/output.h"
#include "report/report.h"

#include <CLI/CLI.hpp>

#include <cstddef>
#include <cstdio>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace cdef {

namespace {

using check::warning;

struct check_options {
    std::vector<std::string> sources;
    std::string format = "text";
    std::vector<std::string> wanted;
    std::vector<std::string> unwanted;
    bool warnings_count = false; /* as errors do */
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

void show_text(const std::string &text) {
    if (std::fwrite(text.data(), 1, text.size(), stderr) != text.size())
        throw failure("standard error: cannot write");
}

/* Checks a source and shows what is found in it. */
check::totals check_as_text(const std::string &source, const check::warning_set &wanted) {
    constexpr std::size_t PORTION = 65536; /* bytes that are written at once */
    std::string text;
    check::totals count = check::check_file(source, wanted, [&](const check::finding &found) {
        text += report::as_text(source, found);
        if (text.size() >= PORTION)
            show_text(std::exchange(text, {}));
    });
    show_text(text);
    return count;
}

report::checked_source check_for_later(const std::string &source, const check::warning_set &wanted) {
    report::checked_source checked = {.file = source, .findings = {}, .count = {}};
    checked.count = check::check_file(source, wanted,
                                      [&](check::finding &&found) { checked.findings.push_back(std::move(found)); });
    return checked;
}

void show(const std::vector<report::checked_source> &checked, const std::string &format) {
    if (format == "json")
        print(report::as_json(checked));
    if (format == "sarif")
        print(report::as_sarif(checked));
}

/* Checks all sources. One that cannot be read is reported at once, and so are findings in text form. */
int check_all(const check_options &options) {
    std::vector<report::checked_source> all;
    bool pass = true;
    bool read = true;
    for (const std::string &source : options.sources) {
        try {
            if (is_database(source))
                throw check::cannot_check(source + ": a database, not a source; 'cdef verify' checks databases");
            check::totals count;
            if (options.format == "text")
                count = check_as_text(source, chosen(options));
            else
                count = all.emplace_back(check_for_later(source, chosen(options))).count;
            pass = pass && count.errors == 0 && (count.warnings == 0 || !options.warnings_count);
        } catch (const check::cannot_check &unreadable) {
            print_error(unreadable.what());
            read = false;
        }
    }
    show(all, options.format);
    return !read ? FAILED : pass ? OK : FOUND;
}

} // namespace

void add_check(CLI::App &app, int &status) {
    auto options = std::make_shared<check_options>();
    CLI::App *command = app.add_subcommand("check", "Checks sources and reports every mistake, not just the first");
    command->add_option("SOURCE", options->sources, "Source to check; - is standard input")->required();
    command->add_option("--format", options->format, "Form of the findings: text (on standard error), json or sarif")
        ->check(CLI::IsMember({"text", "json", "sarif"}));
    command->add_option("--warn", options->wanted, "Turn on warning NAME, or all")
        ->type_name("NAME")
        ->allow_extra_args(false)
        ->check(CLI::IsMember(warning_names()));
    command->add_option("--no-warn", options->unwanted, "Turn off warning NAME, or all")
        ->type_name("NAME")
        ->allow_extra_args(false)
        ->check(CLI::IsMember(warning_names()));
    command->add_flag("--werror", options->warnings_count, "Count warnings as errors");
    command->footer(
        "Exit status: 0 without errors, 1 with errors (with --werror: or warnings), 2 if a source cannot be "
        "read.");
    command->callback([options, &status] { status = check_all(*options); });
}

} // namespace cdef
