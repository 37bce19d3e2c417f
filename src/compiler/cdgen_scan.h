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
constexpr size_t FAR_BLOCKS = 5;      /* blocks after it, for places after its end */

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
    /* How far it is from a place to the first place in the set that is not before it. There must be such a place. */
    size_t distance_from(size_t place) const {
        size_t block = place / SCAN_BLOCK;
        if (uint64_t rest = words[block] >> place % SCAN_BLOCK)
            return lowest_bit(rest);
        do
            ++block;
        while (words[block] == 0);
        return block * SCAN_BLOCK + lowest_bit(words[block]) - place;
    }

private:
    friend struct scanned_places;

    static size_t lowest_bit(uint64_t word) {
        return static_cast<unsigned>(std::countr_zero(word));
    }

    std::array<uint64_t, SCAN_BUFFER / SCAN_BLOCK + 1 + FAR_BLOCKS> words;
};

/* The places of a buffer. */
struct scanned_places {
    /* Those of an empty buffer. */
    scanned_places() {
        newlines.words[0] = marks.words[0] = 0;
        end_at(0);
    }

    /* The buffer has at most SCAN_BUFFER bytes, and SCAN_BLOCK more that may be read. */
    void scan(const char *buffer, size_t size);

    place_set newlines; /* the last place is no newline, but more than FAR bytes after the end of the buffer */
    place_set marks;    /* the last place is the end of the buffer */

    static constexpr size_t FAR = (FAR_BLOCKS - 1) * SCAN_BLOCK;

private:
    /* Nothing is found from this place on but the last places, which end every search. */
    void end_at(size_t size);
};

#endif
