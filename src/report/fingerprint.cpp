/* fingerprint.cpp: identifies a finding among others. */

#include "report/fingerprint.h"

#include "text/append.h"

#include <cinttypes>

namespace report {

namespace {

/* Powers of two. Most sources have few findings, which use few pages. */
constexpr size_t COUNTS = 1 << 18;
constexpr size_t PAGE = 1 << 10; /* counts */

std::string_view trimmed(std::string_view line) {
    constexpr std::string_view BLANKS = " \t\r";
    size_t begin = line.find_first_not_of(BLANKS);
    if (begin == std::string_view::npos)
        return {};
    return line.substr(begin, line.find_last_not_of(BLANKS) + 1 - begin);
}

/* What a finding is about: its line, or, if it has no place in that, what its note shows. */
std::string_view subject_of(const check::finding &found) {
    if (found.at.column != 0)
        return trimmed(found.source);
    for (const check::note &more : found.notes)
        if (!more.source.empty())
            return trimmed(more.source);
    return {};
}

} // namespace

std::uint64_t hash_of(std::string_view text, std::uint64_t before) {
    constexpr std::uint64_t PRIME = 0x100000001B3;
    for (char c : text)
        before = (before ^ static_cast<unsigned char>(c)) * PRIME;
    return before;
}

std::string hexadecimal(std::uint64_t number) {
    std::string digits;
    text::appendf(digits, "%016" PRIx64, number);
    return digits;
}

std::string fingerprint::text() const {
    return hexadecimal(hash) + ":" + std::to_string(count);
}

fingerprint fingerprints::of(const std::string &file, const check::finding &found) {
    constexpr std::string_view END("\0", 1);
    std::uint64_t hash = hash_of(subject_of(found), hash_of(END, hash_of(found.code)));
    size_t at = hash_of(file, hash) % COUNTS;
    pages.resize(COUNTS / PAGE);
    std::vector<std::uint32_t> &page = pages[at / PAGE];
    page.resize(PAGE);
    return {hash, ++page[at % PAGE]};
}

} // namespace report
