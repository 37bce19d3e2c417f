/* The project file. */

#include "config/config.h"

#include "check/found_in.h"
#include "places.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <random>
#include <unistd.h>

namespace {

using config::parse;
using texts = std::vector<std::string>;

texts problems(std::string_view bytes, const std::string &path = "p/cdef.toml") {
    texts all;
    for (const config::problem &each : parse(bytes, path).problems)
        all.push_back(config::as_text("cdef.toml", each));
    return all;
}

TEST(Config, ReadsEachKey) {
    config::reading read = parse("[warnings]\non = ['all']\noff = ['octal', 'S508']\nwerror = true\n"
                                 "[build]\ndirectory = 'out'\nbyte-order = 'both'\n"
                                 "[gate]\nlevel = 'clients'\nbaseline = 'old'\nids = 'ids.lock'\n",
                                 "p/cdef.toml");
    EXPECT_TRUE(read.problems.empty());
    EXPECT_EQ(read.values.path, "p/cdef.toml");
    EXPECT_EQ(read.values.warnings_on, texts{"all"});
    EXPECT_EQ(read.values.warnings_off, (texts{"octal", "S508"}));
    EXPECT_TRUE(read.values.warnings_count);
    EXPECT_EQ(read.values.directory, "p/out");
    EXPECT_EQ(read.values.byte_order, "both");
    EXPECT_EQ(read.values.level, "clients");
    EXPECT_EQ(read.values.baseline, "p/old");
    EXPECT_EQ(read.values.ids, "p/ids.lock");
}

TEST(Config, SeesPathsFromItsOwnDirectory) {
    EXPECT_EQ(parse("build.directory='o'", "cdef.toml").values.directory, "o");
    EXPECT_EQ(parse("build.directory='o'", "/a/b/cdef.toml").values.directory, "/a/b/o");
    EXPECT_EQ(parse("build.directory='/o'", "/a/b/cdef.toml").values.directory, "/o");
    EXPECT_EQ(parse("gate.baseline='git:v1:o'", "a/cdef.toml").values.baseline, "git:v1:o");
}

TEST(Config, LeavesEmptyWhatIsNotSaid) {
    config::reading read = parse("", "cdef.toml");
    EXPECT_TRUE(read.problems.empty());
    EXPECT_EQ(read.values.directory, "");
    EXPECT_FALSE(read.values.warnings_count);
    EXPECT_EQ(read.values.warnings(), found_in::all_warnings());
}

TEST(Config, TurnsWarningsOnThatAreNamedBothWays) {
    check::warning_set set = parse("warnings={off=['all'],on=['octal','S508']}", "cdef.toml").values.warnings();
    EXPECT_TRUE(set[check::OCTAL]);
    EXPECT_TRUE(set[check::NARROWED]);
    EXPECT_EQ(std::count(set.begin(), set.end(), true), 2);
}

TEST(Config, RefusesUnknownKeysAndTables) {
    EXPECT_EQ(problems("werror = true\n\n  [biuld]\ndirectory = 'x'\n"),
              (texts{"cdef.toml:1:1: unknown key `werror`; known are `warnings`, `build` and `gate`",
                     "cdef.toml:3:4: unknown table `biuld`; did you mean `build`?"}));
    EXPECT_EQ(problems("[warnings]\n\twerorr = true\n"),
              texts{"cdef.toml:2:2: unknown key of [warnings]: `werorr`; did you mean `werror`?"});
}

TEST(Config, RefusesValuesOfOtherTypes) {
    EXPECT_EQ(problems("[warnings]\non = 'octal'\noff = [1, 'octla']\nwerror = 'yes'\n"),
              (texts{"cdef.toml:2:6: expected an array of names of warnings, found a string",
                     "cdef.toml:3:8: expected a string, found a number",
                     "cdef.toml:3:11: unknown warning `octla`; did you mean `octal`?",
                     "cdef.toml:4:10: expected true or false, found a string"}));
    EXPECT_EQ(problems("build = 1\n"), texts{"cdef.toml:1:9: expected a table, [build]"});
    EXPECT_EQ(problems("gate.baseline = 'git:'\n"), texts{"cdef.toml:1:17: expected git:REVISION, found `git:`"});
    EXPECT_EQ(problems("[build]\nbyte-order = 'larg'\ndirectory = ''\n"),
              (texts{"cdef.toml:2:14: expected `native`, `little`, `big` or `both`, found `larg`",
                     "cdef.toml:3:13: the string is empty or has a zero byte"}));
    EXPECT_EQ(
        problems("[gate]\nids = 2026-01-02\nbaseline = {}\n"),
        (texts{"cdef.toml:2:7: expected a string, found a time", "cdef.toml:3:12: expected a string, found a table"}));
}

TEST(Config, SaysWhereTheSyntaxIsWrong) {
    texts all = problems("[build]\ndirectory = 'x\n");
    ASSERT_EQ(all.size(), 1U);
    EXPECT_TRUE(all.front().starts_with("cdef.toml:2:")) << all.front();
    EXPECT_EQ(problems("[build]\n[build]\n").size(), 1U);
    EXPECT_EQ(problems("a = '\xff'\n").size(), 1U);
    EXPECT_EQ(problems("[warnings]\nwerror = true\n[=]\n[build]\n"), texts{"cdef.toml:3:1: expected a key or a table"});
}

TEST(Config, RefusesLongFiles) {
    EXPECT_EQ(problems(std::string(config::MOST_BYTES, '\n')), texts());
    EXPECT_EQ(problems(std::string(config::MOST_BYTES + 1, '\n')), texts{"cdef.toml: more than 16384 bytes"});
}

TEST(Config, ShowsNothingThatSteersATerminal) {
    EXPECT_EQ(problems("\"\\u001b[1m\" = 1\n"),
              texts{"cdef.toml:1:1: unknown key `\\x1b[1m`; known are `warnings`, `build` and `gate`"});
}

/* Values in values, and names of names, as deep as the size allows. */
TEST(Config, SurvivesDepth) {
    for (const std::string part : {"a.", "[", "{a=", "[{a.a.a.a.a.a=", "[[a]]\n", "\"", "'''", "0b"})
        for (const std::string before : {"", "x=", "["}) {
            std::string bytes = before;
            while (bytes.size() + part.size() < config::MOST_BYTES)
                bytes += part;
            EXPECT_FALSE(problems(bytes).empty()) << part;
            EXPECT_FALSE(problems(bytes + "a]=1").empty()) << part;
        }
}

/* Any bytes give settings or problems. */
TEST(Config, SurvivesDamage) {
    const std::string sound = "[warnings]\non = [\"all\"]\noff = ['octal', 'S508']\nwerror = true # x\n"
                              "[build]\ndirectory = \"\"\"o\\u00e9ut\"\"\"\nbyte-order = 'both'\n[gate]\nids = \"x\"\n"
                              "x.y = [1, 0x1f, 1e3, 1979-05-27T07:32:00Z, {a = 1}]\n";
    std::mt19937 random(17); /* NOLINT(cert-msc*): the same each time */
    for (int round = 0; round < 20000; ++round) {
        std::string bytes = sound;
        for (unsigned changes = 1 + random() % 4; changes > 0; --changes) {
            std::size_t at = random() % bytes.size();
            switch (random() % 4) {
            case 0:
                bytes[at] = static_cast<char>(random());
                break;
            case 1:
                bytes.erase(at, random() % 8);
                break;
            case 2:
                bytes.insert(at, 1, "[]{}.='\"\n\\#,"[random() % 12]);
                break;
            default:
                bytes.insert(at, bytes.substr(random() % bytes.size(), random() % 20));
            }
            if (bytes.empty())
                bytes = " ";
        }
        for (const config::problem &each : parse(bytes, "cdef.toml").problems)
            ASSERT_FALSE(each.text.empty()) << bytes;
    }
}

class ConfigFiles : public testing::Test {
protected:
    ConfigFiles() : top(std::filesystem::canonical(testing::TempDir()) / ("config_files_" + std::to_string(getpid()))) {
        std::filesystem::create_directories(top / "a/b");
    }
    ~ConfigFiles() override {
        std::filesystem::remove_all(top);
    }
    std::string found(const std::string &source) const {
        std::string path = config::find((top / source).string());
        return path.empty() ? "" : std::filesystem::canonical(path).lexically_relative(top).string();
    }
    void write(const std::string &name) const {
        std::ofstream(top / name) << "[build]\ndirectory='o'\n";
    }

