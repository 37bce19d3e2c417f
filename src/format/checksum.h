/* checksum.h: the checksum of a database. */
#ifndef CDGEN_FORMAT_CHECKSUM_H
#define CDGEN_FORMAT_CHECKSUM_H

#include "cdb.h"

#include <array>
#include <cstddef>
#include <cstring>

template <class Word> Word cdb_checksum_word(const char *from) {
    Word word;
    std::memcpy(&word, from, sizeof word);
    return word;
}

/* The start value, XORed with the (length - 4) / 4 words of the image from the format word on. */
inline vx_uint32_t cdb_checksum(const char *image, vx_uint32_t start, vx_uint32_t length) {
    const char *word = image + offsetof(orb_cdb_header_t, cdb_hdr_format);
    size_t words = (length - 4) / 4;
    std::array<vx_uint64_t, 4> sums = {}; /* two words at a time in each; the order does not matter for XOR */
    for (; words >= 8; words -= 8)
        for (vx_uint64_t &sum : sums) {
            sum ^= cdb_checksum_word<vx_uint64_t>(word);
            word += sizeof sum;
        }
    vx_uint64_t pairs = sums[0] ^ sums[1] ^ sums[2] ^ sums[3];
    vx_uint32_t sum = start ^ static_cast<vx_uint32_t>(pairs) ^ static_cast<vx_uint32_t>(pairs >> 32);
    for (; words > 0; --words, word += sizeof sum)
        sum ^= cdb_checksum_word<vx_uint32_t>(word);
    return sum;
}

#endif
