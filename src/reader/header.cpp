/* header.cpp: checks the file as a whole. */

#include "reader/header.h"

#include "format/records.h"
#include "text/hex.h"

#include <functional>
#include <numeric>

namespace cdb {

namespace {

void check_length(reporter &out, const database &db) {
    std::size_t expected = db.file().size() - sizeof(cdb_uint32_t);
    if (db.header().cdb_hdr_length != expected)
        out.report(check::FILE_LENGTH, whole_file,
                   field_of<orb_cdb_header_t>(offsetof(orb_cdb_header_t, cdb_hdr_length)), db.header().cdb_hdr_length,
                   expected);
    if (!db.recognised())
        out.report(check::FORMAT, whole_file, field_of<orb_cdb_header_t>(offsetof(orb_cdb_header_t, cdb_hdr_format)),
                   text::hex(db.header().cdb_hdr_format), text::hex(CDB_FORMAT));
}

/* The result of XOR depends neither on the order of the words nor on their byte order. So the words are used as they
 * are stored, eight at a time, and the caller puts the bytes of the result in order. */
std::uint32_t xor_of_words(std::span<const std::byte> words, const std::byte *first_word) {
    std::array<std::uint32_t, 8> sums = {}, some = {};
    auto add = [&](const std::byte *from, std::size_t size) {
        std::memcpy(some.data(), from, size);
        for (std::size_t i = 0; i < some.size(); ++i)
            sums[i] ^= some[i];
    };
    add(first_word, sizeof(std::uint32_t));
    for (; words.size() >= sizeof some; words = words.subspan(sizeof some))
        add(words.data(), sizeof some);
    some = {};
    add(words.data(), words.size());
    return std::accumulate(sums.begin(), sums.end(), std::uint32_t{0}, std::bit_xor());
}

void check_checksum(reporter &out, const database &db) {
    std::uint32_t sum = sum_of(db);
    auto expected = bytes(std::as_bytes(std::span(&sum, 1)), db.order()).number<std::uint32_t>(0);
    if (expected != db.header().cdb_hdr_checksum)
        out.report(check::CHECKSUM, whole_file,
                   field_of<orb_cdb_header_t>(offsetof(orb_cdb_header_t, cdb_hdr_checksum)),
                   text::hex(db.header().cdb_hdr_checksum), text::hex(expected));
}

void check_record_sizes(reporter &out, const database &db) {
    for (const recorded_size &size : recorded_sizes)
        if (auto found = db.file().number<std::uint16_t>(size.at); found != size.size)
            out.report(check::RECORD_SIZE, whole_file, field_at(cdb_header_fields, size.at).name, size.at, found,
                       size.size);
}

} // namespace

std::uint32_t sum_of(const database &db) {
    constexpr std::size_t FIRST = offsetof(orb_cdb_header_t, cdb_hdr_format);
    constexpr std::size_t WORD = sizeof(std::uint32_t);
    auto raw = db.file().raw();
    std::size_t length = std::min<std::size_t>(db.header().cdb_hdr_length, raw.size() - WORD);
    std::size_t words = length < WORD ? 0 : (length - WORD) / WORD;
    return xor_of_words(raw.subspan(FIRST, words * WORD), raw.data());
}

bool check_header(reporter &out, const database &db) {
    if (db.file().size() < sizeof(orb_cdb_header_t)) {
        out.report(check::FILE_SHORT, whole_file, {}, 0, db.file().size(), sizeof(orb_cdb_header_t));
        return false;
    }
    check_length(out, db);
    check_checksum(out, db);
    check_record_sizes(out, db);
    out.visit<orb_cdb_header_t>(whole_file, db.file(), 0);
    return db.recognised();
}

void check_largest_ids(reporter &out, const database &db) {
    std::uint16_t manager_id = 0, class_id = 0;
    for (const manager &m : db.managers())
        manager_id = std::max(manager_id, m.record().rm_id);
    for (const resource_class &c : db.classes())
        class_id = std::max(class_id, c.record().rc_class_id);
    if (db.header().cdb_hdr_max_rm_id != manager_id)
        out.report(check::LARGEST_ID, whole_file,
                   field_of<orb_cdb_header_t>(offsetof(orb_cdb_header_t, cdb_hdr_max_rm_id)),
                   db.header().cdb_hdr_max_rm_id, manager_id);
    if (db.header().cdb_hdr_max_class_id != class_id)
        out.report(check::LARGEST_ID, whole_file,
                   field_of<orb_cdb_header_t>(offsetof(orb_cdb_header_t, cdb_hdr_max_class_id)),
                   db.header().cdb_hdr_max_class_id, class_id);
}

} // namespace cdb
