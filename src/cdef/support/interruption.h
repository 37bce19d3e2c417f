/* interruption.h: holds back signals that end the program during work that must not be interrupted. */
#ifndef CDGEN_CDEF_INTERRUPTION_H
#define CDGEN_CDEF_INTERRUPTION_H

#include <atomic>
#include <csignal>
#include <thread>

namespace cdef {

/* Until the end of the block, a signal that would end the program is held back. The work must be short and must not
 * wait for other programs. */
class uninterrupted {
public:
    uninterrupted();
    uninterrupted(const uninterrupted &) = delete;
    uninterrupted &operator=(const uninterrupted &) = delete;
    ~uninterrupted();

private:
    sigset_t before;
};

/* Does the same for several threads: those that are started while it exists. A separate thread then receives the
 * signals. It waits until all uninterrupted work has ended, lets no more begin, and then ends the program with the
 * signal. (Otherwise the signal would be delivered to a thread that happens not to hold it back.) */
class interruption_watch {
public:
    /* Throws std::system_error if the thread cannot be started. */
    interruption_watch();
    interruption_watch(const interruption_watch &) = delete;
    interruption_watch &operator=(const interruption_watch &) = delete;
    ~interruption_watch();

private:
    void watch();

    sigset_t watched;
    sigset_t before;
    std::atomic<bool> is_over = false;
    std::thread watcher;
};

} // namespace cdef

#endif
