/* verify.cpp: the one walk over a database that verification and the map of its regions share. It visits everything
 * that can be reached from the header once. */

#include "format/sections.h"
#include "reader/class.h"
#include "reader/header.h"
#include "reader/sections.h"

#include <utility>

namespace cdb {

namespace {

class file_walk {
public:
    /* map: null if no regions are wanted. */
    file_walk(const database &walked, const finding_taker &to, region_map *map)
        : db(walked), out(to, map), regions(map), last_class(find_last_class(walked)) {}

    void run();

private:
    static std::size_t find_last_class(const database &db);
    void add_beginning(std::size_t anchors);
    void walk_anchors();
    void walk_anchor(std::size_t index);
    bool place_section(const location &at, const cdb_dsect_anchor_t &anchor);
    void walk_section(const location &anchor_at, const cdb_dsect_anchor_t &anchor, const section_kind &kind);
    void walk_whole_section(cdb_dsect_type_t type, const location &at, const bytes &section);
    void walk_section_of(cdb_dsect_type_t type, const location &at, const bytes &section);
    std::span<const var_id_t> sorted_ids();

    const database &db;
    reporter out;
    region_map *regions;               /* null: no regions are wanted */
    std::size_t last_class;            /* position of the last class among the anchors */
    std::size_t sections_end = 0;      /* end of the sections walked so far, in the file */
    int section_rank = 0;              /* the highest so far, in the order of types */
    std::vector<var_id_t> dynamic_ids; /* of the classes before the first variable class */
    bool dynamic_ids_sorted = false;   /* a variable class was met */
};

std::size_t file_walk::find_last_class(const database &db) {
    std::size_t last = 0;
    for (std::size_t i = 0; i < db.section_count(); ++i)
        if (db.anchor(i).cda_type == CDB_DSECT_CLASS)
            last = i;
    return last;
}

/* Sections follow each other without gaps. A section that overlaps earlier ones is not walked, because the work must
 * not depend on how many anchors lead to the same bytes. */
bool file_walk::place_section(const location &at, const cdb_dsect_anchor_t &anchor) {
    const field &placed = field_of<cdb_dsect_anchor_t>(offsetof(cdb_dsect_anchor_t, cda_offset));
    if (!db.file().holds(anchor.cda_offset, anchor.cda_length)) {
        out.report(check::SECTION_OUTSIDE, at, placed,
                   std::to_string(anchor.cda_offset) + " + " + std::to_string(anchor.cda_length),
                   "at most " + std::to_string(db.file().size()));
        return false;
    }
    if (anchor.cda_offset != sections_end)
        out.report(check::SECTION_PLACE, at, placed, anchor.cda_offset, sections_end);
    if (anchor.cda_offset < sections_end)
        return false;
    sections_end = std::size_t{anchor.cda_offset} + anchor.cda_length;
    return true;
}

void file_walk::walk_anchor(std::size_t index) {
    location at = {.section = index,
                   .record = "cdb_dsect_anchor_t",
                   .index = index,
                   .offset = sizeof(orb_cdb_header_t) + index * sizeof(cdb_dsect_anchor_t)};
    cdb_dsect_anchor_t anchor = db.anchor(index);
    if (!place_section(at, anchor))
        return;
    if (const section_kind *kind = kind_of(anchor.cda_type))
        return walk_section(at, anchor, *kind);
    bool unused = anchor.cda_type < std::size(section_kinds);
    out.report(unused ? check::SECTION_UNUSED : check::SECTION_TYPE, at,
               field_of<cdb_dsect_anchor_t>(offsetof(cdb_dsect_anchor_t, cda_type)), std::to_string(anchor.cda_type),
               "3 to 7");
}

/* The regions of the header and the anchors, which come before all sections. */
void file_walk::add_beginning(std::size_t anchors) {
    constexpr std::uint8_t ANCHOR = kind_of_record(format_for<cdb_dsect_anchor_t>);
    for (std::size_t i = 0; i < anchors; ++i)
        regions->add(ANCHOR, sizeof(orb_cdb_header_t) + i * sizeof(cdb_dsect_anchor_t), sizeof(cdb_dsect_anchor_t), i);
    regions->finish_part();
}

void file_walk::walk_anchors() {
    std::size_t count = db.section_count();
    if (count < db.header().cdb_hdr_dsect_count)
        out.report(check::ANCHORS_OUTSIDE, whole_file,
                   field_of<orb_cdb_header_t>(offsetof(orb_cdb_header_t, cdb_hdr_dsect_count)),
                   db.header().cdb_hdr_dsect_count, count);
    sections_end = sizeof(orb_cdb_header_t) + count * sizeof(cdb_dsect_anchor_t);
    if (regions != nullptr)
        add_beginning(count);
    for (std::size_t i = 0; i < count; ++i)
        walk_anchor(i);
    if (sections_end != db.file().size())
        out.report(check::SECTION_PLACE, whole_file, {}, sections_end,
                   "end of the last section at " + std::to_string(sections_end),
                   "end of the file at " + std::to_string(db.file().size()));
}

void file_walk::walk_section(const location &anchor_at, const cdb_dsect_anchor_t &anchor, const section_kind &kind) {
    if (kind.rank < section_rank)
        out.report(check::SECTION_ORDER, anchor_at,
                   field_of<cdb_dsect_anchor_t>(offsetof(cdb_dsect_anchor_t, cda_type)), anchor.cda_type,
                   type_of_rank(section_rank));
    section_rank = std::max(section_rank, kind.rank);
    if (anchor.cda_length < kind.root->size)
        out.report(check::SECTION_LENGTH, anchor_at,
                   field_of<cdb_dsect_anchor_t>(offsetof(cdb_dsect_anchor_t, cda_length)),
                   std::to_string(anchor.cda_length), "at least " + std::to_string(kind.root->size));
    else
        walk_whole_section(kind.type, {anchor_at.section, kind.root->record, 0, anchor.cda_offset},
                           db.file().part(anchor.cda_offset, anchor.cda_length));
}

void file_walk::walk_whole_section(cdb_dsect_type_t type, const location &at, const bytes &section) {
    if (regions != nullptr)
        regions->begin_part(at.section, at.offset);
    walk_section_of(type, at, section);
    if (regions != nullptr)
        regions->finish_part();
}

/* A variable class may refer to the attributes of classes before the first variable class only. */
void file_walk::walk_section_of(cdb_dsect_type_t type, const location &at, const bytes &section) {
    std::vector<var_id_t> too_late;
    switch (type) {
    case CDB_DSECT_CLASS:
        return walk_class(out, at, section, at.section == last_class, dynamic_ids_sorted ? too_late : dynamic_ids);
    case CDB_DSECT_RSRC_MGR:
        return walk_manager(out, at, section);
    case CDB_DSECT_CMMAP:
        return walk_map(out, at, section);
    case CDB_DSECT_VAR_CLASS:
        return walk_variable_class(out, at, section, sorted_ids());
    case CDB_DSECT_CLASS_HASH:
        return walk_class_hash(out, at, section);
    case CDB_DSECT_UNUSED:
    case CDB_DSECT_EMPTY:
    case CDB_DSECT_TBL_CNTRS:
        return;
    }
}

std::span<const var_id_t> file_walk::sorted_ids() {
    if (!std::exchange(dynamic_ids_sorted, true))
        std::sort(dynamic_ids.begin(), dynamic_ids.end());
    return dynamic_ids;
}

void file_walk::run() {
    if (check_header(out, db)) {
        walk_anchors();
        check_largest_ids(out, db);
    }
    if (regions != nullptr) {
        regions->finish_part();
        regions->finish();
    }
}

} // namespace

void verify(const database &db, const std::function<void(finding &&)> &take) {
    file_walk(db, take, nullptr).run();
}

std::vector<finding> verify(const database &db) {
    std::vector<finding> findings;
    verify(db, [&findings](finding &&f) { findings.push_back(std::move(f)); });
    return findings;
}

bool is_sound(std::span<const finding> findings) {
    return std::none_of(findings.begin(), findings.end(),
                        [](const finding &f) { return f.broken->level == severity::error; });
}

void regions(const database &db, const std::function<void(const region &)> &take) {
    finding_taker ignore = [](finding &&) {};
    region_map map(db.file().size(), take);
    file_walk(db, ignore, &map).run();
}

std::vector<region> regions(const database &db) {
    std::vector<region> all;
    regions(db, [&all](const region &r) { all.push_back(r); });
    return all;
}

} // namespace cdb
