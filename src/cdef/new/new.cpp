/* new.cpp: the subcommand that writes a first source. */

#include "cdef/cdef.h"
#include "cdef/new/first_source.h"
#include "cdef/support/command.h"
#include "cdef/support/failure.h"
#include "cdef/support/output.h"

#include <cerrno>
#include <csignal>
#include <cstring>
#include <fcntl.h>
#include <memory>
#include <unistd.h>

namespace cdef {

namespace {

struct new_options {
    std::string kind;
    std::string name;
    std::optional<std::string> file;
};

[[noreturn]] void fail(const std::string &path) {
    throw failure(path + ": " + std::strerror(errno));
}

/* Writes a file that must not exist. If that fails, no file remains. */
void make_file(const std::string &path, const std::string &text) {
    constexpr mode_t MODE = 0666;
    int fd = open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, MODE);
    if (fd < 0)
        fail(path);
    ssize_t written = write(fd, text.data(), text.size());
    int error = written < 0 ? errno : ENOSPC;
    bool is_closed = close(fd) == 0;
    if (written == static_cast<ssize_t>(text.size()) && is_closed)
        return;
    unlink(path.c_str());
    errno = error;
    fail(path);
}

std::string file_for(const std::string &name) {
    if (name.find('/') != std::string::npos || name.starts_with('.') || name.starts_with('-'))
        throw failure(name + ": no file can have this name: choose another one with -o");
    return name + ".cdefsrc";
}

int write_first_source(const new_options &options) {
    std::optional<std::string> source = new_command::first_source(options.name);
    if (!source)
        throw failure(options.name + ": no source can give a class this name");
    std::string path = options.file ? *options.file : file_for(options.name);
    if (path == "-") {
        print(*source);
        return OK;
    }
    signal(SIGXFSZ, SIG_IGN); /* writing beyond a size limit then fails with an error instead of a signal */
    make_file(path, *source);
    return OK;
}

} // namespace

void add_new(program &app) {
    auto options = std::make_shared<new_options>();
    command made =
        app.add("new", "Writes a commented source for a new class", [options] { return write_first_source(*options); });
    made.add("KIND", options->kind, "What to write: class").required().one_of_unlisted({"class"});
    made.add("NAME", options->name, "Name of the class").required();
    made.add("-o,--output", options->file,
             "The source, which must not exist; - is standard output (default: NAME.cdefsrc)")
        .called("FILE");
}

} // namespace cdef
