/* walk.cpp: verification and the map of regions: the file as a whole, and all sections but classes. */

#include "reader/walk.h"

#include "text/hex.h"

#include <functional>
#include <numeric>
#include <utility>

namespace cdb {

namespace {

/* What follows a header's field of that name in the file: the record sizes. */
struct record_size {
    std::size_t at; /* in the header */
    std::size_t size;
};

constexpr record_size record_sizes[] = {
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_class_size), sizeof(rsrc_class_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_cmmap_size), sizeof(rsrc_cmmap_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_mgr_size), sizeof(rsrc_mgr_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_variable_class_size), sizeof(rsrc_variable_class_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_pattr_size), sizeof(rsrc_pattr_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_dattr_size), sizeof(rsrc_dattr_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_action_size), sizeof(rsrc_action_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_error_size), sizeof(rsrc_error_t)},
    {offsetof(orb_cdb_header_t, cdb_hdr_rsrc_depend_size), sizeof(rsrc_depend_t)},
};

/* Of a record of which there are many. */
bool is_name(const field &f) {
    return f.name == "u_ra_name" || f.name == "u_ac_name" || f.name == "u_sd_field_name";
}

const spot whole_file = {.section = std::nullopt, .record = "orb_cdb_header_t"};

} // namespace

/* ---- Things that references lead to ---------------------------------------------------------------------------- */

extent::extent(const bytes &covered, std::size_t file_offset)
    : area(covered), offset(file_offset), texts_end(covered.size()), marks(units(covered.size())) {
    while (texts_end > 0 && area.raw()[texts_end - 1] != std::byte{0})
        --texts_end;
}

extent::claim_result extent::claim(std::size_t at, std::size_t length) {
    std::size_t first = at / UNIT;
    std::uint8_t mark = TAKEN | BEGINS;
    for (std::size_t unit = first; unit < first + units(length); ++unit) {
        if ((marks[unit] & TAKEN) != 0)
            return unit == first && (marks[unit] & BEGINS) != 0 ? claim_result::AGAIN : claim_result::OVERLAPS;
        marks[unit] |= mark;
        mark = TAKEN;
    }
    return claim_result::FIRST;
}

/* Whether one of eight bytes is zero: where none is, taking 1 from each sets no highest bit that was not set. */
static bool has_zero(const std::byte *unit) {
    constexpr std::uint64_t ONES = 0x0101010101010101;
    std::uint64_t word = 0;
    static_assert(sizeof word == extent::UNIT);
    std::memcpy(&word, unit, sizeof word);
    return ((word - ONES) & ~word & (ONES << 7)) != 0;
}

extent::text_claim extent::claim_text(std::size_t at, std::size_t end) {
    std::uint8_t mark = TAKEN | BEGINS;
    for (std::size_t place = at; place < end; place += UNIT) {
        if (is_taken(place))
            return {place - at, false};
        marks[place / UNIT] |= mark;
        mark = TAKEN;
        std::size_t size = std::min(UNIT, end - place);
        if (size == UNIT && !has_zero(area.raw().data() + place))
            continue;
        std::size_t length = area.part(place, size).text(std::size_t{0}).size();
        if (length < size)
            return {place + length + 1 - at, true};
    }
    return {end - at, false};
}

std::size_t extent::next_text(std::size_t at) const {
    auto from = marks.begin() + static_cast<std::ptrdiff_t>(units(at));
    auto found = std::find_if(from, marks.end(), [](std::uint8_t mark) { return (mark & TEXT) != 0; });
    return std::min(static_cast<std::size_t>(found - marks.begin()) * UNIT, area.size());
}

/* ---- Saying what was seen -------------------------------------------------------------------------------------- */

void walker::report(check broken, const spot &at, std::string_view field, std::size_t offset, std::string found,
                    std::string expected) {
    const rule *rule = &rule_of(broken);
    if (excuse && rule->level == severity::error)
        rule = &rule_of(*excuse);
    findings.push_back({rule, at.section, at.record, at.index, field, offset, std::move(found), std::move(expected)});
}

