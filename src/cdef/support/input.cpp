/* input.cpp: reads the database that a subcommand is given, and checks it. */

#include "cdef/support/input.h"

#include "cdef/support/failure.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <span>
#include <string_view>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

namespace cdef {

namespace {

/* Errors with which a database can still be shown. */
constexpr auto tolerated = std::array{cdb::CODE_CHECKSUM, cdb::CODE_RESERVED};

bool tolerable(const cdb::finding &finding) {
    return finding.broken->level == cdb::severity::warning ||
           std::find(tolerated.begin(), tolerated.end(), finding.broken->code) != tolerated.end();
}

/* Reads from the descriptor itself, because it may be a pipe or partly read. */
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

bool has_format_word(std::span<const std::byte> contents) {
    constexpr std::size_t PLACE = offsetof(orb_cdb_header_t, cdb_hdr_format);
    constexpr std::array<std::string_view, 2> words = {"1tmf", "fmt1"}; /* little-endian, big-endian */
    if (contents.size() < PLACE + sizeof(vx_uint32_t))
        return false;
    return std::any_of(words.begin(), words.end(), [&](std::string_view word) {
        return std::memcmp(contents.data() + PLACE, word.data(), word.size()) == 0;
    });
}

/* Closes a file when it is left. */
struct open_file {
    explicit open_file(int opened) : fd(opened) {}
    open_file(const open_file &) = delete;
    open_file &operator=(const open_file &) = delete;
    ~open_file() {
        if (fd >= 0)
            close(fd);
    }

    int fd;
};

/* The next bytes of a regular file, without moving its position; no bytes for any other file. */
std::vector<std::byte> beginning_of(int fd) {
    constexpr std::size_t ENOUGH = sizeof(orb_cdb_header_t);
    struct stat st = {};
    if (fstat(fd, &st) != 0 || !S_ISREG(st.st_mode))
        return {};
    std::vector<std::byte> contents(ENOUGH);
    ssize_t got = pread(fd, contents.data(), contents.size(), lseek(fd, 0, SEEK_CUR));
    contents.resize(got < 0 ? 0 : static_cast<std::size_t>(got));
    return contents;
}

} // namespace

bool is_text(const std::vector<std::byte> &contents) {
    constexpr std::size_t BEGINNING = 1024;
    auto end = contents.begin() + static_cast<std::ptrdiff_t>(std::min(contents.size(), BEGINNING));
    return !contents.empty() && !has_format_word(contents) && std::find(contents.begin(), end, std::byte{0}) == end;
}

bool is_database(const std::string &path) {
    if (path == "-")
        return has_format_word(beginning_of(STDIN_FILENO));
    open_file file(open(path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC));
    return file.fd >= 0 && has_format_word(beginning_of(file.fd));
}

input::input(const std::string &path) : input(path, contents_of(path)) {}

input::input(std::string file, std::vector<std::byte> read)
    : name(std::move(file)), contents(std::move(read)), db(contents) {}

std::optional<cdb::finding> readability::first_of(std::string_view code) const {
    auto found =
        std::find_if(errors.begin(), errors.end(), [code](const cdb::finding &f) { return f.broken->code == code; });
    return found == errors.end() ? std::nullopt : std::optional(*found);
}

void require_database(const input &in) {
    if (is_text(in.contents))
        throw failure(in.name + ": a text, not a database; 'cdef check' checks sources");
}

/* There may be millions of findings, of which only a few matter. */
readability require_readable(const input &in) {
    require_database(in);
    std::vector<std::size_t> strays;
    std::vector<cdb::finding> errors;
    cdb::verify(in.db, [&](cdb::finding &&f) {
        if (!tolerable(f))
            throw failure(in.name + ": not a sound database; 'cdef verify' says why");
        if (std::optional<std::size_t> stray = cdb::stray_of(f))
            strays.push_back(*stray);
        bool is_new = std::none_of(errors.begin(), errors.end(),
                                   [&f](const cdb::finding &known) { return known.broken == f.broken; });
        if (f.broken->level == cdb::severity::error && is_new)
            errors.push_back(std::move(f));
    });
    return {cdb::ownership(in.db, std::move(strays)), std::move(errors)};
}

readability require_readable_aloud(const input &in) {
    readability found = require_readable(in);
    for (std::string_view code : tolerated)
        if (std::optional<cdb::finding> first = found.first_of(code))
            print_error(in.name + ": " + std::string(first->broken->title));
    return found;
}

} // namespace cdef
