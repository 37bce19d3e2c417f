/* fuzz.h: what the fuzz targets share: how they fail, and what they do with a database. */
#ifndef CDGEN_FUZZ_H
#define CDGEN_FUZZ_H

#include "cdb_view.h"
#include "read_everything.h"

#include <cstdint>
#include <cstdlib>
#include <string>
#include <string_view>
#include <unistd.h>

namespace fuzz {

/* Ends the process with a text on the real standard error: one that stands for a defect. */
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

/* Through all views; into values of values only where they are sound. */
inline void read_all(const cdb::database &db, bool sound) {
    reading::everything all(sound);
    all.read(db);
    volatile std::uint64_t sum = all.sum;
    static_cast<void>(sum);
}

} // namespace fuzz

#endif
