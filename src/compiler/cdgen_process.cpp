/* cdgen_process.cpp: how the compiler's own process handles signals and the lack of memory. */

#include "compiler/cdgen_process.h"

#include "language/messages.h"

#include <atomic>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstring>
#include <exception>
#include <sys/stat.h>
#include <unistd.h>

namespace {

/* The signals that end a program and do not report a defect of it. */
constexpr int ending_signals[] = {SIGHUP,  SIGINT,    SIGQUIT, SIGTERM, SIGXCPU, SIGALRM,
                                  SIGPROF, SIGVTALRM, SIGUSR1, SIGUSR2, SIGABRT};

/* A signal handler cannot reach a context, so this is global. */
std::atomic<const unfinished_output *> unfinished = nullptr;
static_assert(decltype(unfinished)::is_always_lock_free, "handlers may only use what cannot be locked");

void remove_unfinished() {
    if (const unfinished_output *output = unfinished.exchange(nullptr))
        output->remove();
}

/* The handler has already been reset, so raising the signal again ends the program with this signal, as its sender
 * expects. */
void remove_output(int signal, siginfo_t *, void *) {
    remove_unfinished();
    raise(signal);
}

/* The file now belongs to another program and is not removed. */
[[noreturn]] void report_cut_output() {
    const char *pieces[] = {message_of(MSG_CANNOT_MAP).text, CUT_OUTPUT, "\n"};
    for (const char *piece : pieces)
        [[maybe_unused]] ssize_t written = write(STDERR_FILENO, piece, strlen(piece));
    _exit(1);
}

/* Only the kernel sends it for an address without memory; other programs may send the signal too. */
void meet_bus_error(int signal, siginfo_t *info, void *context) {
    if (info->si_code == BUS_ADRERR && unfinished != nullptr)
        report_cut_output();
    remove_output(signal, info, context);
}

/* No other signal interrupts the handler, which might otherwise end the program before the output is removed. */
void handle(int signal, void (*handler)(int, siginfo_t *, void *)) {
    struct sigaction action = {}, before = {};
    action.sa_sigaction = handler;
    action.sa_flags = static_cast<int>(SA_RESETHAND | SA_SIGINFO);
    sigfillset(&action.sa_mask);
    if (sigaction(signal, &action, &before) == 0 && before.sa_handler == SIG_IGN)
        sigaction(signal, &before, nullptr); /* stays ignored, as under nohup */
}

/* Called by the standard library when there is no memory even for an exception. */
[[noreturn]] void end_without_memory() {
    remove_unfinished();
    fprintf(stderr, "%s%s\n", message_of(MSG_OUT_OF_MEMORY).text, strerror(ENOMEM));
    _exit(ENOMEM);
}

} // namespace

void take_process() {
    std::set_terminate(end_without_memory);
    signal(SIGPIPE, SIG_IGN); /* writing to a closed pipe or beyond a size limit then fails with an error instead of a
                               * signal */
    signal(SIGXFSZ, SIG_IGN);
    for (int signal : ending_signals)
        handle(signal, remove_output);
    handle(SIGBUS, meet_bus_error);
}

void set_unfinished_output(const unfinished_output *output) {
    unfinished = output;
}

bool unfinished_output::has_its_name() const {
    struct stat st = {};
    return stat(name, &st) == 0 && st.st_dev == device && st.st_ino == inode;
}

void unfinished_output::remove() const {
    if (has_its_name())
        unlink(name);
}

held_signals::held_signals() : before() {
    sigset_t held;
    sigemptyset(&held);
    for (int signal : ending_signals)
        sigaddset(&held, signal);
    pthread_sigmask(SIG_BLOCK, &held, &before);
}

held_signals::~held_signals() {
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
}
