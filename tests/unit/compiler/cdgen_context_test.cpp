/* A second compilation in the same process starts clean. */

#include "compiler/cdgen.h"
#include "compiler/cdgen_process.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <cstdio>
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
    options = "-qq"; /* what a parser that remembers would go on with */
    EXPECT_EQ(run(minimal, "after.cdef"), 0);
}

/* Where there is no memory even for the exception that would say so. */
TEST(Process, WithoutMemoryEndsWithTheSystemsStatus) {
    auto take_and_terminate = [] {
        take_process();
        std::terminate();
    };
    EXPECT_EXIT(take_and_terminate(), testing::ExitedWithCode(ENOMEM),
                "^cfg_malloc malloc failure: Cannot allocate memory\n$");
}

} // namespace