    std::filesystem::path top;
};

TEST_F(ConfigFiles, AreFoundUpwards) {
    write("a/cdef.toml");
    EXPECT_EQ(found("a/b/x"), "a/cdef.toml");
    EXPECT_EQ(found("a/x"), "a/cdef.toml");
    EXPECT_EQ(found("x"), "");
    EXPECT_EQ(found("a/none/none/x"), "a/cdef.toml");
    write("a/b/cdef.toml");
    EXPECT_EQ(found("a/b/x"), "a/b/cdef.toml");
}

TEST_F(ConfigFiles, AreFoundBehindLinksToDirectories) {
    write("a/cdef.toml");
    std::filesystem::create_directory_symlink(top / "a/b", top / "link");
    EXPECT_EQ(found("link/x"), "a/cdef.toml");
}

TEST_F(ConfigFiles, AreNoDirectories) {
    write("cdef.toml");
    std::filesystem::create_directory(top / "a/cdef.toml");
    EXPECT_EQ(found("a/b/x"), "cdef.toml");
}

TEST_F(ConfigFiles, AreLoaded) {
    write("cdef.toml");
    EXPECT_EQ(config::load((top / "cdef.toml").string()).values.directory, (top / "o").string());
    config::reading missing = config::load("no/such/file");
    ASSERT_EQ(missing.problems.size(), 1U);
    EXPECT_EQ(config::as_text("no/such/file", missing.problems[0]), "no/such/file: No such file or directory");
    EXPECT_EQ(config::load(top.string()).problems.size(), 1U);
}

/* "| `[table]` | `key` |" */
TEST(Config, DocumentHasEachKey) {
    std::ifstream file(places::in_project("docs/config.md"));
    std::string document((std::istreambuf_iterator<char>(file)), {});
    std::size_t rows = 0;
    for (const auto &[table, key] : config::known_keys()) {
        std::string row = "\n| `[" + std::string(table) + "]` | `" + std::string(key) + "` | ";
        EXPECT_NE(document.find(row), std::string::npos) << row;
        ++rows;
    }
    std::size_t documented = 0;
    for (std::size_t at = 0; (at = document.find("\n| `[", at)) != std::string::npos; ++at)
        ++documented;
    EXPECT_EQ(documented, rows);
}

} // namespace
