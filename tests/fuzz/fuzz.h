/* fuzz.h: functions that the fuzz targets share: how they fail, and what they do with a database. */
#ifndef CDGEN_FUZZ_H
#define CDGEN_FUZZ_H

#include "cdb_view.h"
#include "reader/read_everything.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cstdint>
#include <cstdlib>
#include <fcntl.h>
#include <span>
#include <string>
#include <string_view>
#include <unistd.h>

namespace fuzz {

/* Ends the process with a text on the real standard error, because a defect was found. */
[[noreturn]] inline void fail(std::string text) {
    text += "\n";
    [[maybe_unused]] ssize_t written = write(STDERR_FILENO, text.data(), text.size());
    std::abort();
}

inline void require(bool holds, std::string_view otherwise) {
    if (!holds)
        fail(std::string(otherwise));
}

inline std::string text_of(const cdb::finding &f) {
    return std::string(f.broken->code) + " " + std::string(f.record) + " " + std::to_string(f.index) + " " +
           std::string(f.field) + " at " + std::to_string(f.offset) + ": found " + f.found + ", expected " + f.expected;
}

/* Reads a database through all views; nested values only if it is sound. */
inline void read_all(const cdb::database &db, bool sound) {
    reading::everything all(sound);
    all.read(db);
    volatile std::uint64_t sum = all.sum;
    static_cast<void>(sum);
}

inline void put(std::span<std::byte> image, std::size_t at, std::uint32_t word, std::endian order) {
    auto raw = std::bit_cast<std::array<std::byte, 4>>(word);
    if (order != std::endian::native)
        std::reverse(raw.begin(), raw.end());
    std::copy(raw.begin(), raw.end(), image.begin() + static_cast<std::ptrdiff_t>(at));
}

/* Corrects length and checksum, which random changes never do; without this hardly any input would be sound. The image
 * must have at least a header. */
inline void make_whole(std::span<std::byte> image, std::endian order) {
    cdb::bytes all(image, order);
    auto length = static_cast<std::uint32_t>(image.size() - 4);
    std::uint32_t sum = length;
    for (std::size_t word = 0; word < (length - 4) / 4; ++word)
        sum ^= all.number<std::uint32_t>(8 + 4 * word);
    put(image, 0, length, order);
    put(image, 4, sum, order);
}

/* The lowest descriptor that is free. */
inline int probe() {
    int fd = open("/dev/null", O_RDONLY | O_CLOEXEC);
    close(fd);
    return fd;
}

} // namespace fuzz

#endif