void walker::report(check broken, const spot &at, std::string_view field, std::size_t offset, std::uint64_t found,
                    std::uint64_t expected) {
    report(broken, at, field, offset, std::to_string(found), std::to_string(expected));
}

void walker::report_id(const spot &at, std::string_view field, vx_uint32_t found, vx_uint32_t expected) {
    report(check::RECORD_ID, at, field, at.offset, text::hex(found), text::hex(expected));
}

void walker::report_reserved(const spot &at, std::string_view field, std::span<const std::byte> stretch,
                             std::size_t file_offset) {
    auto wrong = std::find_if(stretch.begin(), stretch.end(), [](std::byte b) { return b != std::byte{0}; });
    auto distance = static_cast<std::size_t>(wrong - stretch.begin());
    report(check::RESERVED, at, field, file_offset + distance, text::hex(std::to_integer<unsigned>(*wrong)), "0x0");
}

void walker::add_regions(const spot &at, const bytes &area, std::size_t offset, std::span<const field> fields) {
    for (const field &f : fields) {
        std::size_t size = std::size_t{f.width} * f.count;
        if (f.kind != field_kind::entries && area.holds(offset + f.offset, size))
            add_region(at, at.offset + f.offset, size, at.record, &f);
    }
}

/* ---- Texts ----------------------------------------------------------------------------------------------------- */

void walker::visit_text(const spot &at, const field &ref, std::uint32_t offset, extent &strings) {
    std::size_t place = at.offset + ref.offset;
    if (offset == CDB_NONE) {
        if (!ref.optional)
            report(check::REFERENCE_NONE, at, ref.name, place, "none", "a text");
    } else if (offset == 0 && strings.area.size() == 0)
        report(check::TEXT_MISSING, at, ref.name, place, "0 in an empty table", "a text");
    else if (offset % extent::UNIT != 0)
        report(check::REFERENCE_UNALIGNED, at, ref.name, place, std::to_string(offset), "a multiple of 8");
    else if (offset >= strings.texts_end)
        report(check::TEXT_OUTSIDE, at, ref.name, place, std::to_string(offset),
               "a text in " + std::to_string(strings.area.size()) + " bytes");
    else if (offset == 0 && (!is_name(ref) || may_be_unset))
        strings.first_text_asked_for = true;
    else if (strings.is_text(offset))
        report(check::VALUE_SHARED, at, ref.name, place, std::to_string(offset), "a text of its own");
    else
        note_text(at, strings, offset);
}

/* Where texts end, they tell themselves; where they may end, the next one tells: it is to be known first. What is
 * excused comes last, and may begin amid something else. */
void walker::note_text(const spot &at, extent &strings, std::size_t offset) {
    if (excuse)
        walk_text(at, strings, offset, strings.area.size());
    else
        strings.note_text(offset);
}

/* One text, which reaches to the place end at the most: there the next text begins, or the table ends. */
void walker::walk_text(const spot &in, extent &strings, std::size_t start, std::size_t end) {
    auto [size, whole] = strings.claim_text(start, end);
    spot text = {in.section, "text", 0, strings.offset + start};
    add_region(text, text.offset, size, text.record);
    if (!whole)
        return report(check::VALUE_SHARED, text, {}, text.offset, "a text that runs into something else",
                      "a place of its own");
    std::size_t filled = std::min(end, extent::units(start + size) * extent::UNIT);
    std::size_t filling = filled - start - size;
    expect_zero(text, "filling", strings.area, start + size, filling, text.offset + size);
    add_region(text, text.offset + size, filling, "filling");
}

void walker::finish_texts(const spot &at, extent &strings) {
    if (strings.first_text_asked_for)
        strings.note_text(0);
    for (std::size_t start = strings.next_text(0); start < strings.area.size();) {
        std::size_t next = strings.next_text(start + 1);
        walk_text(at, strings, start, next);
        start = next;
    }
}

/* ---- The file as a whole --------------------------------------------------------------------------------------- */

