/* interruption.cpp: holds signals back during work that must not be interrupted. */

#include "cdef/support/interruption.h"

#include "compiler/cdgen_process.h"

#include <condition_variable>
#include <mutex>

namespace cdef {

namespace {

/* All that end a program without reporting a defect of it: those of the compiler, and the one for closed pipes, which
 * no uninterrupted work writes to. */
sigset_t held_back() {
    sigset_t set = ending_signals();
    sigaddset(&set, SIGPIPE);
    return set;
}

/* All uninterrupted work of the process. */
class work_count {
public:
    /* Does not return once the program is about to end. */
    void begin() {
        std::unique_lock hold(guard);
        changed.wait(hold, [this] { return !ending; });
        ++works;
    }
    void end() {
        std::lock_guard hold(guard);
        --works;
        changed.notify_all();
    }
    /* Returns when there is no work, and there will be none. */
    void stop() {
        std::unique_lock hold(guard);
        ending = true;
        changed.wait(hold, [this] { return works == 0; });
    }

private:
    std::mutex guard;
    std::condition_variable changed;
    int works = 0;
    bool ending = false;
};

work_count all_work;

} // namespace

uninterrupted::uninterrupted() : before() {
    all_work.begin();
    sigset_t held = held_back();
    pthread_sigmask(SIG_BLOCK, &held, &before);
}

uninterrupted::~uninterrupted() {
    all_work.end();
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
}

interruption_watch::interruption_watch() : watched(held_back()), before() {
    sigaddset(&watched, SIGUSR2); /* ends the watch, too */
    pthread_sigmask(SIG_BLOCK, &watched, &before);
    try {
        watcher = std::thread([this] { watch(); });
    } catch (...) {
        pthread_sigmask(SIG_SETMASK, &before, nullptr);
        throw;
    }
}

interruption_watch::~interruption_watch() {
    is_over = true;
    pthread_kill(watcher.native_handle(), SIGUSR2);
    watcher.join();
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
}

void interruption_watch::watch() {
    int signal = 0;
    while (sigwait(&watched, &signal) == 0 && !is_over) {
        struct sigaction action = {};
        if (sigaction(signal, nullptr, &action) == 0 && action.sa_handler == SIG_IGN)
            continue;
        all_work.stop();
        sigset_t taken;
        sigemptyset(&taken);
        sigaddset(&taken, signal);
        pthread_sigmask(SIG_UNBLOCK, &taken, nullptr);
        raise(signal);
    }
}

} // namespace cdef
