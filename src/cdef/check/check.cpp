/* check.cpp: all that is wrong with sources, and what is odd in them. */

#include "check/check.h"

#include "cdef/cdef.h"
#include "cdef/support/output.h"
#include "cdef/support/trouble.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <memory>

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

/* All but those that are not wanted; and what is named both ways is wanted. */
check::warning_set chosen(const check_options &options) {
    check::warning_set set;
    set.fill(true);
    switch_warnings(set, options.unwanted, false);
    switch_warnings(set, options.wanted, true);
    return set;
}

void show_text(const check::result &checked) {
    std::string text = check::as_text(checked);
    if (std::fwrite(text.data(), 1, text.size(), stderr) != text.size())
        throw trouble("standard error: cannot write");
}

void show(const std::vector<check::result> &results, const std::string &format) {
    if (format == "json")
        print(check::as_json(results));
    if (format == "sarif")
        print(check::as_sarif(results));
}

/* All sources but those that cannot be read, of which is told at once; so is of findings in text form. */
int check_all(const check_options &options) {
    std::vector<check::result> results;
    bool pass = true;
    bool read = true;
    for (const std::string &source : options.sources) {
        try {
            check::result checked = check::check_source(source, chosen(options));
            pass = pass && checked.errors == 0 && (checked.warnings == 0 || !options.warnings_count);
            if (options.format == "text")
                show_text(checked);
            else
                results.push_back(std::move(checked));
        } catch (const trouble &unreadable) {
            tell(unreadable.what());
            read = false;
        }
    }
    show(results, options.format);
    return !read ? TROUBLE : pass ? OK : FOUND;
}

} // namespace

void add_check(CLI::App &app, int &status) {
    auto options = std::make_shared<check_options>();
    CLI::App *command = app.add_subcommand("check", "Checks sources, and goes on behind each mistake");
    command->add_option("SOURCE", options->sources, "Sources; - is standard input")->required();
    command->add_option("--format", options->format, "text, json or sarif")
        ->check(CLI::IsMember({"text", "json", "sarif"}));
    command->add_option("--warn", options->wanted, "Warns of NAME, or of all")
        ->type_name("NAME")
        ->allow_extra_args(false)
        ->check(CLI::IsMember(warning_names()));
    command->add_option("--no-warn", options->unwanted, "Does not warn of NAME, or of all")
        ->type_name("NAME")
        ->allow_extra_args(false)
        ->check(CLI::IsMember(warning_names()));
    command->add_flag("--werror", options->warnings_count, "Warnings count as errors");
    command->callback([options, &status] { status = check_all(*options); });
}

} // namespace cdef
