/* cdef.cpp: the command line of cdef, with its subcommands. */

#include "cdef/cdef.h"
#include "cdef/support/command.h"
#include "cdef/support/failure.h"
#include "text/shown.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <iostream>

namespace cdef {

namespace {

constexpr std::string_view SHIELD = "./";

/* CLI11 would take an argument [a,b] for two arguments, a and b, and [a] for a. It does not change ./[a,b], which is
 * the same file; the option removes the ./ again. */
bool is_in_brackets(std::string_view argument) {
    return argument.starts_with('[') && argument.ends_with(']');
}

std::vector<std::string> shielded(int argc, char **argv) {
    std::vector<std::string> arguments(argv + std::min(1, argc), argv + argc);
    for (std::string &argument : arguments)
        if (is_in_brackets(argument))
            argument.insert(0, SHIELD);
    std::reverse(arguments.begin(), arguments.end()); /* CLI11 expects the last argument first */
    return arguments;
}

std::string unshielded(const std::string &argument) {
    bool has_shield = argument.starts_with(SHIELD);
    return has_shield && is_in_brackets(std::string_view(argument).substr(SHIELD.size()))
               ? argument.substr(SHIELD.size())
               : argument;
}

void unshield_arguments(CLI::App &app) {
    for (CLI::App *command : app.get_subcommands([](CLI::App *) { return true; }))
        for (CLI::Option *option : command->get_options([](CLI::Option *o) { return o->get_items_expected_max() > 0; }))
            option->transform(unshielded);
}

/* Unknown options are reported before missing ones, because a misspelt option is often the reason that one is missing.
 * After "--" there are no options. */
std::string complaint(const CLI::App &app, const CLI::Error &usage) {
    auto code = static_cast<CLI::ExitCodes>(usage.get_exit_code());
    std::vector<std::string> unknown = app.remaining(true);
    auto first = std::find_if(unknown.begin(), unknown.end(), [](const std::string &s) { return s != "--"; });
    if (first == unknown.end() || (code != CLI::ExitCodes::RequiredError && code != CLI::ExitCodes::ExtrasError))
        return usage.what();
    std::string argument = unshielded(*first);
    if (first == unknown.begin() && argument.size() > 1 && argument.front() == '-')
        return argument + ": unknown option";
    return argument + (app.get_subcommands().empty() ? ": unknown subcommand" : ": one operand too many");
}

int run(int argc, char **argv) {
    CLI::App app("Checks class definitions and builds, shows and compares their databases.", "cdef");
    app.set_version_flag("--version", "cdef " CDGEN_VERSION);
    app.require_subcommand(1);
    app.failure_message([](const CLI::App *program, const CLI::Error &usage) {
        return "cdef: " + text::escaped(complaint(*program, usage)) + "\nRun 'cdef --help' for more.\n";
    });
    int status = OK;
    program to(app, status);
    for (auto add : {add_verify, add_dump, add_diff, add_source, add_check, add_format, add_build, add_gate, add_new,
                     add_explain, add_lsp})
        add(to);
    unshield_arguments(app);
    try {
        app.parse(shielded(argc, argv));
    } catch (const CLI::Success &help) {
        app.exit(help);
        std::cout.flush();
        return std::cout ? OK : throw failure("standard output: cannot write");
    } catch (const CLI::ParseError &usage) {
        app.exit(usage);
        return FAILED;
    }
    return status;
}

} // namespace

int cdef_main(int argc, char **argv) {
    try {
        return run(argc, argv);
    } catch (const std::exception &e) {
        print_error(e.what());
    }
    return FAILED;
}

} // namespace cdef
