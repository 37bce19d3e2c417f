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

/* A signal handler cannot reach a context, so this is global. */
std::atomic<const unfinished_output *> unfinished = nullptr;
static_assert(decltype(unfinished)::is_always_lock_free, "handlers may only use what cannot be locked");

/* The handler has already been reset, so raising the signal again ends the program with this signal, as its sender
 * expects. */
void remove_output(int signal, siginfo_t *, void *) {
    remove_unfinished_output();
    raise(signal);
}

[[noreturn]] void report_bus_error(const char *reason) {
    const char *pieces[] = {message_of(MSG_CANNOT_MAP).text, reason, "\n"};
    for (const char *piece : pieces)
        [[maybe_unused]] ssize_t written = write(STDERR_FILENO, piece, strlen(piece));
    _exit(1);
}

/* Only the kernel sends it for an address without memory; other programs may send the signal too. A file that was cut
 * now belongs to another program and is not removed. A file that was not cut needed a new block, and the disk is full
 * or broken. */
void meet_bus_error(int signal, siginfo_t *info, void *context) {
    const unfinished_output *output = unfinished;
    if (info->si_code != BUS_ADRERR || output == nullptr || output->fd < 0)
        return remove_output(signal, info, context);
    if (output->is_cut())
        report_bus_error(CUT_OUTPUT);
    remove_unfinished_output();
    report_bus_error(UNSTORED_OUTPUT);
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

/* False for a signal that is ignored, and for one that a program has a handler of its own for. */
bool ends_program(int signal) {
    struct sigaction action = {};
    return sigaction(signal, nullptr, &action) == 0 &&
           (action.sa_handler == SIG_DFL || action.sa_sigaction == remove_output);
}

/* Called by the standard library when there is no memory even for an exception. */
[[noreturn]] void end_without_memory() {
    remove_unfinished_output();
    fprintf(stderr, "%s%s\n", message_of(MSG_OUT_OF_MEMORY).text, strerror(ENOMEM));
    _exit(ENOMEM);
}

} // namespace

void take_process() {
    std::set_terminate(end_without_memory);
    sigset_t never; /* writing to a closed pipe or beyond a size limit then fails with an error instead of a signal */
    sigemptyset(&never);
    sigaddset(&never, SIGPIPE);
    sigaddset(&never, SIGXFSZ);
    pthread_sigmask(SIG_BLOCK, &never, nullptr);
    handle(SIGABRT, remove_output);
    handle(SIGBUS, meet_bus_error);
}

void set_unfinished_output(const unfinished_output *output) {
    unfinished = output;
}

void remove_unfinished_output() {
    if (const unfinished_output *output = unfinished.exchange(nullptr))
        output->remove();
}

bool unfinished_output::has_its_name() const {
    struct stat st = {};
    return stat(name, &st) == 0 && st.st_dev == device && st.st_ino == inode;
}

void unfinished_output::remove() const {
    if (has_its_name())
        unlink(name);
}

bool unfinished_output::is_cut() const {
    struct stat st = {};
    return fstat(fd, &st) == 0 && st.st_size < size;
}

sigset_t ending_signals() {
    sigset_t ending;
    sigfillset(&ending);
    for (int signal : {SIGCHLD, SIGCONT, SIGURG, SIGWINCH, SIGTSTP, SIGTTIN, SIGTTOU, /* end no program */
                       SIGSEGV, SIGILL, SIGFPE, SIGTRAP, SIGSYS,                      /* report a defect */
                       SIGPIPE, SIGXFSZ})
        sigdelset(&ending, signal);
    return ending;
}

held_signals::held_signals() : held(ending_signals()), before() {
    sigdelset(&held, SIGBUS);
    pthread_sigmask(SIG_BLOCK, &held, &before);
}

held_signals::~held_signals() {
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
}

bool held_signals::will_end_program() const {
    sigset_t arrived;
    sigpending(&arrived);
    for (int signal = 1; signal <= SIGRTMAX; ++signal)
        if (sigismember(&held, signal) == 1 && sigismember(&arrived, signal) == 1 &&
            sigismember(&before, signal) == 0 && ends_program(signal))
            return true;
    return false;
}
