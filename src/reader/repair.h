/* repair.h: looks for one number in a damaged database that causes all of its errors. */
#ifndef CDGEN_READER_REPAIR_H
#define CDGEN_READER_REPAIR_H

#include "cdb_view.h"

namespace cdb {

class repair {
public:
    /* found: the findings of verify(). Both arguments must outlive this object. */
    repair(const database &damaged, std::span<const finding> found);

    /* True if correcting one word removes all errors. */
    bool succeeds();

    /* The corrected file, and where its first corrected byte is; after succeeds(). */
    database corrected() const {
        return database(std::span<const std::byte>(copy));
    }
    std::size_t offset() const;

private:
    static constexpr std::size_t WORD = 4; /* the checksum's unit, and the size of the largest number that steers */
    using word = std::array<std::byte, WORD>;

    bool try_word(std::size_t offset, const word &bytes);
    bool try_number(std::size_t offset, std::size_t width, std::uint64_t number);
    bool try_sum(std::size_t offset);
    bool try_header();
    bool try_expected(const finding &f);
    bool try_neighbour(const finding &f);
    bool try_table_before(const finding &f, std::int64_t missing);
    bool try_last_length();
    bool try_words_near(const finding &f);
    bool is_better() const;
    word word_at(std::size_t offset) const;
    void put(std::size_t offset, const word &bytes);

    const database &db;
    std::span<const finding> findings;
    std::vector<std::byte> copy; /* empty: the file is too small or too large */
    word difference = {};        /* of the checksum from the right one; zeros: it is right */
    bool sum_is_wrong = false;
    bool only_sum_is_wrong = false;                /* there are no other errors */
    std::size_t work_left = std::size_t{64} << 20; /* bytes of files that may still be verified */
};

} // namespace cdb

#endif
