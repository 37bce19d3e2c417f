/* A text file that is read and then replaced. */

#include "cdef/support/replace.h"

#include "cdef/support/failure.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <unistd.h>

namespace {

/* A file in a directory of its own. */
class ReplaceFile : public testing::Test {
protected:
    ReplaceFile() : directory(testing::TempDir() + "/replace-" + std::to_string(getpid())), path(directory + "/file") {
        std::filesystem::create_directory(directory);
        std::ofstream(path) << "old";
    }
    ~ReplaceFile() override {
        std::filesystem::remove_all(directory);
    }

    std::string directory;
    std::string path;
};

TEST_F(ReplaceFile, PutsTheNewTextInPlaceOfTheOld) {
    cdef::replace_file(path, "old", "new");
    EXPECT_EQ(cdef::text_of_file(path), "new");
}

TEST_F(ReplaceFile, LeavesAFileThatChangedMeanwhile) {
    EXPECT_THROW(cdef::replace_file(path, "older", "new"), cdef::failure);
    EXPECT_EQ(cdef::text_of_file(path), "old");
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator(directory), {}), 1);
}

TEST_F(ReplaceFile, ReplacesOnlyRegularFiles) {
    EXPECT_THROW(cdef::replace_file(directory, "", "new"), cdef::failure);
    EXPECT_THROW(cdef::replace_file("/dev/null", "", "new"), cdef::failure);
    EXPECT_THROW(cdef::replace_file(path + "/none", "", "new"), cdef::failure);
}

} // namespace
