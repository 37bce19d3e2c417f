/* cdef.cpp: cdef, which shows what is in a class definition database. */

#include "cdef/cdef.h"
#include "cdef/dump/dump.h"

#include <CLI/CLI.hpp>

#include <array>
#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <unistd.h>

namespace cdef {

namespace {

/* Errors that a database may have and is looked into all the same. */
constexpr std::array tolerated = {cdb::CODE_CHECKSUM, cdb::CODE_RESERVED};

bool tolerable(const cdb::finding &finding) {
    return finding.broken->level == cdb::severity::warning ||
           std::find(tolerated.begin(), tolerated.end(), finding.broken->code) != tolerated.end();
}

/* From the descriptor itself: it may be no file, or half read. */
std::vector<std::byte> standard_input(std::error_code &error) {
    constexpr std::size_t STEP = 65536;
    std::vector<std::byte> contents;
    for (ssize_t got = 1; got != 0;) {
        std::size_t size = contents.size();
        contents.resize(size + STEP);
        got = read(STDIN_FILENO, contents.data() + size, STEP);
        bool again = got < 0 && errno == EINTR;
        if (got < 0 && !again) {
            error = {errno, std::generic_category()};
            return {};
        }
        contents.resize(size + (again ? 0 : static_cast<std::size_t>(got)));
    }
    return contents;
}

std::vector<std::byte> contents_of(const std::string &path) {
    std::error_code error;
    std::vector<std::byte> contents = path == "-" ? standard_input(error) : cdb::read_file(path.c_str(), error);
    if (error)
        throw trouble(path + ": " + error.message());
    return contents;
}

} // namespace

input::input(const std::string &path) : name(path), contents(contents_of(path)), db(contents) {}

/* Names of files are part of messages, and a name may hold anything. */
void tell(const std::string &trouble) {
    std::fprintf(stderr, "cdef: %s\n", dump::harmless(trouble).c_str());
}

std::vector<cdb::finding> require_readable(const input &in) {
    std::vector<cdb::finding> findings = cdb::verify(in.db);
    if (!std::all_of(findings.begin(), findings.end(), tolerable))
        throw trouble(in.name + ": not a sound database; 'cdef verify' says why");
    return findings;
}

void require_readable_aloud(const input &in) {
    std::vector<cdb::finding> findings = require_readable(in);
    for (std::string_view code : tolerated) {
        auto found = std::find_if(findings.begin(), findings.end(),
                                  [code](const cdb::finding &f) { return f.broken->code == code; });
        if (found != findings.end())
            tell(in.name + ": " + std::string(found->broken->title));
    }
}

void appendf(std::string &to, const char *format, ...) {
    std::va_list arguments, again;
    va_start(arguments, format);
    va_copy(again, arguments);
    int length = std::vsnprintf(nullptr, 0, format, arguments);
    va_end(arguments);
    std::size_t size = to.size();
    to.resize(size + static_cast<std::size_t>(length) + 1);
    std::vsnprintf(to.data() + size, static_cast<std::size_t>(length) + 1, format, again);
    va_end(again);
    to.pop_back();
}

void print(const std::string &text) {
    if (std::fwrite(text.data(), 1, text.size(), stdout) != text.size() || std::fflush(stdout) != 0)
        throw trouble(std::string("standard output: ") + std::strerror(errno));
}

bool wants_colour() {
    const char *no_colour = std::getenv("NO_COLOR");
    return (no_colour == nullptr || *no_colour == '\0') && isatty(STDOUT_FILENO) != 0;
}

namespace {

constexpr std::string_view SHIELD = "./";

/* The library would take an argument [a,b] for two, a and b, and [a] for a. As ./[a,b] it passes; that is the same
 * file, and the option takes the beginning off again. */
bool is_in_brackets(std::string_view argument) {
    return argument.starts_with('[') && argument.ends_with(']');
}

std::vector<std::string> shielded(int argc, char **argv) {
    std::vector<std::string> arguments(argv + std::min(1, argc), argv + argc);
    for (std::string &argument : arguments)
        if (is_in_brackets(argument))
            argument.insert(0, SHIELD);
    std::reverse(arguments.begin(), arguments.end()); /* the library wants the last one first */
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

/* What is not understood comes before what is missing, which is often missed only because of it. Behind "--" there are
 * no options. */
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
    CLI::App app("Shows, checks and compares class definition databases.", "cdef");
    app.set_version_flag("--version", "cdef " CDGEN_VERSION);
    app.require_subcommand(1);
    app.failure_message([](const CLI::App *program, const CLI::Error &usage) {
        return "cdef: " + dump::harmless(complaint(*program, usage)) + "\nRun 'cdef --help' for more.\n";
    });
    int status = OK;
    for (auto add : {add_verify, add_dump, add_diff, add_source, add_check})
        add(app, status);
    unshield_arguments(app);
    try {
        app.parse(shielded(argc, argv));
    } catch (const CLI::Success &help) {
        app.exit(help);
        std::cout.flush();
        return std::cout ? OK : throw trouble("standard output: cannot write");
    } catch (const CLI::ParseError &usage) {
        app.exit(usage);
        return TROUBLE;
    }
    return status;
}

} // namespace

int cdef_main(int argc, char **argv) {
    try {
        return run(argc, argv);
    } catch (const std::exception &trouble) {
        tell(trouble.what());
    }
    return TROUBLE;
}

} // namespace cdef
