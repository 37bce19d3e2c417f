/* interruption.h: signals that end the program, and work that they must not cut in two. */
#ifndef CDGEN_CDEF_INTERRUPTION_H
#define CDGEN_CDEF_INTERRUPTION_H

#include <csignal>
#include <thread>

namespace cdef {

/* Until the end of the block, a signal that would end the program waits. The work has to be short: it must not wait for
 * other programs. */
class uninterrupted {
public:
    uninterrupted();
    uninterrupted(const uninterrupted &) = delete;
    uninterrupted &operator=(const uninterrupted &) = delete;
    ~uninterrupted();

private:
    sigset_t before;
};

/* Makes the same hold for several threads: those that are started while it exists. A signal is then taken by a thread
 * of its own, which lets uninterrupted work come to its end, and no more begin, before the program ends by the signal.
 * (Otherwise, the signal would be taken by a thread that happens not to hold it back.) */
class interruption_watch {
public:
    interruption_watch();
    interruption_watch(const interruption_watch &) = delete;
    interruption_watch &operator=(const interruption_watch &) = delete;
    ~interruption_watch();

private:
    void watch();

    sigset_t watched;
    sigset_t before;
    std::thread watcher;
};

} // namespace cdef

#endif
