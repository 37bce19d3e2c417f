/* A second compilation in the same process starts clean. */

#include "compiler/cdgen.h"
#include "compiler/cdgen_process.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <filesystem>
#include <fstream>
#include <string>

namespace {

std::string contents(const std::filesystem::path &path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

class Context : public testing::Test {
protected:
    void SetUp() override {
        directory = std::filesystem::temp_directory_path() / ("cdgen-context-" + std::to_string(getpid()));
        std::filesystem::create_directory(directory);
        setenv("VX_CDB_FORCE_EMPTY_TIMESTAMP", "", 1);
    }
    void TearDown() override {
        std::filesystem::remove_all(directory);
    }

    int run(const std::string &text, const std::string &output) {
        std::string source = directory / "case.cdefsrc";
        std::ofstream(source) << text;
        std::string out = directory / output;
        std::string program = "cdgen";
        char *argv[] = {program.data(), source.data(), out.data(), nullptr};
        return cdgen_main(3, argv);
    }

    std::filesystem::path directory;
};

const std::string minimal =
    "ControlDefinition\n\tFileVersion=1.0.0.0\nResourceClass\n\tDescription=1\n\tDisplayName=2\n"
    "\tProperties=HasResources,CanDefine\n\tClassPermTemplate=0\n\tResourcePermTemplate=0\n"
    "\tName=Small\n"
    "ClassToManagerMapping\n\tResourceManager=Mgr1\n\tFirstKey=1\n\tLastKey=100\n"
    "\tMessageCatalog=mgr1.cat\n\tDescriptiveMessageSet=1\n";

TEST_F(Context, SecondCompilationIsLikeTheFirst) {
    ASSERT_EQ(run(minimal, "first.cdef"), 0);
    ASSERT_EQ(run("Nonsense\n", "wrong.cdef"), 1);
    ASSERT_EQ(run(minimal, "second.cdef"), 0);
    EXPECT_FALSE(contents(directory / "first.cdef").empty());
    EXPECT_EQ(contents(directory / "first.cdef"), contents(directory / "second.cdef"));
    EXPECT_FALSE(std::filesystem::exists(directory / "wrong.cdef"));
}

TEST_F(Context, RefusedOptionIsForgotten) {
    std::string program = "cdgen", options = "-xn";
    char *argv[] = {program.data(), options.data(), nullptr};
    EXPECT_EQ(cdgen_main(2, argv), 1);
    options = "-qq"; /* what a parser that keeps state would continue with */
    EXPECT_EQ(run(minimal, "after.cdef"), 0);
}

/* If there is no memory even for the exception. */
TEST(Process, WithoutMemoryEndsWithTheSystemsStatus) {
    auto take_and_terminate = [] {
        take_process();
        std::terminate();
    };
    EXPECT_EXIT(take_and_terminate(), testing::ExitedWithCode(ENOMEM),
                "^cfg_malloc malloc failure: Cannot allocate memory\n$");
}

TEST_F(Context, EndWithoutMemoryRemovesAnUnfinishedOutput) {
    std::filesystem::path output = directory / "unfinished.cdef";
    std::ofstream(output) << "half";
    struct stat st = {};
    ASSERT_EQ(stat(output.c_str(), &st), 0);
    unfinished_output begun = {output.c_str(), st.st_dev, st.st_ino};
    auto begin_and_terminate = [&begun] {
        take_process();
        set_unfinished_output(&begun);
        std::terminate();
    };
    EXPECT_EXIT(begin_and_terminate(), testing::ExitedWithCode(ENOMEM), "");
    EXPECT_FALSE(std::filesystem::exists(output));
}

/* If the program itself calls abort. */
TEST_F(Context, AbortRemovesAnUnfinishedOutput) {
    std::filesystem::path output = directory / "unfinished.cdef";
    std::ofstream(output) << "half";
    struct stat st = {};
    ASSERT_EQ(stat(output.c_str(), &st), 0);
    unfinished_output begun = {output.c_str(), st.st_dev, st.st_ino};
    auto begin_and_abort = [&begun] {
        take_process();
        set_unfinished_output(&begun);
        held_signals held;
        std::abort();
    };
    EXPECT_EXIT(begin_and_abort(), testing::KilledBySignal(SIGABRT), "");
    EXPECT_FALSE(std::filesystem::exists(output));
}

/* Each of them is delivered at the end of the block, and not before. */
TEST(Process, SignalsAreHeldUntilTheEndOfTheBlock) {
    static volatile sig_atomic_t received;
    for (int signal : {SIGHUP, SIGINT, SIGQUIT, SIGTERM, SIGXCPU, SIGALRM, SIGVTALRM, SIGPROF, SIGUSR1, SIGUSR2,
                       SIGABRT, SIGIO, SIGPWR, SIGSTKFLT, SIGRTMIN}) {
        received = 0;
        auto before = std::signal(signal, [](int) { received = 1; });
        {
            held_signals held;
            raise(signal);
            EXPECT_EQ(received, 0) << signal;
            EXPECT_FALSE(held.will_end_program()) << signal; /* it has a handler */
        }
        EXPECT_EQ(received, 1) << signal;
        std::signal(signal, before);
    }
}

TEST(Process, SignalEndsTheProgramUnlessItIsIgnored) {
    auto before = std::signal(SIGTERM, SIG_DFL);
    {
        held_signals held;
        EXPECT_FALSE(held.will_end_program());
        raise(SIGTERM);
        EXPECT_TRUE(held.will_end_program());
        std::signal(SIGTERM, SIG_IGN); /* which also forgets the one that has arrived */
        raise(SIGTERM);
        EXPECT_FALSE(held.will_end_program());
    }
    std::signal(SIGTERM, before);
}

/* It is for others to decide when it arrives. */
TEST(Process, SignalThatWasBlockedBeforeEndsNoProgram) {
    held_signals others;
    {
        held_signals held;
        raise(SIGTERM);
        EXPECT_FALSE(held.will_end_program());
    }
    auto before = std::signal(SIGTERM, SIG_IGN); /* forgets the one that has arrived */
    std::signal(SIGTERM, before);
}

/* Signals that end no program, or report a defect, or stop one. */
TEST(Process, OtherSignalsAreNotHeld) {
    sigset_t ending = ending_signals();
    for (int signal : {SIGCHLD, SIGCONT, SIGURG, SIGWINCH, SIGTSTP, SIGTTIN, SIGTTOU, SIGSEGV, SIGILL, SIGFPE, SIGTRAP,
                       SIGSYS, SIGPIPE, SIGXFSZ})
        EXPECT_EQ(sigismember(&ending, signal), 0) << signal;
}

} // namespace
