/* cdef.cpp: the command line of cdef, with its subcommands. */

#include "cdef/cdef.h"
#include "cdef/support/command.h"
#include "cdef/support/failure.h"
#include "cdef/usage.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <cstdio>
#include <iostream>

namespace cdef {

namespace {

constexpr std::string_view SHIELD = "./";

/* CLI11 would take an argument [a,b] for two arguments, a and b, and [a] for a. It does not change ./[a,b], which is
 * the same file; the option removes the ./ again. */
bool is_in_brackets(std::string_view argument) {
    return argument.starts_with('[') && argument.ends_with(']');
}

/* In the order that CLI11 expects: the last word first. */
std::vector<std::string> shielded(std::vector<std::string> words) {
    for (std::string &word : words)
        if (is_in_brackets(word))
            word.insert(0, SHIELD);
    std::reverse(words.begin(), words.end());
    return words;
}

std::string unshielded(const std::string &argument) {
    bool has_shield = argument.starts_with(SHIELD);
    return has_shield && is_in_brackets(std::string_view(argument).substr(SHIELD.size()))
               ? argument.substr(SHIELD.size())
               : argument;
}

void unshield_arguments(CLI::App &app) {
    for (CLI::App *command : subcommands_of(app))
        for (CLI::Option *option : command->get_options([](CLI::Option *o) { return o->get_items_expected_max() > 0; }))
            option->transform(unshielded);
}

/* The flags that CLI11 adds itself; command.cpp does the same with the others. */
void refuse_values_of_help(CLI::App &app) {
    app.get_help_ptr()->disable_flag_override();
    app.get_version_ptr()->disable_flag_override();
    for (CLI::App *command : subcommands_of(app))
        command->get_help_ptr()->disable_flag_override();
}

int refuse(const wrong_usage &wrong) {
    print_error(wrong.what);
    std::fprintf(stderr, "Run '%s --help' for more.\n", wrong.command.c_str());
    return FAILED;
}

int run(int argc, char **argv) {
    CLI::App app("Checks class definitions and builds, shows and compares their databases.", "cdef");
    app.set_version_flag("--version", "cdef " CDGEN_VERSION);
    app.require_subcommand(1);
    int status = OK;
    program to(app, status);
    for (auto add : {add_verify, add_dump, add_diff, add_source, add_check, add_format, add_build, add_gate, add_new,
                     add_explain, add_lsp})
        add(to);
    unshield_arguments(app);
    refuse_values_of_help(app);
    usage words(app, {argv + std::min(1, argc), argv + argc});
    if (words.mistake())
        return refuse(*words.mistake());
    try {
        app.parse(shielded(words.in_order()));
    } catch (const CLI::Success &help) {
        app.exit(help);
        std::cout.flush();
        return std::cout ? OK : throw failure("standard output: cannot write");
    } catch (const CLI::ParseError &wrong) {
        return refuse(words.mistake_of(wrong));
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
