/* input.cpp: reads the database that a subcommand is given, and checks it. */

#include "cdef/support/input.h"

#include "cdef/support/failure.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <unistd.h>

namespace cdef {

namespace {

/* Errors that do not keep a database from being shown. */
constexpr std::array tolerated = {cdb::CODE_CHECKSUM, cdb::CODE_RESERVED};

bool tolerable(const cdb::finding &finding) {
    return finding.broken->level == cdb::severity::warning ||
           std::find(tolerated.begin(), tolerated.end(), finding.broken->code) != tolerated.end();
}

/* From the descriptor itself: it may be a pipe, or partly read. */
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
        throw failure(path + ": " + error.message());
    return contents;
}

} // namespace

input::input(const std::string &path) : name(path), contents(contents_of(path)), db(contents) {}

std::vector<cdb::finding> require_readable(const input &in) {
    std::vector<cdb::finding> findings = cdb::verify(in.db);
    if (!std::all_of(findings.begin(), findings.end(), tolerable))
        throw failure(in.name + ": not a sound database; 'cdef verify' says why");
    return findings;
}

std::vector<cdb::finding> require_readable_aloud(const input &in) {
    std::vector<cdb::finding> findings = require_readable(in);
    for (std::string_view code : tolerated) {
        auto found = std::find_if(findings.begin(), findings.end(),
                                  [code](const cdb::finding &f) { return f.broken->code == code; });
        if (found != findings.end())
            print_error(in.name + ": " + std::string(found->broken->title));
    }
    return findings;
}

} // namespace cdef
