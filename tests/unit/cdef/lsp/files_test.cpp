/* The files that the language server reads. */

#include "cdef/lsp/files.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <unistd.h>

namespace {

namespace fs = std::filesystem;

/* A directory with three sources, two that are hidden, and ten files that are not. */
class folder : public testing::Test {
protected:
    folder() : path(fs::temp_directory_path() / ("cdgen-unit-folder-" + std::to_string(getpid()))) {
        fs::create_directories(path / "deep/.hidden");
        for (const char *name : {"a.cdefsrc", "b.cdefsrc", "deep/c.cdefsrc", ".d.cdefsrc", "deep/.hidden/e.cdefsrc"})
            std::ofstream(path / name) << "x";
        for (int number = 0; number < 10; ++number)
            std::ofstream(path / ("other" + std::to_string(number))) << "x";
    }
    ~folder() override {
        fs::remove_all(path);
    }
    std::size_t found(const cdef::search_limits &limits) const {
        return cdef::sources_below(path.string(), limits).paths.size();
    }
    bool is_complete(const cdef::search_limits &limits) const {
        return cdef::sources_below(path.string(), limits).is_complete;
    }

    fs::path path;
};

TEST_F(folder, IsSearchedButNotWhatIsHiddenInIt) {
    std::vector<std::string> names;
    for (const std::string &each : cdef::sources_below(path.string()).paths)
        names.push_back(fs::path(each).lexically_relative(path).string());
    EXPECT_EQ(names, (std::vector<std::string>{"a.cdefsrc", "b.cdefsrc", "deep/c.cdefsrc"}));
}

TEST_F(folder, IsNotSearchedWithoutEnd) {
    constexpr std::size_t ENTRIES = 16; /* and the hidden folder, which is one of them */
    EXPECT_EQ(found({.entries = ENTRIES}), 3U);
    EXPECT_EQ(found({.entries = 0}), 0U);
    EXPECT_EQ(found({.sources = 2}), 2U);
    for (std::size_t entries = 1; entries < ENTRIES; ++entries)
        EXPECT_LE(found({.entries = entries}), entries);
    EXPECT_LT(found({.entries = 2}), 3U);
}

TEST_F(folder, IsSearchedToItsEndUnlessALimitStopsTheSearch) {
    EXPECT_TRUE(is_complete({}));
    EXPECT_TRUE(is_complete({.entries = 16, .sources = 4}));
    EXPECT_FALSE(is_complete({.entries = 15}));
    EXPECT_FALSE(is_complete({.sources = 2}));
}

} // namespace
