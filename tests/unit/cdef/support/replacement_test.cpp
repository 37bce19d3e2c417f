/* Putting new contents in the place of a file. */

#include "cdef/support/replacement.h"

#include "cdef/support/failure.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <sys/file.h>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>

namespace {

using cdef::replace_file;
namespace fs = std::filesystem;

class Replacement : public testing::Test {
protected:
    void SetUp() override {
        std::string name = (fs::temp_directory_path() / "cdgen-unit-XXXXXX").string();
        here = mkdtemp(name.data());
    }
    void TearDown() override {
        fs::remove_all(here);
    }

    std::string path(const std::string &name) const {
        return (here / name).string();
    }
    void write(const std::string &name, const std::string &text) const {
        std::ofstream(here / name, std::ios::binary) << text;
    }
    std::string read(const std::string &name) const {
        std::stringstream whole;
        whole << std::ifstream(here / name, std::ios::binary).rdbuf();
        return whole.str();
    }
    mode_t mode(const std::string &name) const {
        struct stat st = {};
        stat(path(name).c_str(), &st);
        return st.st_mode & 07777U;
    }
    size_t files() const {
        return static_cast<size_t>(std::distance(fs::directory_iterator(here), fs::directory_iterator()));
    }
    std::string refusal(const std::string &name, const cdef::replacement_options &options = {}) const {
        try {
            replace_file(path(name), "new", options);
        } catch (const cdef::failure &e) {
            return std::string(e.what()).substr(here.string().size() + 1);
        }
        return "";
    }

