/* cdgen_scan.h: where in a buffer lines end, and where quotes and comments may begin: one bit for each byte, found for
 * the whole buffer at once. */
#ifndef CDGEN_CDGEN_SCAN_H
#define CDGEN_CDGEN_SCAN_H

#include <array>
#include <bit>
#include <cstddef>
#include <cstdint>

constexpr size_t SCAN_BLOCK = 64;     /* bytes; one word has their bits */
constexpr size_t SCAN_BUFFER = 65536; /* bytes of the largest buffer */

/* The bits of a block, that of its first byte the lowest. */
struct block_bits {
    uint64_t newlines;
    uint64_t marks; /* double quotes, number signs, slashes and NULs: what may end a line's text before its newline */
};

/* The bits of SCAN_BLOCK bytes. The second form is for every machine, and takes eight bytes at a time. */
block_bits scan_block(const char *bytes);
block_bits scan_block_by_words(const char *bytes);

/* A set of places in a buffer. */
class place_set {
public:
    /* The first place in the set that is not before this one. There must be such a place. */
    size_t first_from(size_t place) const {
        size_t block = place / SCAN_BLOCK;
        if (uint64_t rest = words[block] >> place % SCAN_BLOCK)
            return place + static_cast<size_t>(std::countr_zero(rest));
        do
            ++block;
        while (words[block] == 0);
        return block * SCAN_BLOCK + static_cast<size_t>(std::countr_zero(words[block]));
    }

private:
    friend struct scanned_places;

    std::array<uint64_t, SCAN_BUFFER / SCAN_BLOCK + 1> words;
};

/* The places of a buffer. In both sets the end of the buffer is the last place, so that every search ends. */
struct scanned_places {
    /* Those of an empty buffer. */
    scanned_places() {
        newlines.words[0] = marks.words[0] = 1;
    }

    /* The buffer has at most SCAN_BUFFER bytes, and SCAN_BLOCK more that may be read. */
    void scan(const char *buffer, size_t size);

    /* The first newline that has not been taken, or the end of the buffer, which cannot be taken. */
    size_t newline() const {
        return next_newline;
    }
    void take_newline() {
        while (rest == 0)
            rest = newlines.words[++block];
        next_newline = block * SCAN_BLOCK + static_cast<size_t>(std::countr_zero(rest));
        rest &= rest - 1;
    }

    place_set marks;

private:
    place_set newlines;
    size_t next_newline = 0;
    size_t block = 0;  /* the one that next_newline is in, and */
    uint64_t rest = 0; /* the newlines after it there */
};

#endif
