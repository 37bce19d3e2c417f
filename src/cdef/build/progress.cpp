/* progress.cpp: the progress line of a long build on a terminal. */

#include "cdef/build/progress.h"

#include "text/shown.h"
#include "text/utf8.h"

#include <cstdio>
#include <cstdlib>
#include <string_view>
#include <sys/ioctl.h>
#include <unistd.h>

namespace cdef::build_command {

namespace {

constexpr std::size_t USUAL_COLUMNS = 80;

bool can_clear_lines() {
    const char *terminal = std::getenv("TERM");
    return isatty(STDERR_FILENO) != 0 && terminal != nullptr && std::string_view(terminal) != "dumb";
}

std::size_t columns_of_terminal() {
    winsize size = {};
    return ioctl(STDERR_FILENO, TIOCGWINSZ, &size) == 0 && size.ws_col > 0 ? size.ws_col : USUAL_COLUMNS;
}

} // namespace

std::string progress_line(std::size_t done, std::size_t all, const std::string &name, std::size_t columns) {
    std::string line = "[" + std::to_string(done) + "/" + std::to_string(all) + "] " + text::escaped(name);
    std::size_t end = 0;
    for (std::size_t shown = 0; end < line.size() && shown < columns; ++shown)
        end += text::length_or_1(std::string_view(line).substr(end));
    return line.substr(0, end);
}

progress::progress(std::size_t sources) : all(sources), is_wanted(sources > 1 && can_clear_lines()) {}

void progress::show(std::size_t done, const std::string &name) {
    if (!is_wanted)
        return;
    std::string line = progress_line(done, all, name, columns_of_terminal() - 1); /* in the last column, it may wrap */
    std::fprintf(stderr, "\r\x1b[K%s", line.c_str());
    is_shown = true;
}

void progress::clear() {
    if (is_shown)
        std::fputs("\r\x1b[K", stderr);
    is_shown = false;
}

} // namespace cdef::build_command
