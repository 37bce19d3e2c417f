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

/* The places of a buffer. */
struct scanned_places {
    static constexpr uint32_t NO_NEWLINE = 0xFFFFFFFF;

    /* Those of an empty buffer. */
    scanned_places() {
        listed[0] = NO_NEWLINE;
        marks.words[0] = 1;
    }

    /* The buffer has at most SCAN_BUFFER bytes, and SCAN_BLOCK more that may be read. */
    void scan(const char *buffer, size_t size);

    /* The first newline that is listed and has not been taken. NO_NEWLINE, which cannot be taken, if there is none. */
    size_t newline() const {
        return listed[taken];
    }
    void take_newline() {
        ++taken;
    }
    /* Lists the next newlines when all listed ones have been taken. Returns false if there are none. */
    bool list_more();

    place_set marks; /* the end of the buffer is the last one, so that every search ends */

private:
    static constexpr size_t MOST_LISTED = 1024;

    std::array<uint64_t, SCAN_BUFFER / SCAN_BLOCK + 1> newlines; /* by block */
    size_t blocks = 0;
    size_t blocks_listed = 0;
    size_t taken = 0;                             /* of the listed newlines */
    std::array<uint32_t, MOST_LISTED + 1> listed; /* their places, and then NO_NEWLINE */
};

#endif
