/* fingerprint.h: identifies a finding among others, even after its line has moved. */
#ifndef CDGEN_REPORT_FINGERPRINT_H
#define CDGEN_REPORT_FINGERPRINT_H

#include "check/check.h"

#include <cstdint>
#include <string>
#include <vector>

namespace report {

struct fingerprint {
    std::uint64_t hash;  /* of the code, and of the line or what else the finding is about */
    std::uint32_t count; /* of equal findings in the source up to this one; may be too high after 100,000 others */

    /* "00f1e2d3c4b5a697:1" */
    std::string text() const;
};

/* Makes fingerprints in memory of a fixed size. */
class fingerprints {
public:
    /* Must be called once for each finding, in their order. */
    fingerprint of(const std::string &file, const check::finding &found);

private:
    /* Counts, in the order of the low bits of the hash of a finding and its file. A page without counts is empty. */
    std::vector<std::vector<std::uint32_t>> pages;
};

/* Sixteen digits. */
std::string hexadecimal(std::uint64_t number);

/* The FNV-1a hash, 64 bits, of a text; `before` is the hash of the texts in front of it. */
std::uint64_t hash_of(std::string_view text, std::uint64_t before = 0xCBF29CE484222325);

} // namespace report

#endif