    fs::path here;
};

TEST_F(Replacement, MakesAFileThatIsNotThere) {
    mode_t before = umask(026);
    replace_file(path("a.cdef"), "new");
    umask(before);
    EXPECT_EQ(read("a.cdef"), "new");
    EXPECT_EQ(mode("a.cdef"), 0640u);
    EXPECT_EQ(files(), 1u);
}

TEST_F(Replacement, LeavesTheOldFileToWhoHasItOpen) {
    write("a.cdef", "old");
    std::ifstream reader(here / "a.cdef");
    replace_file(path("a.cdef"), std::string("n\0w", 3), {.sync = true});
    EXPECT_EQ(read("a.cdef"), std::string("n\0w", 3));
    std::string text;
    reader >> text;
    EXPECT_EQ(text, "old");
}

TEST_F(Replacement, KeepsTheMode) {
    for (mode_t wanted : {mode_t{0600}, mode_t{0444}, mode_t{0755}}) {
        write("a.cdef", "old");
        fs::permissions(here / "a.cdef", static_cast<fs::perms>(wanted));
        replace_file(path("a.cdef"), "new");
        EXPECT_EQ(mode("a.cdef"), wanted);
        fs::remove(here / "a.cdef");
    }
}

TEST_F(Replacement, FollowsLinksAlsoToWhatIsNotThere) {
    fs::create_directory(here / "d");
    fs::create_symlink("d/second", here / "first");
    fs::create_symlink(path("a.cdef"), here / "d/second");
    replace_file(path("first"), "one");
    EXPECT_EQ(read("a.cdef"), "one");
    replace_file(path("first"), "two");
    EXPECT_EQ(read("a.cdef"), "two");
    EXPECT_TRUE(fs::is_symlink(here / "first") && fs::is_symlink(here / "d/second"));
}

TEST_F(Replacement, RefusesWhatIsNoFile) {
    fs::create_symlink("loop", here / "loop");
    EXPECT_EQ(refusal("loop"), "loop: Too many levels of symbolic links");
    fs::create_directory(here / "d");
    EXPECT_EQ(refusal("d"), "d: cannot write: Is a directory");
    mkfifo(path("pipe").c_str(), 0600);
    EXPECT_EQ(refusal("pipe"), "pipe: cannot write: not a regular file");
    EXPECT_EQ(refusal("nowhere/a.cdef"), "nowhere/a.cdef: cannot write: No such file or directory");
    EXPECT_EQ(files(), 3u);
}

TEST_F(Replacement, ReplacesAFileThatHasNotChanged) {
    write("a.cdefsrc", "old");
    replace_file(path("a.cdefsrc"), "new", {.before = "old"});
    EXPECT_EQ(read("a.cdefsrc"), "new");
}

TEST_F(Replacement, LeavesAFileThatHasBeenMadeInTheMeantime) {
    write("ids.lock", "old");
    EXPECT_EQ(refusal("ids.lock", {.must_be_new = true}), "ids.lock: cannot write: it has been made in the meantime");
    EXPECT_EQ(read("ids.lock"), "old");
    EXPECT_EQ(files(), 1u);
    replace_file(path("other"), "new", {.must_be_new = true});
    EXPECT_EQ(read("other"), "new");
}

TEST_F(Replacement, LeavesAFileThatHasChangedInTheMeantime) {
    write("a.cdefsrc", "old");
    EXPECT_EQ(refusal("a.cdefsrc", {.before = "older"}),
              "a.cdefsrc: cannot write: it has been changed in the meantime");
    EXPECT_EQ(read("a.cdefsrc"), "old");
    EXPECT_EQ(files(), 1u);
}

TEST_F(Replacement, ReplacesOnlyAFileThatWasRead) {
    fs::create_directory(here / "d");
    EXPECT_EQ(refusal("d", {.before = ""}), "d: cannot write: Is a directory");
    EXPECT_EQ(refusal("none", {.before = ""}), "none: cannot write: No such file or directory");
    EXPECT_EQ(refusal("d/none/a", {.before = ""}), "d/none/a: cannot write: No such file or directory");
    EXPECT_THROW(replace_file("/dev/null", "new", {.before = ""}), cdef::failure);
    EXPECT_EQ(files(), 1u);
}

TEST_F(Replacement, NamesTheTemporaryFileAfterItsTarget) {
    EXPECT_EQ(cdef::temporary_of("a.cdef"), ".a.cdef.cdef-new");
    EXPECT_EQ(cdef::temporary_of("/x/y/a.cdef"), "/x/y/.a.cdef.cdef-new");
    EXPECT_EQ(cdef::temporary_of(std::string(245, 'a')), "." + std::string(245, 'a') + ".cdef-new");
}

TEST_F(Replacement, CutsATemporaryNameThatWouldBeTooLong) {
    std::string one(255, 'a'), two = std::string(254, 'a') + "b";
    replace_file(path(one), "1");
    replace_file(path(two), "2");
    EXPECT_EQ(read(one) + read(two), "12");
    EXPECT_NE(cdef::temporary_of(one), cdef::temporary_of(two));
    EXPECT_LE(cdef::temporary_of(one).size(), 255u);
}

TEST_F(Replacement, RemovesWhatAKilledProgramLeft) {
    write(".a.cdef.cdef-new", "half");
    replace_file(path("a.cdef"), "new");
    EXPECT_EQ(read("a.cdef"), "new");
    EXPECT_EQ(files(), 1u);
    write(".a.cdef.cdef-new", "half");
    cdef::remove_remains(path("a.cdef"));
    EXPECT_EQ(files(), 1u);
}

TEST_F(Replacement, LeavesATemporaryFileThatIsInUse) {
    write(".a.cdef.cdef-new", "half");
    int fd = open(path(".a.cdef.cdef-new").c_str(), O_RDONLY);
    ASSERT_EQ(flock(fd, LOCK_EX), 0);
    cdef::remove_remains(path("a.cdef"));
    EXPECT_EQ(read(".a.cdef.cdef-new"), "half");
    close(fd);
}

TEST_F(Replacement, NeverWritesThroughALinkInPlaceOfTheTemporaryFile) {
    write("other", "mine");
    fs::create_symlink("other", here / ".a.cdef.cdef-new");
    EXPECT_EQ(refusal("a.cdef"),
              "a.cdef: cannot write: " + path(".a.cdef.cdef-new") + ": Too many levels of symbolic links");
    EXPECT_EQ(read("other"), "mine");
    fs::remove(here / ".a.cdef.cdef-new");
    fs::create_directory(here / ".a.cdef.cdef-new");
    EXPECT_EQ(refusal("a.cdef"), "a.cdef: cannot write: " + path(".a.cdef.cdef-new") + ": File exists");
}

TEST_F(Replacement, ManyAtOnceEndWithOneWholeFile) {
    std::vector<std::thread> threads;
    for (char letter : std::string("abcdefgh"))
        threads.emplace_back([this, letter] {
            for (int times = 0; times < 50; ++times)
                replace_file(path("a.cdef"), std::string(5000, letter));
        });
    for (std::thread &thread : threads)
        thread.join();
    std::string text = read("a.cdef");
    EXPECT_EQ(text, std::string(5000, text.at(0)));
    EXPECT_EQ(files(), 1u);
}

} // namespace
