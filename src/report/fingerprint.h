/* fingerprint.h: what tells a finding from others, and stays the same when its line moves. */
#ifndef CDGEN_REPORT_FINGERPRINT_H
#define CDGEN_REPORT_FINGERPRINT_H

#include "check/check.h"

#include <cstdint>
#include <string>
#include <vector>

namespace report {

struct fingerprint {
    std::uint64_t hash;  /* of the code, and of the line or what else the finding is about */
    std::uint32_t count; /* of such findings in the source so far, with this one; may be higher after 100,000 others */

    /* "00f1e2d3c4b5a697:1" */
    std::string text() const;
};

/* Makes fingerprints in memory of a fixed size. */
class fingerprints {
public:
    /* Must be called once for each finding, in their order. */
    fingerprint of(const std::string &file, const check::finding &found);

private:
    std::vector<std::uint32_t> counts; /* by the low bits of the hash of a finding and its file */
};

/* Sixteen digits. */
std::string hexadecimal(std::uint64_t number);

/* FNV-1a, 64 bits, of a text and of what was hashed before it. */
std::uint64_t hash_of(std::string_view text, std::uint64_t before = 0xCBF29CE484222325);

} // namespace report

#endif
