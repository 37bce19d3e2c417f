/* lsp.cpp: the subcommand that is a language server for editors, on standard input and output. */

#include "cdef/cdef.h"
#include "cdef/lsp/files.h"
#include "cdef/support/command.h"
#include "cdef/support/failure.h"
#include "cdef/support/output.h"
#include "cdef/support/project_files.h"
#include "cdef/support/status.h"
#include "server/framing.h"
#include "server/server.h"

#include <array>
#include <cerrno>
#include <csignal>
#include <cstring>
#include <memory>
#include <poll.h>
#include <string>
#include <string_view>
#include <unistd.h>

namespace cdef {

namespace {

struct lsp_options {
    bool standard_streams = false; /* accepted, because clients pass it, but without effect */
    std::string explanations;
    project_options project;
};

/* The server between two streams of bytes. */
class connection {
public:
    explicit connection(const lsp_options &options)
        : server({.read = bytes_of_file,
                  .sources_in = [](const std::string &folder) { return sources_below(folder); },
                  .explanations = options.explanations.empty() ? explanations_page() : options.explanations,
                  .version = CDGEN_VERSION,
                  .project_file = options.project.none ? "" : options.project.file}) {}

    int serve();

private:
    bool is_ready(int milliseconds) const;
    bool read_some();
    void write_all();
    bool client_is_gone() const;

    lsp::server server;
    lsp::frame_reader frames;
    bool ended = false; /* the input */
};

/* Waits this long at most for input or its end; -1: for ever. Returns whether there is any. */
bool connection::is_ready(int milliseconds) const {
    pollfd input = {STDIN_FILENO, POLLIN, 0};
    return !ended && poll(&input, 1, milliseconds) > 0;
}

/* Returns false at the end of the input. */
bool connection::read_some() {
    std::array<char, 65536> buffer;
    ssize_t size = read(STDIN_FILENO, buffer.data(), buffer.size());
    if (size < 0 && errno == EINTR)
        return true;
    if (size < 0)
        throw failure(std::string("standard input: cannot read because: ") + std::strerror(errno));
    ended = size == 0;
    std::string_view bytes(buffer.data(), static_cast<size_t>(size));
    while (std::optional<lsp::frame> next = frames.take(bytes))
        server.receive(*next);
    return !ended;
}

void connection::write_all() {
    std::string all;
    for (const std::string &body : server.take_output())
        all += lsp::framed(body);
    if (!all.empty())
        print(all);
}

bool connection::client_is_gone() const {
    std::optional<int> process = server.client_process();
    return process && *process > 0 && kill(*process, 0) != 0 && errno == ESRCH;
}

/* Receives everything that has arrived before the next step, so that a cancellation comes in time. Returns the
 * program's status. */
int connection::serve() {
    constexpr int LOOK_AFTER_CLIENT = 3000; /* milliseconds */
    while (!server.exit_status()) {
        if (!server.has_work())
            write_all();
        if (!server.is_full() && is_ready(server.has_work() ? 0 : LOOK_AFTER_CLIENT) && read_some())
            continue;
        if (server.has_work())
            server.work();
        else if (ended || client_is_gone())
            return FOUND;
        write_all();
    }
    write_all();
    return *server.exit_status();
}

} // namespace

void add_lsp(program &app) {
    auto options = std::make_shared<lsp_options>();
    command made = app.add("lsp", "Helps editors: speaks the Language Server Protocol on standard input and output",
                           [options] { return connection(*options).serve(); });
    made.add_flag("--stdio", options->standard_streams, "Ignored: the server always uses standard input and output");
    made.add("--explanations", options->explanations, "Page that explains the codes, instead of the installed one")
        .called("URI");
    add_project_options(made, options->project);
}

} // namespace cdef
