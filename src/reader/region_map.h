/* region_map.h: the meaning of each stretch of a file, collected in any order and passed on in the order of the file.
 */
#ifndef CDGEN_READER_REGION_MAP_H
#define CDGEN_READER_REGION_MAP_H

#include "cdb_view.h"

#include "format/records.h"

#include <deque>

namespace cdb {

/* The kind of a stretch: a record, by its position in record_formats, or one of the values after those. */
namespace stretch_kind {
inline constexpr std::uint8_t TEXT = std::size(record_formats);
inline constexpr std::uint8_t LENGTH = TEXT + 1;
inline constexpr std::uint8_t BINARY = TEXT + 2;
inline constexpr std::uint8_t HANDLE = TEXT + 3;
inline constexpr std::uint8_t VALUE = TEXT + 4;
inline constexpr std::uint8_t VARIABLE_ID = TEXT + 5;
inline constexpr std::uint8_t FILLING = TEXT + 6;
inline constexpr std::uint8_t COUNT = TEXT + 7;
} // namespace stretch_kind

/* By name: with a sanitizer, GCC 12 compares no addresses of inline variables at compile time on i686. */
constexpr std::uint8_t kind_of_record(const record_format &format) {
    std::uint8_t kind = 0;
    while (record_formats[kind]->record != format.record)
        ++kind;
    return kind;
}

/* The regions of one part of a file: of its header and anchors, or of a section. A record takes 20 bytes of memory,
 * however many fields it has, and so does a sequence of values or records, because a file may have as many of them as
 * it has words. */
class region_map {
public:
    using taker = std::function<void(const region &)>;

    /* file_size: in bytes. */
    region_map(std::size_t file_size, const taker &to) : size(file_size), take(to) {}

    /* Begins a part, whose regions are at most 4 GB away from its start. section: position among the anchors; no value
     * for the part with the anchors, each of which belongs to its own section. */
    void begin_part(std::optional<std::size_t> part_section, std::size_t part_start) {
        section = part_section;
        start = part_start;
    }

    /* offset: in the file. index: of the record in its table, or of the entry in its list. */
    void add(std::uint8_t kind, std::size_t offset, std::size_t length, std::size_t index);

    /* Passes on the regions of the part, and the unreached bytes before and between them. If two regions overlap, the
     * one that starts first wins; if they start together, the longer one; if they have the same length, the one that
     * was added first. */
    void finish_part();
    /* Passes on the unreached bytes after the last region. */
    void finish();

private:
    struct stretch {
        std::uint32_t offset; /* from the start of the part */
        std::uint32_t length; /* bytes, of all that follow each other */
        std::uint32_t index;  /* of the first */
        std::uint32_t order;  /* of adding */
        std::uint8_t kind;
    };

    /* The next region of a stretch whose regions are being passed on. */
    class cursor;

    bool stands_alone(const std::deque<stretch>::const_iterator &one) const;
    void hand_over_all(const stretch &of);
    void hand_over(const region &r);
    void hand_over_unreached(std::size_t to);

    std::size_t size;
    const taker &take;
    std::optional<std::size_t> section;
    std::size_t start = 0;
    std::size_t end = 0; /* of the regions that were passed on */
    std::deque<stretch> stretches;
};

} // namespace cdb

#endif
