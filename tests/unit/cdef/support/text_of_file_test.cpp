/* Reading a text file. */

#include "cdef/support/text_of_file.h"

#include "cdef/support/failure.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <string>
#include <unistd.h>

namespace {

TEST(TextOfFile, ReturnsAllOfTheFile) {
    std::string path = testing::TempDir() + "/text-" + std::to_string(getpid());
    std::string text(200'000, '\0');
    std::ofstream(path, std::ios::binary) << text << "end";
    EXPECT_EQ(cdef::text_of_file(path), text + "end");
    std::filesystem::remove(path);
}

TEST(TextOfFile, RefusesWhatCannotBeRead) {
    EXPECT_THROW(cdef::text_of_file("/nowhere/file"), cdef::failure);
    EXPECT_THROW(cdef::text_of_file("/"), cdef::failure);
}

} // namespace