void walker::check_length() {
    std::size_t expected = db.file().size() - sizeof(cdb_uint32_t);
    if (db.header().cdb_hdr_length != expected)
        report(check::FILE_LENGTH, whole_file, "cdb_hdr_length", offsetof(orb_cdb_header_t, cdb_hdr_length),
               db.header().cdb_hdr_length, expected);
    if (!db.recognised())
        report(check::FORMAT, whole_file, "cdb_hdr_format", offsetof(orb_cdb_header_t, cdb_hdr_format),
               text::hex(db.header().cdb_hdr_format), text::hex(CDB_FORMAT));
}

/* XORing words depends neither on their order nor on that of their bytes: it is done eight words at a time, and the
 * result is turned. */
void walker::check_checksum() {
    constexpr std::size_t FIRST = offsetof(orb_cdb_header_t, cdb_hdr_format);
    constexpr std::size_t WORD = sizeof(std::uint32_t);
    auto raw = db.file().raw();
    std::size_t length = std::min<std::size_t>(db.header().cdb_hdr_length, raw.size() - WORD);
    std::size_t words = length < WORD ? 0 : (length - WORD) / WORD;
    std::array<std::uint32_t, 8> sums = {}, some = {};
    auto add = [&](const std::byte *from, std::size_t size) {
        std::memcpy(some.data(), from, size);
        for (std::size_t i = 0; i < some.size(); ++i)
            sums[i] ^= some[i];
    };
    add(raw.data(), WORD);
    auto left = raw.subspan(FIRST, words * WORD);
    for (; left.size() >= sizeof some; left = left.subspan(sizeof some))
        add(left.data(), sizeof some);
    some = {};
    add(left.data(), left.size());
    std::uint32_t sum = std::accumulate(sums.begin(), sums.end(), std::uint32_t{0}, std::bit_xor());
    auto turned = bytes(std::as_bytes(std::span(&sum, 1)), db.order()).number<std::uint32_t>(0);
    if (turned != db.header().cdb_hdr_checksum)
        report(check::CHECKSUM, whole_file, "cdb_hdr_checksum", offsetof(orb_cdb_header_t, cdb_hdr_checksum),
               text::hex(db.header().cdb_hdr_checksum), text::hex(turned));
}

void walker::check_record_sizes() {
    for (const record_size &size : record_sizes)
        if (auto found = db.file().number<std::uint16_t>(size.at); found != size.size)
            report(check::RECORD_SIZE, whole_file, field_at(cdb_header_fields, size.at)->name, size.at, found,
                   size.size);
}

void walker::check_largest_ids() {
    std::uint16_t manager_id = 0, class_id = 0;
    for (const manager &m : db.managers())
        manager_id = std::max(manager_id, m.record().rm_id);
    for (const resource_class &c : db.classes())
        class_id = std::max(class_id, c.record().rc_class_id);
    if (db.header().cdb_hdr_max_rm_id != manager_id)
        report(check::LARGEST_ID, whole_file, "cdb_hdr_max_rm_id", offsetof(orb_cdb_header_t, cdb_hdr_max_rm_id),
               db.header().cdb_hdr_max_rm_id, manager_id);
    if (db.header().cdb_hdr_max_class_id != class_id)
        report(check::LARGEST_ID, whole_file, "cdb_hdr_max_class_id", offsetof(orb_cdb_header_t, cdb_hdr_max_class_id),
               db.header().cdb_hdr_max_class_id, class_id);
}

bool walker::walk_header() {
    if (db.file().size() < sizeof(orb_cdb_header_t)) {
        report(check::FILE_SHORT, whole_file, {}, 0, db.file().size(), sizeof(orb_cdb_header_t));
        return false;
    }
    check_length();
    check_checksum();
    check_record_sizes();
    visit<orb_cdb_header_t>(whole_file, db.file(), 0);
    return db.recognised();
}

/* ---- Sections -------------------------------------------------------------------------------------------------- */

/* Sections follow each other without gaps. One that overlaps those before it is not walked: the work must not depend on
 * how many anchors lead to the same bytes. */
