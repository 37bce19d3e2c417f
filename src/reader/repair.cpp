/* repair.cpp: tries numbers that might be correct until no error is left. */

#include "reader/repair.h"

#include "format/sections.h"
#include "reader/header.h"
#include "reader/tables.h"

#include <charconv>
#include <limits>

namespace cdb {

namespace {

constexpr std::size_t CHECKSUM_AT = offsetof(orb_cdb_header_t, cdb_hdr_checksum);
constexpr std::size_t NEAR = 64; /* findings whose surroundings are tried */

bool breaks(const finding &f, check rule) {
    return f.broken == &rule_of(rule);
}

/* The number that a finding shows, if it is a number. */
std::optional<std::uint64_t> number_in(std::string_view shown) {
    int base = shown.starts_with("0x") ? 16 : 10;
    shown.remove_prefix(base == 16 ? 2 : 0);
    std::uint64_t number = 0;
    auto [end, error] = std::from_chars(shown.data(), shown.data() + shown.size(), number, base);
    bool whole = error == std::errc() && end == shown.data() + shown.size();
    return whole ? std::optional(number) : std::nullopt;
}

/* The difference between the number that a finding shows and the expected one. */
std::optional<std::int64_t> excess_of(const finding &f) {
    auto found = number_in(f.found), expected = number_in(f.expected);
    if (!found || !expected)
        return std::nullopt;
    return static_cast<std::int64_t>(*found - *expected);
}

/* True if there are no errors and at most this many warnings. Stops verifying at the first finding too many. */
bool has_only_warnings(const database &db, std::size_t most) {
    struct too_much {};
    std::size_t warnings = 0;
    try {
        verify(db, [&](finding &&f) {
            if (f.broken->level == severity::error || ++warnings > most)
                throw too_much();
        });
    } catch (const too_much &) {
        return false;
    }
    return true;
}

std::size_t anchor_at(std::size_t index) {
    return sizeof(orb_cdb_header_t) + index * sizeof(cdb_dsect_anchor_t);
}

template <class Member> std::size_t offset_of(Member rsrc_class_t::*member) {
    static const rsrc_class_t record = {};
    const void *at = &(record.*member);
    return static_cast<std::size_t>(static_cast<const std::byte *>(at) - reinterpret_cast<const std::byte *>(&record));
}

} // namespace

repair::repair(const database &damaged, std::span<const finding> found) : db(damaged), findings(found) {
    auto file = damaged.file().raw();
    if (file.size() < sizeof(orb_cdb_header_t) || file.size() > work_left)
        return;
    copy.assign(file.begin(), file.end());
    std::uint32_t sum = sum_of(db);
    word right = {};
    std::memcpy(right.data(), &sum, WORD);
    word stored = word_at(CHECKSUM_AT);
    for (std::size_t i = 0; i < WORD; ++i)
        difference[i] = stored[i] ^ right[i];
    sum_is_wrong = stored != right;
    auto errors =
        std::count_if(found.begin(), found.end(), [](const finding &f) { return f.broken->level == severity::error; });
    only_sum_is_wrong = sum_is_wrong && errors == 1;
}

repair::word repair::word_at(std::size_t offset) const {
    word bytes = {};
    std::memcpy(bytes.data(), copy.data() + offset, WORD);
    return bytes;
}

void repair::put(std::size_t offset, const word &bytes) {
    std::memcpy(copy.data() + offset, bytes.data(), WORD);
}

std::size_t repair::offset() const {
    std::size_t at = 0;
    auto is_corrected = [&](std::size_t i) { return copy[i] != db.file().raw()[i]; };
    while (!is_corrected(at) || (!sum_is_wrong && at / WORD == CHECKSUM_AT / WORD))
        ++at;
    return at;
}

/* ---- One number ------------------------------------------------------------------------------------------------- */

/* True if no error is left. If the checksum is the only error, a change of any word can make it right, so the corrected
 * word must also remove a warning. */
bool repair::is_better() const {
    if (!only_sum_is_wrong)
        return has_only_warnings(corrected(), std::numeric_limits<std::size_t>::max());
    return findings.size() >= 2 && has_only_warnings(corrected(), findings.size() - 2);
}

/* A checksum that was right stays right. */
bool repair::try_word(std::size_t offset, const word &bytes) {
    word before = word_at(offset), sum_before = word_at(CHECKSUM_AT);
    if (bytes == before || work_left < copy.size())
        return false;
    work_left -= copy.size();
    put(offset, bytes);
    if (!sum_is_wrong && offset != CHECKSUM_AT) {
        word sum = sum_before;
        for (std::size_t i = 0; i < WORD; ++i)
            sum[i] ^= before[i] ^ bytes[i];
        put(CHECKSUM_AT, sum);
    }
    if (is_better())
        return true;
    put(CHECKSUM_AT, sum_before);
    put(offset, before);
    return false;
}

bool repair::try_number(std::size_t offset, std::size_t width, std::uint64_t number) {
    std::size_t in_word = offset % WORD;
    if (in_word + width > WORD || offset + width > copy.size() || (width < WORD && number >> (8 * width) != 0))
        return false;
    word bytes = word_at(offset - in_word);
    for (std::size_t i = 0; i < width; ++i) {
        std::size_t place = db.order() == std::endian::little ? i : width - 1 - i;
        bytes[in_word + place] = static_cast<std::byte>(number >> (8 * i));
    }
    return try_word(offset - in_word, bytes);
}

/* The word that makes the checksum right. */
bool repair::try_sum(std::size_t offset) {
    offset -= offset % WORD;
    if (!sum_is_wrong || offset == CHECKSUM_AT || offset > copy.size() - WORD)
        return false;
    word bytes = word_at(offset);
    for (std::size_t i = 0; i < WORD; ++i)
        bytes[i] ^= difference[i];
    return try_word(offset, bytes);
}

/* ---- Numbers that others say ------------------------------------------------------------------------------------ */

/* The checksum covers as many bytes as the length says, in the byte order that the format word shows. */
bool repair::try_header() {
    if (try_number(offsetof(orb_cdb_header_t, cdb_hdr_length), WORD, copy.size() - WORD))
        return true;
    std::uint32_t format = CDB_FORMAT;
    word bytes = {};
    std::memcpy(bytes.data(), &format, WORD);
    if (try_word(offsetof(orb_cdb_header_t, cdb_hdr_format), bytes))
        return true;
    std::reverse(bytes.begin(), bytes.end());
    return try_word(offsetof(orb_cdb_header_t, cdb_hdr_format), bytes);
}

bool repair::try_expected(const finding &f) {
    std::optional<std::uint64_t> expected = number_in(f.expected);
    std::span<const field> fields = format_of(f.record).fields;
    auto at = std::find_if(fields.begin(), fields.end(), [&](const field &each) { return each.name == f.field; });
    return expected && at != fields.end() && try_number(f.offset, std::min<std::size_t>(at->width, WORD), *expected);
}

/* If something begins in the wrong place, the size of the thing before it may be wrong. */
bool repair::try_neighbour(const finding &f) {
    std::optional<std::int64_t> excess = excess_of(f);
    if (breaks(f, check::SECTION_PLACE) && f.field.empty())
        return try_last_length();
    if (breaks(f, check::TABLE_PLACE) && excess)
        return try_table_before(f, *excess);
    if (!breaks(f, check::SECTION_PLACE) || !excess)
        return false;
    if (f.index == 0)
        return try_number(offsetof(orb_cdb_header_t, cdb_hdr_dsect_count), WORD,
                          (db.anchor(0).cda_offset - sizeof(orb_cdb_header_t)) / sizeof(cdb_dsect_anchor_t));
    return try_number(anchor_at(f.index - 1) + offsetof(cdb_dsect_anchor_t, cda_length), WORD,
                      db.anchor(f.index - 1).cda_length + static_cast<std::uint64_t>(*excess));
}

bool repair::try_last_length() {
    std::size_t last = db.section_count() - 1;
    return db.section_count() > 0 && try_number(anchor_at(last) + offsetof(cdb_dsect_anchor_t, cda_length), WORD,
                                                copy.size() - db.anchor(last).cda_offset);
}

/* Each of the tables before one that begins in the wrong place may have the wrong size. missing: in bytes. */
bool repair::try_table_before(const finding &f, std::int64_t missing) {
    if (!f.section || f.record != format_for<rsrc_class_t>.record)
        return false;
    std::size_t record_at = db.anchor(*f.section).cda_offset;
    auto rc = db.file().record<rsrc_class_t>(record_at);
    for (const side_table &table : side_tables) {
        if (record_at + offset_of(table.ref) == f.offset)
            return false;
        std::int64_t size = static_cast<std::int64_t>(table.size_in(rc)) + missing;
        if (size < 0)
            continue;
        bool counted = table.count != nullptr;
        auto unit = static_cast<std::int64_t>(counted ? table.record->size : 1);
        if ((!counted && table.bytes == nullptr) || size % unit != 0)
            continue;
        std::size_t at = record_at + (counted ? offset_of(table.count) : offset_of(table.bytes));
        if (try_number(at, counted ? sizeof(cdb_uint16_t) : WORD, static_cast<std::uint64_t>(size / unit)))
            return true;
    }
    return false;
}

/* ---- Numbers that the checksum says ----------------------------------------------------------------------------- */

/* The finding's own field; what its reference leads to; and other references to the same place. */
bool repair::try_words_near(const finding &f) {
    if (try_sum(f.offset))
        return true;
    std::optional<std::uint64_t> place = number_in(f.found);
    if (!f.section || !place || *place > copy.size() || db.anchor(*f.section).cda_type != CDB_DSECT_CLASS)
        return false;
    class_tables tables = tables_of(db, *f.section);
    for (const bytes &table : {tables.strings, tables.valid_vals, tables.variety_lists, tables.sd_defs})
        if (table.holds(*place, 2 * WORD)) {
            auto at = static_cast<std::size_t>(table.raw().data() - db.file().raw().data());
            at += static_cast<std::size_t>(*place);
            if (try_sum(at) || try_sum(at + WORD))
                return true;
        }
    const bytes &file = db.file();
    for (std::size_t at = 0; at + WORD <= copy.size(); at += WORD)
        if (file.number<std::uint32_t>(at) == *place && *place != 0 && try_sum(at))
            return true;
    return false;
}

bool repair::succeeds() {
    if (copy.empty() || (only_sum_is_wrong && findings.size() > NEAR)) /* each trial would make all warnings again */
        return false;
    if (try_header())
        return true;
    auto some = findings.first(std::min(findings.size(), NEAR));
    if (!sum_is_wrong)
        return std::any_of(some.begin(), some.end(), [&](const finding &f) { return try_neighbour(f); }) ||
               std::any_of(some.begin(), some.end(), [&](const finding &f) { return try_expected(f); });
    if (std::any_of(some.begin(), some.end(), [&](const finding &f) { return try_words_near(f); }))
        return true;
    for (std::size_t at = 0; at + WORD <= copy.size() && work_left >= copy.size(); at += WORD)
        if (try_sum(at))
            return true;
    return false;
}

} // namespace cdb
