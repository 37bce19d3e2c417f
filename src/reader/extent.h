/* extent.h: a table that references lead into, and which of its bytes have an owner. */
#ifndef CDGEN_READER_EXTENT_H
#define CDGEN_READER_EXTENT_H

#include "cdb_view.h"

namespace cdb {

/* Lists, values and texts in a table start at multiples of UNIT. Each belongs to one owner, which claims its bytes. */
class extent {
public:
    static constexpr std::size_t UNIT = 8; /* bytes */

    enum class claim_result { FIRST, AGAIN, OVERLAPS };

    extent(const bytes &covered, std::size_t file_offset);

    /* Claims length bytes, all inside the area, that start at `at`, a multiple of UNIT. Returns AGAIN if an earlier
     * claim starts at the same place. Takes time proportional to the bytes that it claims. */
    claim_result claim(std::size_t at, std::size_t length);

    struct text_claim {
        std::size_t size; /* bytes claimed */
        bool whole;       /* true: the text's zero byte is one of them; false: the text runs into something else, or to
                           * its limit */
    };
    /* Claims a text that starts at `at`, a multiple of UNIT, and ends before `end`. Takes time proportional to the
     * bytes that it claims. */
    text_claim claim_text(std::size_t at, std::size_t end);

    /* at < area.size() */
    bool is_taken(std::size_t at) const {
        return (marks[at / UNIT] & TAKEN) != 0;
    }

    /* Notes that a text starts at a multiple of UNIT, without claiming it yet. */
    void note_text(std::size_t at) {
        marks[at / UNIT] |= TEXT;
    }
    bool is_text(std::size_t at) const {
        return (marks[at / UNIT] & TEXT) != 0;
    }
    /* The start of the first noted text at `at` or after it; the size of the area if there is no such text. */
    std::size_t next_text(std::size_t at) const;

    static constexpr std::size_t units(std::size_t size) {
        return (size + UNIT - 1) / UNIT;
    }
    static constexpr std::size_t rounded(std::size_t size) {
        return units(size) * UNIT;
    }

    bytes area;
    std::size_t offset;    /* of the area in the file */
    std::size_t texts_end; /* just after the last zero byte: a text that starts before it has an end */

private:
    static constexpr std::uint8_t TAKEN = 1;  /* the unit is claimed */
    static constexpr std::uint8_t BEGINS = 2; /* and is the first one of the claim */
    static constexpr std::uint8_t TEXT = 4;   /* a text was noted there */

    std::vector<std::uint8_t> marks; /* by unit */
};

} // namespace cdb

#endif