bool walker::place_section(const spot &at, const cdb_dsect_anchor_t &anchor) {
    std::size_t place = at.offset + offsetof(cdb_dsect_anchor_t, cda_offset);
    if (!db.file().holds(anchor.cda_offset, anchor.cda_length)) {
        report(check::SECTION_OUTSIDE, at, "cda_offset", place,
               std::to_string(anchor.cda_offset) + " + " + std::to_string(anchor.cda_length),
               "at most " + std::to_string(db.file().size()));
        return false;
    }
    if (anchor.cda_offset != sections_end)
        report(check::SECTION_PLACE, at, "cda_offset", place, anchor.cda_offset, sections_end);
    if (anchor.cda_offset < sections_end)
        return false;
    sections_end = std::size_t{anchor.cda_offset} + anchor.cda_length;
    return true;
}

void walker::walk_anchor(std::size_t index) {
    spot at = {.section = index,
               .record = "cdb_dsect_anchor_t",
               .index = index,
               .offset = sizeof(orb_cdb_header_t) + index * sizeof(cdb_dsect_anchor_t)};
    visit<cdb_dsect_anchor_t>(at, db.file(), at.offset);
    cdb_dsect_anchor_t anchor = db.anchor(index);
    if (place_section(at, anchor))
        walk_section(at, anchor);
}

void walker::walk_anchors() {
    std::size_t count = db.section_count();
    if (count < db.header().cdb_hdr_dsect_count)
        report(check::ANCHORS_OUTSIDE, whole_file, "cdb_hdr_dsect_count",
               offsetof(orb_cdb_header_t, cdb_hdr_dsect_count), db.header().cdb_hdr_dsect_count, count);
    sections_end = sizeof(orb_cdb_header_t) + count * sizeof(cdb_dsect_anchor_t);
    for (std::size_t i = 0; i < count; ++i)
        walk_anchor(i);
    if (sections_end != db.file().size())
        report(check::SECTION_PLACE, whole_file, {}, sections_end,
               "end of the last section at " + std::to_string(sections_end),
               "end of the file at " + std::to_string(db.file().size()));
}

/* What is known of a section's type. */
struct walker::section_kind {
    cdb_dsect_type_t type;
    int rank; /* its place in the order of sections */
    std::string_view record;
    std::size_t record_size;
    void (walker::*walk)(spot at, const bytes &section);
};

const walker::section_kind walker::section_kinds[] = {
    {CDB_DSECT_CLASS, 0, "rsrc_class_t", sizeof(rsrc_class_t), &walker::walk_class_section},
    {CDB_DSECT_RSRC_MGR, 1, "rsrc_mgr_t", sizeof(rsrc_mgr_t), &walker::walk_manager},
    {CDB_DSECT_CMMAP, 2, "rsrc_cmmap_t", sizeof(rsrc_cmmap_t), &walker::walk_map},
    {CDB_DSECT_VAR_CLASS, 3, "rsrc_variable_class_t", sizeof(rsrc_variable_class_t), &walker::walk_variable_class},
    {CDB_DSECT_CLASS_HASH, 4, "rsrc_class_hash_t", offsetof(rsrc_class_hash_t, rc_hash_blocks),
     &walker::walk_class_hash},
};

void walker::walk_section(const spot &anchor_at, const cdb_dsect_anchor_t &anchor) {
    auto kind = std::find_if(std::begin(section_kinds), std::end(section_kinds),
                             [&](const section_kind &k) { return k.type == anchor.cda_type; });
    if (kind == std::end(section_kinds)) {
        bool unused = anchor.cda_type <= CDB_DSECT_TBL_CNTRS;
        report(unused ? check::SECTION_UNUSED : check::SECTION_TYPE, anchor_at, "cda_type", anchor_at.offset,
               std::to_string(anchor.cda_type), "3 to 7");
        return;
    }
    if (kind->rank < section_rank)
        report(check::SECTION_ORDER, anchor_at, "cda_type", anchor_at.offset, anchor.cda_type,
               section_kinds[section_rank].type);
    section_rank = std::max(section_rank, kind->rank);
    std::size_t length_at = anchor_at.offset + offsetof(cdb_dsect_anchor_t, cda_length);
    if (anchor.cda_length < kind->record_size) {
        report(check::SECTION_LENGTH, anchor_at, "cda_length", length_at, std::to_string(anchor.cda_length),
               "at least " + std::to_string(kind->record_size));
        return;
    }
    (this->*kind->walk)({anchor_at.section, kind->record, 0, anchor.cda_offset},
                        db.file().part(anchor.cda_offset, anchor.cda_length));
}

