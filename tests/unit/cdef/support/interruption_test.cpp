/* Signals are held back during work that must not be interrupted. */

#include "cdef/support/interruption.h"

#include <gtest/gtest.h>

#include <csignal>
#include <cstdlib>
#include <sys/wait.h>
#include <unistd.h>

namespace {

/* How a child process ends that does this. The signals are not ignored there, though they may be here, as they are in
 * the background of a shell. */
template <class Work> int end_of(Work work) {
    pid_t child = fork();
    if (child == 0) {
        for (int number : {SIGHUP, SIGINT, SIGTERM})
            signal(number, SIG_DFL);
        work();
        _exit(0);
    }
    int status = 0;
    waitpid(child, &status, 0);
    return status;
}

bool is_ended_by(int status, int signal) {
    return WIFSIGNALED(status) && WTERMSIG(status) == signal;
}

/* The write end of a pipe reports that the work has ended. */
struct Interruption : testing::Test {
    void SetUp() override {
        ASSERT_EQ(pipe(ends), 0);
    }
    void TearDown() override {
        close(ends[0]);
        close(ends[1]);
    }
    void note() const {
        ASSERT_EQ(write(ends[1], "x", 1), 1);
    }
    int notes() {
        close(ends[1]);
        char text[16];
        auto got = static_cast<int>(read(ends[0], text, sizeof text));
        ends[1] = dup(ends[0]);
        return got;
    }

    int ends[2] = {};
};

TEST_F(Interruption, WorkComesToItsEndBeforeTheProgramDoes) {
    int status = end_of([this] {
        {
            cdef::uninterrupted work;
            kill(getpid(), SIGTERM);
            note();
        }
        note();
    });
    EXPECT_TRUE(is_ended_by(status, SIGTERM));
    EXPECT_EQ(notes(), 1);
}

/* Also of those that usually do not come from another program. */
TEST_F(Interruption, AllSignalsThatEndTheProgramWait) {
    for (int number : {SIGABRT, SIGBUS, SIGIO, SIGPIPE, SIGPWR, SIGSTKFLT, SIGRTMIN}) {
        int status = end_of([this, number] {
            signal(number, SIG_DFL);
            cdef::uninterrupted work;
            kill(getpid(), number);
            note();
        });
        EXPECT_TRUE(is_ended_by(status, number)) << number;
    }
    EXPECT_EQ(notes(), 7);
}

TEST_F(Interruption, SoDoesTheWorkOfThreads) {
    int status = end_of([this] {
        cdef::interruption_watch watch;
        std::thread([this] {
            cdef::uninterrupted work;
            kill(getpid(), SIGINT);
            usleep(20000);
            note();
        }).join();
        for (;;)
            cdef::uninterrupted more; /* until there is none */
    });
    EXPECT_TRUE(is_ended_by(status, SIGINT));
    EXPECT_EQ(notes(), 1);
}

TEST_F(Interruption, IgnoredSignalsStayIgnored) {
    int status = end_of([] {
        signal(SIGHUP, SIG_IGN);
        cdef::interruption_watch watch;
        kill(getpid(), SIGHUP);
        cdef::uninterrupted work;
    });
    EXPECT_EQ(status, 0);
}

TEST_F(Interruption, WatchLeavesTheMaskAsItWas) {
    sigset_t mask;
    { cdef::interruption_watch watch; }
    pthread_sigmask(SIG_SETMASK, nullptr, &mask);
    EXPECT_FALSE(sigismember(&mask, SIGTERM) || sigismember(&mask, SIGUSR2));
}

} // namespace
