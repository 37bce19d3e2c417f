/* verify(): each rule against an image with one thing wrong (tests/image/broken, with the expected findings beside the
 * change), sound images, and damage of every kind. */

#include "cdb_view.h"

#include "places.h"
#include "reader/image_files.h"
#include "reader/read_everything.h"
#include "sample.h"

#include <filesystem>
#include <fstream>
#include <set>
#include <sstream>

namespace {

using namespace image_files;

/* ---- Expected findings ----------------------------------------------------------------------------------------- */

/* A finding as the broken images' descriptions spell it. */
std::string spelt(const cdb::finding &f) {
    std::ostringstream text;
    text << f.broken->code << " | ";
    f.section ? text << *f.section : text << '-';
    text << " | " << f.record << ' ' << f.index << " | " << (f.field.empty() ? "-" : f.field) << " | " << f.offset
         << " | " << f.found << " | " << f.expected;
    return text.str();
}

std::vector<std::string> spelt(std::span<const cdb::finding> findings) {
    std::vector<std::string> lines;
    for (const cdb::finding &f : findings)
        lines.push_back(spelt(f));
    return lines;
}

std::vector<std::string> findings_of(std::span<const std::byte> image) {
    return spelt(cdb::verify(cdb::database(image)));
}

/* The findings of the overload that passes each one to a function. */
std::vector<std::string> findings_handed_over(std::span<const std::byte> image) {
    std::vector<std::string> lines;
    cdb::verify(cdb::database(image), [&lines](cdb::finding &&f) { lines.push_back(spelt(f)); });
    return lines;
}

/* Changes a byte and corrects the checksum, so that only the byte itself shows the change. */
void change(std::span<std::byte> image, std::size_t at, std::byte difference) {
    image[at] ^= difference;
    if (at < 4 || at >= 8)
        image[4 + at % 4] ^= difference;
}

struct broken_image {
    std::string name;
    bool native_only = false;             /* what it shows depends on the machine's order */
    std::vector<std::string> expected[2]; /* little, big */
};

void read_line(broken_image &image, const std::string &line) {
    std::size_t colon = line.find(": ");
    std::string key = line.substr(0, colon);
    if (line == "order: native")
        image.native_only = true;
    if (key == "finding" || key == "finding-little")
        image.expected[0].push_back(line.substr(colon + 2));
    if (key == "finding" || key == "finding-big")
        image.expected[1].push_back(line.substr(colon + 2));
}

std::vector<broken_image> broken_images() {
    std::vector<broken_image> all;
    for (const auto &file : std::filesystem::directory_iterator(places::in_project("tests/image/broken"))) {
        broken_image image = {.name = file.path().stem().string(), .native_only = false, .expected = {}};
        std::ifstream lines(file.path());
        for (std::string line; std::getline(lines, line);)
            read_line(image, line);
        all.push_back(image);
    }
    return all;
}

TEST(CdbVerify, BrokenImagesHaveTheirFindings) {
    for (const broken_image &image : broken_images())
        for (std::endian order : both_orders)
            if (!image.native_only || order == std::endian::native) {
                exact_copy copy(load("broken/" + image.name, order));
                EXPECT_EQ(findings_of(copy.bytes()), image.expected[order == std::endian::big])
                    << image.name << ", " << name_of(order);
                EXPECT_EQ(findings_handed_over(copy.bytes()), findings_of(copy.bytes()));
            }
}

/* The name of a broken image begins with the code that it is about. */
TEST(CdbVerify, EveryRuleHasABrokenImage) {
    std::set<std::string_view> missing;
    for (const cdb::rule &rule : cdb::rules())
        missing.insert(rule.code);
    for (const broken_image &image : broken_images()) {
        std::string code = image.name.substr(0, 6);
        bool found = std::ranges::any_of(image.expected[0], [&](const std::string &f) { return f.starts_with(code); });
        EXPECT_TRUE(found || image.name.starts_with("sound-")) << image.name;
        missing.erase(code);
    }
    EXPECT_TRUE(missing.empty()) << *missing.begin();
}

TEST(CdbVerify, SoundImagesHaveNoFindings) {
    for (std::string_view name : {"plain", "small", "whole", "values", "empty", "hash", "errors", "nested"})
        for (std::endian order : both_orders)
            for (std::size_t off = 0; off < 8; ++off) {
                exact_copy copy(load(name, order), off);
                EXPECT_EQ(findings_of(copy.bytes()), std::vector<std::string>()) << name << ", " << name_of(order);
            }
}

/* Compares the assembler's bytes with those of the document, which shows every byte. */
TEST(CdbVerify, DocumentsImageIsSound) {
    EXPECT_EQ(findings_of(load("document", std::endian::little)), std::vector<std::string>());
    EXPECT_EQ(load("plain", std::endian::little), load("document", std::endian::little));
}

/* Each text has a separate piece, which includes its zero byte. A text that runs into the next text, or into a value,
 * is not sound. The pieces of "el" and "in" have 8 bytes each; a binary follows them. */
TEST(CdbVerify, TextThatRunsIntoWhatFollowsIsUnsound) {
    for (std::size_t piece : {1160u, 1168u})
        for (std::endian order : both_orders) {
            std::vector<std::byte> image = load("small", order);
            for (std::size_t i = 0; i < 8; ++i)
                change(image, piece + i, image[piece + i] ^ std::byte{0x41});
            EXPECT_FALSE(cdb::is_sound(cdb::verify(cdb::database(image)))) << piece << ", " << name_of(order);
        }
}

/* ---- Rules ----------------------------------------------------------------------------------------------------- */

TEST(CdbVerify, SoundMeansNoErrors) {
    EXPECT_TRUE(cdb::is_sound({}));
    for (const cdb::rule &rule : cdb::rules()) {
        const cdb::finding f[] = {{&rule, std::nullopt, {}, 0, {}, 0, {}, {}}};
        EXPECT_EQ(cdb::is_sound(f), rule.level == cdb::severity::warning) << rule.code;
    }
    const cdb::finding both[] = {{&cdb::rules()[26], std::nullopt, {}, 0, {}, 0, {}, {}},
                                 {&cdb::rules()[0], std::nullopt, {}, 0, {}, 0, {}, {}}};
    EXPECT_FALSE(cdb::is_sound(both));
}

TEST(CdbVerify, CodesAscend) {
    EXPECT_TRUE(std::ranges::is_sorted(cdb::rules(), std::less_equal(), &cdb::rule::code));
}

/* docs/reader.md: | CDB101 | error | file too short for a header | ... | */
TEST(CdbVerify, DocumentListsTheRules) {
    std::vector<std::string> documented, known;
    std::ifstream document(places::in_project("docs/reader.md"));
    for (std::string line; std::getline(document, line);)
        if (line.starts_with("| CDB"))
            documented.push_back(line.substr(0, line.find(" | ", line.find(" | ", line.find(" | ") + 1) + 1)));
    for (const cdb::rule &rule : cdb::rules())
        known.push_back(std::string("| ").append(rule.code).append(" | ") +
                        (rule.level == cdb::severity::error ? "error" : "warning") + " | " + std::string(rule.title));
    EXPECT_EQ(documented, known);
}

/* ---- Damage ---------------------------------------------------------------------------------------------------- */

TEST(CdbVerify, CutAnywhereItIsUnsoundAndReadable) {
    sampling::sample sizes = sampling::of_this_run();
    for (std::string_view name : {"whole", "values"})
        for (std::endian order : both_orders) {
            std::vector<std::byte> image = load(name, order);
            for (std::size_t size = 0; size < image.size(); ++size) {
                if (!sizes.takes())
                    continue;
                exact_copy copy(std::span<const std::byte>(image).first(size));
                cdb::database db(copy.bytes());
                EXPECT_FALSE(cdb::is_sound(cdb::verify(db))) << name << " cut at " << size;
                reading::read_everything(db);
            }
        }
}

/* Reads everything with a byte changed; the sanitizers watch that it stays inside the file. */
void read_changed(std::span<std::byte> image, std::size_t at, std::byte difference) {
    change(image, at, difference);
    reading::read_everything(cdb::database(image));
    change(image, at, difference);
}

TEST(CdbVerify, AnyByteMayBecomeAnyOther) {
    sampling::sample changes = sampling::of_this_run();
    for (std::endian order : both_orders) {
        exact_copy copy(load("plain", order));
        for (std::size_t at = 0; at < copy.bytes().size(); ++at)
            for (unsigned difference = 1; difference < 256; ++difference)
                if (changes.takes())
                    read_changed(copy.bytes(), at, std::byte(difference));
    }
}

/* Larger images, and the changes that are most likely to matter: every one would take minutes. */
TEST(CdbVerify, AnyByteMayChange) {
    sampling::sample changes = sampling::of_this_run();
    for (std::string_view name : {"small", "cut_short"})
        for (std::endian order : both_orders) {
            exact_copy copy(load(name, order));
            for (std::size_t at = 0; at < copy.bytes().size(); ++at) {
                const std::byte was = copy.bytes()[at];
                const std::byte more[] = {std::byte(std::to_integer<unsigned>(was) + 1),
                                          std::byte(std::to_integer<unsigned>(was) + 8)};
                for (std::byte difference : {was, ~was, std::byte{1}, std::byte{0x80}, was ^ more[0], was ^ more[1]})
                    if (changes.takes())
                        read_changed(copy.bytes(), at, difference);
            }
        }
}

TEST(CdbVerify, JudgesAlikeFromAnyAlignment) {
    sampling::sample places = sampling::of_this_run();
    exact_copy copy(load("small", std::endian::little));
    for (std::size_t at = 0; at < copy.bytes().size(); ++at) {
        if (!places.takes())
            continue;
        change(copy.bytes(), at, std::byte{0x10});
        EXPECT_EQ(findings_of(copy.bytes()), findings_of(exact_copy(copy.bytes(), 3).bytes())) << at;
        change(copy.bytes(), at, std::byte{0x10});
    }
}

} // namespace
