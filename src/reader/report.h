/* report.h: collects what the walk over a database reports: which rules are broken and, on request, the meaning of each
 * stretch of the file. */
#ifndef CDGEN_READER_REPORT_H
#define CDGEN_READER_REPORT_H

#include "reader/fields.h"
#include "reader/region_map.h"
#include "reader/rules.h"

namespace cdb {

/* A record, or an entry of a list, as findings and regions name it. */
struct location {
    std::optional<std::size_t> section;
    std::string_view record = {};
    std::size_t index = 0;
    std::size_t offset = 0; /* of the record, in the file */
};

inline bool all_zero(std::span<const std::byte> stretch) {
    std::uint64_t word = 0;
    for (; stretch.size() >= sizeof word && word == 0; stretch = stretch.subspan(sizeof word))
        std::memcpy(&word, stretch.data(), sizeof word);
    return word == 0 && std::all_of(stretch.begin(), stretch.end(), [](std::byte b) { return b == std::byte{0}; });
}

/* Called with each finding as soon as it is made. */
using finding_taker = std::function<void(finding &&)>;

class reporter {
public:
    /* map: null if no regions are wanted. */
    reporter(const finding_taker &to, region_map *map) : take(to), regions(map) {}

    /* offset: in the file. */
    void report(check broken, const location &at, std::string_view field, std::size_t offset, std::string found,
                std::string expected);
    /* The same with numbers, in decimal. */
    void report(check broken, const location &at, std::string_view field, std::size_t offset, std::uint64_t found,
                std::uint64_t expected);

    /* Both are about a field of the record at this place. */
    void report(check broken, const location &at, const field &f, std::string found, std::string expected) {
        report(broken, at, f.name, at.offset + f.offset, std::move(found), std::move(expected));
    }
    void report(check broken, const location &at, const field &f, std::uint64_t found, std::uint64_t expected) {
        report(broken, at, f.name, at.offset + f.offset, found, expected);
    }

    /* kind: as in stretch_kind. */
    void add_region(const location &at, std::size_t offset, std::size_t size, std::uint8_t kind) {
        if (regions != nullptr && size > 0)
            regions->add(kind, offset, size, at.index);
    }

    /* Adds the regions of a record's fields, and reports reserved ones that are not zero. A list's entries are not part
     * of it. offset: of the record in the area, which must hold all of it. */
    template <class Record> void visit(const location &at, const bytes &area, std::size_t offset) {
        constexpr std::uint8_t KIND = kind_of_record(format_for<Record>);
        for (const field &f : reserved_fields_of<Record>)
            expect_zero(at, f.name, area, offset + f.offset, std::size_t{f.width} * f.count, at.offset + f.offset);
        add_region(at, at.offset, format_for<Record>.size, KIND);
    }
    void expect_id(const location &at, std::string_view field, vx_uint32_t found, vx_uint32_t expected) {
        if (found != expected)
            report_id(at, field, found, expected);
    }
    /* Reports the first of the bytes that is not zero, if any. file_offset: of the first byte. */
    void expect_zero(const location &at, std::string_view field, const bytes &area, std::size_t offset,
                     std::size_t length, std::size_t file_offset) {
        if (auto stretch = area.part(offset, length).raw(); !all_zero(stretch))
            report_reserved(at, field, stretch, file_offset);
    }

    /* While this is set, errors are reported as this warning, because the compiler can make them from a careless
     * source. */
    std::optional<check> excuse;

private:
    void report_id(const location &at, std::string_view field, vx_uint32_t found, vx_uint32_t expected);
    void report_reserved(const location &at, std::string_view field, std::span<const std::byte> stretch,
                         std::size_t file_offset);

    const finding_taker &take;
    region_map *regions;
};

} // namespace cdb

#endif
