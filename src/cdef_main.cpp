/* cdef_main.cpp: cdef, which shows what is in a class definition database. */

#include "cdef.h"

#include <CLI/CLI.hpp>

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iostream>
#include <unistd.h>

namespace cdef {

namespace {

/* What may be wrong with a database that is looked into all the same. */
bool tolerable(const cdb::finding &finding) {
    return finding.broken->level == cdb::severity::warning || finding.broken->code == cdb::CODE_CHECKSUM ||
           finding.broken->code == cdb::CODE_RESERVED;
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

void tell(const std::exception &trouble) {
    std::fprintf(stderr, "cdef: %s\n", trouble.what());
}

void require_readable(const input &in) {
    std::vector<cdb::finding> findings = cdb::verify(in.db);
    if (!std::all_of(findings.begin(), findings.end(), tolerable))
        throw trouble(in.name + ": not a sound database; 'cdef verify' says why");
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

int run(int argc, char **argv) {
    CLI::App app("Shows, checks and compares class definition databases.", "cdef");
    app.set_version_flag("--version", "cdef " CDGEN_VERSION);
    app.require_subcommand(1);
    app.failure_message([](const CLI::App *, const CLI::Error &usage) {
        return std::string("cdef: ") + usage.what() + "\nRun 'cdef --help' for more.\n";
    });
    int status = OK;
    for (auto add : {add_verify, add_dump, add_diff, add_source, add_check})
        add(app, status);
    try {
        app.parse(argc, argv);
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

} // namespace cdef

int main(int argc, char **argv) {
    try {
        return cdef::run(argc, argv);
    } catch (const std::exception &trouble) {
        cdef::tell(trouble);
    } catch (...) {
        std::fputs("cdef: out of memory\n", stderr);
    }
    return cdef::TROUBLE;
}
