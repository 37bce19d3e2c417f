/* cdgen_process.cpp: how a process that is the compiler alone meets signals and the end of memory. */

#include "compiler/cdgen_process.h"

#include "language/messages.h"

#include <atomic>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <exception>
#include <unistd.h>

namespace {

constexpr int ending_signals[] = {SIGHUP, SIGINT, SIGQUIT, SIGTERM};

/* A signal handler cannot reach a context, so this is global. */
std::atomic<const char *> unfinished_output = nullptr;
static_assert(decltype(unfinished_output)::is_always_lock_free, "handlers may only use what cannot be locked");

/* The handler has already been reset, so raising the signal again ends the program by it, as its sender expects. */
void remove_output(int signal) {
    if (const char *name = unfinished_output.exchange(nullptr))
        unlink(name);
    raise(signal);
}

/* The file is another's now, and stays. */
[[noreturn]] void report_cut_output(int) {
    constexpr char message[] = "Cannot map CDB file: it was cut while it was written\n";
    [[maybe_unused]] ssize_t written = write(STDERR_FILENO, message, sizeof message - 1);
    _exit(1);
}

void handle(int signal, void (*handler)(int)) {
    struct sigaction action = {}, before = {};
    action.sa_handler = handler;
    action.sa_flags = static_cast<int>(SA_RESETHAND);
    if (sigaction(signal, &action, &before) == 0 && before.sa_handler == SIG_IGN)
        sigaction(signal, &before, nullptr); /* stays ignored, as under nohup */
}

/* Called by the standard library when there is no memory even for an exception. */
[[noreturn]] void end_without_memory() {
    fprintf(stderr, "%s%s\n", message_of(MSG_OUT_OF_MEMORY).text, strerror(ENOMEM));
    _exit(ENOMEM);
}

} // namespace

void take_process() {
    std::set_terminate(end_without_memory);
    signal(SIGPIPE, SIG_IGN); /* a stream that nobody reads and a file that may not grow are errors of the call */
    signal(SIGXFSZ, SIG_IGN);
    for (int signal : ending_signals)
        handle(signal, remove_output);
    handle(SIGBUS, report_cut_output);
}

void set_unfinished_output(const char *name) {
    unfinished_output = name;
}