void walker::walk_class_section(spot at, const bytes &section) {
    walk_class(*this, at, section, at.section == last_class);
}

/* A section's own strings, rounded up, end it. */
void walker::expect_rounded(const spot &at, const bytes &section, std::size_t strings_at) {
    std::size_t size = section.size() - std::min(strings_at, section.size());
    if (size % extent::UNIT != 0)
        report(check::SECTION_LENGTH, at, {}, at.offset, std::to_string(size) + " bytes of strings", "a multiple of 8");
}

void walker::walk_manager(spot at, const bytes &section) {
    auto record = section.record<rsrc_mgr_t>(0);
    visit<rsrc_mgr_t>(at, section, 0);
    expect_id(at, "rm_cb_ID", record.rm_cb_ID, CDB_ID_MGR);
    extent strings(section.part(sizeof record), at.offset + sizeof record);
    visit_text(at, *field_at(mgr_fields, offsetof(rsrc_mgr_t, u_rm_RMname)), record.u_rm_RMname.offset[0], strings);
    finish_texts(at, strings);
    expect_rounded(at, section, sizeof record);
}

void walker::walk_map(spot at, const bytes &section) {
    auto record = section.record<rsrc_cmmap_t>(0);
    visit<rsrc_cmmap_t>(at, section, 0);
    expect_id(at, "rcm_cb_ID", record.rcm_cb_ID, CDB_ID_CMMAP);
    std::size_t strings_at = record.u_rcm_strings.offset[0];
    if (strings_at != sizeof record)
        report(check::TABLE_PLACE, at, "u_rcm_strings", at.offset + offsetof(rsrc_cmmap_t, u_rcm_strings), strings_at,
               sizeof record);
    extent strings(section.part(strings_at), at.offset + strings_at);
    visit_text(at, *field_at(cmmap_fields, offsetof(rsrc_cmmap_t, u_rcm_msg_file)), record.u_rcm_msg_file.offset[0],
               strings);
    finish_texts(at, strings);
    expect_rounded(at, section, sizeof record);
}

void walker::walk_variable_class(spot at, const bytes &section) {
    auto record = section.record<rsrc_variable_class_t>(0);
    visit<rsrc_variable_class_t>(at, section, 0);
    expect_id(at, "rvc_cb_ID", record.rvc_cb_ID, CDB_ID_VARIABLE_CLASS);
    std::size_t strings_size = record.u_rvc_string_tbl.offset[0];
    extent strings(section.part(sizeof record, strings_size), at.offset + sizeof record);
    visit_text(at, *field_at(variable_class_fields, offsetof(rsrc_variable_class_t, u_rvc_name)),
               record.u_rvc_name.offset[0], strings);
    visit_text(at, *field_at(variable_class_fields, offsetof(rsrc_variable_class_t, u_rvc_compat_name)),
               record.u_rvc_compat_name.offset[0], strings);
    finish_texts(at, strings);
    if (strings_size % extent::UNIT != 0)
        report(check::REFERENCE_UNALIGNED, at, "u_rvc_string_tbl",
               at.offset + offsetof(rsrc_variable_class_t, u_rvc_string_tbl), std::to_string(strings_size),
               "a multiple of 8");
    walk_variable_ids(at, section, sizeof record + strings_size, record.rvc_var_count);
}

/* The IDs, rounded up to a multiple of 8, end the section. */
void walker::walk_variable_ids(const spot &record_at, const bytes &section, std::size_t first, std::size_t count) {
    if (!std::exchange(dynamic_ids_sorted, true))
        std::sort(dynamic_ids.begin(), dynamic_ids.end());
    std::size_t length = extent::units(count * sizeof(var_id_t)) * extent::UNIT;
    if (first + length != section.size())
        report(check::SECTION_LENGTH, record_at, "rvc_var_count",
               record_at.offset + offsetof(rsrc_variable_class_t, rvc_var_count), section.size(), first + length);
    count = count_inside(section, first, count, sizeof(var_id_t));
    spot at = {record_at.section, "var_id_t", 0, record_at.offset + first};
    for (; at.index < count; ++at.index, at.offset += sizeof(var_id_t)) {
        add_region(at, at.offset, sizeof(var_id_t), at.record);
        auto id = section.number<var_id_t>(first + at.index * sizeof(var_id_t));
        if (!std::binary_search(dynamic_ids.begin(), dynamic_ids.end(), id))
            report(check::VARIABLE_ID, at, {}, at.offset, std::to_string(id), "the ID of a dynamic attribute");
    }
    std::size_t end = first + count * sizeof(var_id_t);
    std::size_t filling = std::min(section.size(), first + length) - std::min(section.size(), end);
    expect_zero(at, "filling", section, end, filling, at.offset);
    add_region(at, at.offset, filling, "filling");
}

void walker::walk_class_hash(spot at, const bytes &section) {
    constexpr std::size_t BLOCKS = offsetof(rsrc_class_hash_t, rc_hash_blocks);
    visit<rsrc_class_hash_t>(at, section, 0);
    std::size_t count = section.number<std::uint32_t>(offsetof(rsrc_class_hash_t, rch_num_hash_blocks));
    if (BLOCKS + count * sizeof(rc_hash_block_t) != section.size())
        report(check::SECTION_LENGTH, at, "rch_num_hash_blocks",
               at.offset + offsetof(rsrc_class_hash_t, rch_num_hash_blocks), section.size(),
               BLOCKS + count * sizeof(rc_hash_block_t));
    spot block = {at.section, "rc_hash_block_t", 0, at.offset + BLOCKS};
    for (count = count_inside(section, BLOCKS, count, sizeof(rc_hash_block_t)); block.index < count; ++block.index) {
        visit<rc_hash_block_t>(block, section, block.offset - at.offset);
        block.offset += sizeof(rc_hash_block_t);
    }
}

/* ---- The walk -------------------------------------------------------------------------------------------------- */

void walker::find_last_class() {
    for (std::size_t i = 0; i < db.section_count(); ++i)
        if (db.anchor(i).cda_type == CDB_DSECT_CLASS)
            last_class = i;
}

void walker::note_dynamic_id(std::int32_t id, bool of_class) {
    if (!dynamic_ids_sorted)
        dynamic_ids.push_back(static_cast<var_id_t>(id) | (of_class ? VAR_ID_CLASS_ATTR : 0));
}

void walker::walk() {
    if (!walk_header())
        return;
    find_last_class();
    walk_anchors();
    check_largest_ids();
}

std::vector<finding> verify(const database &db) {
    std::vector<finding> findings;
    walker(db, findings, nullptr).walk();
    return findings;
}

bool is_sound(std::span<const finding> findings) {
    return std::none_of(findings.begin(), findings.end(),
                        [](const finding &f) { return f.broken->level == severity::error; });
}

/* Damaged files may call one byte by two names: the first one in the file, the longer one of two, has it. */
std::vector<region> regions(const database &db) {
    std::vector<finding> findings;
    std::vector<region> seen, all;
    walker(db, findings, &seen).walk();
    std::stable_sort(seen.begin(), seen.end(), [](const region &a, const region &b) {
        return a.offset != b.offset ? a.offset < b.offset : a.size > b.size;
    });
    std::size_t end = 0;
    auto fill = [&](std::size_t to) {
        if (to > end)
            all.push_back({end, to - end, std::nullopt, "unreached", 0, nullptr});
    };
    for (const region &r : seen) {
        if (r.offset < end)
            continue;
        fill(r.offset);
        all.push_back(r);
        end = r.offset + r.size;
    }
    fill(db.file().size());
    return all;
}

} // namespace cdb
