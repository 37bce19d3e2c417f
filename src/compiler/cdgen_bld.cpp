/* cdgen_bld.cpp: sizes the image and writes it into the mapped output file, once, through a cursor that only moves
 * forward. Records are copied into and out of the image, because sections are not aligned. */

#include "compiler/cdgen_image.h"

#include "compiler/cdgen_context.h"
#include "compiler/cdgen_swap.h"
#include "format/checksum.h"
#include "format/sections.h"

#include <algorithm>
#include <cstdlib>
#include <limits>
#include <sys/time.h>

namespace {

size_t used_bytes(const tbl_content *t) {
    return t == nullptr || t->tbl_base == nullptr ? 0 : t->used();
}

size_t used_bytes(const cdb_ref_t &table) {
    return used_bytes(staged_content(table));
}

/* ---- Sizes ----------------------------------------------------------------------------------------------------- */

/* Offsets and sizes in the file have 32 bits. */
vx_uint32_t checked_size(vx_uint64_t bytes) {
    if (bytes > std::numeric_limits<vx_uint32_t>::max())
        bld_error_exit(MSG_TABLE_TOO_LARGE, nullptr, nullptr, 1);
    return static_cast<vx_uint32_t>(bytes);
}

/* Counts have 16. */
vx_uint16_t checked_count(const cdb_ref_t &table, size_t record) {
    size_t count = used_bytes(table) / record;
    if (count > std::numeric_limits<vx_uint16_t>::max())
        bld_error_exit(MSG_TOO_MANY_RECORDS, staged_content(table)->tbl_name, nullptr, 1);
    return static_cast<vx_uint16_t>(count);
}

size_t strings_size(const cdb_ref_t &strings) {
    return round8(checked_size(used_bytes(strings)));
}

/* Notes the counts and sizes of a class's tables in its record, and returns the size of its section. Errors,
 * dependencies and structured byte strings are deliberately not counted. */
vx_uint64_t class_size(rsrc_class_t &rc) {
    vx_uint64_t size = sizeof rc;
    for (const cdb::side_table &table : cdb::side_tables_as_counted) {
        if (table.count != nullptr)
            rc.*table.count = checked_count(rc.*table.ref, table.record->size);
        else
            rc.*table.bytes = checked_size(used_bytes(rc.*table.ref));
        size += table.size_in(rc);
    }
    return size + strings_size(rc.u_rc_strings);
}

bool names_variable_class(const cdb_ref_t &dattrs) {
    std::span<rsrc_dattr_t> all = records_of<rsrc_dattr_t>(staged_content(dattrs));
    return std::any_of(all.begin(), all.end(),
                       [](const rsrc_dattr_t &attr) { return attr.u_ra_vclass.offset[0] != CDB_NONE; });
}

template <class Record> Record load(const char *from) {
    Record record;
    memcpy(&record, from, sizeof record);
    return record;
}

template <class Record> void store(char *to, const Record &record) {
    memcpy(to, &record, sizeof record);
}

void flush_mapfile(cdgen &cx) {
    auto final_size = static_cast<off_t>(load<orb_cdb_header_t>(cx.image.chp).cdb_hdr_length) + 4;
    if (cx.options.swap_endianness)
        cdgen_cdef_swap(cx.image.chp, cx.stray.nowhere, cx.stray.to_numbers);
    cx.output.finish(final_size);
}

/* ---- Sections -------------------------------------------------------------------------------------------------- */

/* A section that is being written. */
class section {
public:
    section(cdgen &context, cdb_dsect_type_t type) : cx(context), anchor{type, offset_in_file(), 0, 0} {}

    char *write(const void *bytes, size_t size) {
        char *at = cx.image.dsp;
        reserve(size);
        if (size > 0)
            memcpy(at, bytes, size);
        return at;
    }

    /* Writes the bytes of a staged table and frees them meanwhile. Otherwise everything would be in memory twice at the
     * end. */
    size_t move_table(tbl_content *t) {
        size_t size = used_bytes(t);
        if (size == 0)
            return 0;
        for (const char *next = t->tbl_base; next < t->tbl_next; next += PIECE) {
            t->release_before(next);
            write(next, std::min(static_cast<size_t>(t->tbl_next - next), PIECE));
        }
        t->release();
        return size;
    }

    /* The same, and zeros up to a multiple of 8; returns the rounded size. */
    vx_uint32_t move_rounded(tbl_content *t) {
        size_t size = move_table(t);
        round_up(size);
        return static_cast<vx_uint32_t>(round8(size));
    }

    /* Writes zeros up to the next multiple of 8 after this many bytes. */
    void round_up(size_t size) {
        constexpr char zeros[8] = {};
        write(zeros, round8(size) - size);
    }

    void finish() {
        store(cx.image.dsect_anchs + sizeof anchor * static_cast<size_t>(cx.image.dsect_idx), anchor);
        ++cx.image.dsect_idx;
    }

private:
    vx_uint32_t offset_in_file() const {
        return static_cast<vx_uint32_t>(cx.image.dsp - cx.image.chp);
    }

    /* The image has the computed size. Only tables that no stanza fills were not counted. */
    void reserve(size_t size) {
        if (size > static_cast<size_t>(cx.image.chp + cx.output.gross_file_size - cx.image.dsp))
            bld_error_exit(MSG_IMAGE_TOO_SMALL, nullptr, nullptr, 1);
        cx.image.dsp += size;
        anchor.cda_length += static_cast<vx_uint32_t>(size);
    }

    cdgen &cx;
    cdb_dsect_anchor_t anchor;
};

/* Notes the places of the class's stray references in the image, when its tables have their places. Classes are the
 * first sections. */
void note_nowhere(cdgen &cx, const rsrc_class_t &record, const char *at) {
    for (; cx.stray.strays_done < cx.stray.strays.size(); ++cx.stray.strays_done) {
        const stray_reference &stray = cx.stray.strays[cx.stray.strays_done];
        if (stray.rsrc_class != cx.image.dsect_idx)
            break;
        std::vector<size_t> &places = stray.to_numbers ? cx.stray.to_numbers : cx.stray.nowhere;
        places.push_back(static_cast<size_t>(at - cx.image.chp) + (record.*stray.records).offset[0] + stray.offset);
    }
}

void add_class(cdgen &cx, const rsrc_class_t &staged) {
    section out(cx, CDB_DSECT_CLASS);
    char *at = out.write(&staged, sizeof staged);
    rsrc_class_t record = staged;
    for (const cdb::side_table &table : cdb::side_tables) {
        auto offset = static_cast<vx_uint32_t>(cx.image.dsp - at);
        record.*table.ref = {{table.form == cdb::table_form::UNLOCATED ? 0 : offset, 0}};
        size_t size = out.move_table(staged_content(staged.*table.ref));
        if (table.form == cdb::table_form::ROUNDED)
            out.round_up(size);
    }
    store(at, record);
    note_nowhere(cx, record, at);
    out.finish();
    for (const cdb::side_table &table : cdb::side_tables_as_made)
        give_back_filed_before(cx.store.of_classes, staged.*table.ref);
}

/* The name is the first string of the table that follows, so the reference to it is 0, and so is the reference to the
 * table. */
void add_mgr(cdgen &cx, const rsrc_mgr_t &staged) {
    section out(cx, CDB_DSECT_RSRC_MGR);
    rsrc_mgr_t record = staged;
    record.u_rm_RMname = {};
    record.u_rm_strings_table = {};
    out.write(&record, sizeof record);
    out.move_rounded(staged_content(staged.u_rm_strings_table));
    out.finish();
}

void add_cmmap(cdgen &cx, const rsrc_cmmap_t &staged) {
    section out(cx, CDB_DSECT_CMMAP);
    rsrc_cmmap_t record = staged;
    record.u_rcm_strings = {{sizeof record, 0}};
    out.write(&record, sizeof record);
    out.move_rounded(staged_content(staged.u_rcm_strings));
    out.finish();
}

/* The reference to the string table deliberately holds its rounded length, which is where the variable IDs begin. */
void add_var_class(cdgen &cx, const rsrc_variable_class_t &staged) {
    section out(cx, CDB_DSECT_VAR_CLASS);
    char *at = out.write(&staged, sizeof staged);
    rsrc_variable_class_t record = staged;
    record.u_rvc_string_tbl = {{out.move_rounded(staged_content(staged.u_rvc_string_tbl)), 0}};
    out.move_rounded(find_tbl_entry(cx, &staged));
    store(at, record);
    out.finish();
    give_back_filed_before(cx.store.of_variable_classes, staged.u_rvc_string_tbl);
}

void require_table(const tbl &t, message_id missing) {
    if (t.tbl_base == nullptr)
        bld_error_exit(missing, nullptr, nullptr, 1);
}

/* Adds a section for each record of a staged table, which is freed meanwhile, as the side tables of the records are. */
template <class Record, class Add> void add_all(cdgen &cx, tbl &t, Add add) {
    for (const Record &record : records_of<Record>(&t)) {
        t.release_before(reinterpret_cast<const char *>(&record));
        add(cx, record);
    }
    t.release();
    t.restart(t.tbl_name);
}

/* The largest number among the records of a staged table; 0 if the table is empty. */
template <class Record> vx_uint16_t max_id(tbl *t, vx_uint16_t Record::*id) {
    vx_uint16_t max = 0;
    for (const Record &record : records_of<Record>(t))
        max = std::max(max, record.*id);
    return max;
}

/* ---- The header ------------------------------------------------------------------------------------------------ */

orb_timeval32_t timestamp() {
    if (getenv("VX_CDB_FORCE_EMPTY_TIMESTAMP") != nullptr)
        return {0, 0};
    timeval now = {};
    gettimeofday(&now, nullptr);
    return {static_cast<vx_uint32_t>(now.tv_sec), static_cast<vx_uint32_t>(now.tv_usec)};
}

void write_header(cdgen &cx) {
    auto header = load<orb_cdb_header_t>(cx.image.chp); /* the maximum IDs are there already */
    header.cdb_hdr_length = static_cast<vx_uint32_t>(cx.image.dsp - cx.image.chp - 4);
    header.cdb_hdr_format = CDB_FORMAT;
    header.cdb_hdr_seqno = 0;
    header.cdb_hdr_timestamp = timestamp();
    header.cdb_hdr_dsect_count = static_cast<vx_uint32_t>(cx.image.dsect_count);
    for (const cdb::recorded_size &recorded : cdb::recorded_sizes)
        store(reinterpret_cast<char *>(&header) + recorded.at, static_cast<vx_uint16_t>(recorded.size));
    store(cx.image.chp, header);
    header.cdb_hdr_checksum = cdb_checksum(cx.image.chp, header.cdb_hdr_length, header.cdb_hdr_length);
    store(cx.image.chp, header);
}

} // namespace

size_t cdb_size(cdgen &cx) {
    vx_uint64_t size = sizeof(orb_cdb_header_t) +
                       sizeof(cdb_dsect_anchor_t) * static_cast<size_t>(cx.image.dsect_count) +
                       cx.sections.dropped_class_sizes;
    for (const auto &vc : records_of<rsrc_variable_class_t>(&cx.sections.rsrc_var_class_tbl))
        size += sizeof vc + strings_size(vc.u_rvc_string_tbl) + round8(sizeof(var_id_t) * vc.rvc_var_count);
    for (const auto &map : records_of<rsrc_cmmap_t>(&cx.sections.rsrc_cmmap_tbl))
        size += sizeof map + strings_size(map.u_rcm_strings);
    for (auto &rc : records_of<rsrc_class_t>(&cx.sections.rsrc_class_tbl))
        size += class_size(rc);
    for (const auto &mgr : records_of<rsrc_mgr_t>(&cx.sections.rsrc_mgr_tbl))
        size += sizeof mgr + strings_size(mgr.u_rm_strings_table);
    return checked_size(size);
}

void drop_latest_class(cdgen &cx) {
    tbl &classes = cx.sections.rsrc_class_tbl;
    std::span<rsrc_class_t> all = records_of<rsrc_class_t>(&classes);
    if (all.empty() || names_variable_class(all.back().u_rc_dattrsC) || names_variable_class(all.back().u_rc_dattrs))
        return;
    try {
        cx.sections.dropped_class_sizes += class_size(all.back());
    } catch (const fatal_exit &) { /* a table is too large, which is reported at the end of the source */
        return;
    }
    for (size_t table = cdb::side_tables_as_made.size(); table-- > 0;)
        drop_filed(cx.store.of_classes, all.back().*cdb::side_tables_as_made[table].ref);
    classes.tbl_next -= sizeof(rsrc_class_t);
    memset(classes.tbl_next, 0, sizeof(rsrc_class_t));
}

void add_rsrc_class_tbls(cdgen &cx) {
    tbl &classes = cx.sections.rsrc_class_tbl;
    require_table(classes, MSG_NO_CLASS_TABLES);
    store(cx.image.chp + offsetof(orb_cdb_header_t, cdb_hdr_max_class_id),
          max_id(&classes, &rsrc_class_t::rc_class_id));
    add_all<rsrc_class_t>(cx, classes, add_class);
}

void add_rsrc_mgr_tbls(cdgen &cx) {
    tbl &managers = cx.sections.rsrc_mgr_tbl;
    require_table(managers, MSG_NO_MANAGER_TABLES);
    store(cx.image.chp + offsetof(orb_cdb_header_t, cdb_hdr_max_rm_id), max_id(&managers, &rsrc_mgr_t::rm_id));
    add_all<rsrc_mgr_t>(cx, managers, add_mgr);
}

void add_rsrc_cmmap_tbls(cdgen &cx) {
    require_table(cx.sections.rsrc_cmmap_tbl, MSG_NO_MAP_TABLES);
    add_all<rsrc_cmmap_t>(cx, cx.sections.rsrc_cmmap_tbl, add_cmmap);
}

void add_rsrc_var_class_tbls(cdgen &cx) {
    require_table(cx.sections.rsrc_var_class_tbl, MSG_NO_VARIABLE_CLASS_TABLES);
    add_all<rsrc_variable_class_t>(cx, cx.sections.rsrc_var_class_tbl, add_var_class);
}

size_t fit_image(cdgen &cx) {
    cx.image.dsect_count = cx.sections.rsrc_cmmap_count + cx.sections.rsrc_mgr_count +
                           cx.sections.rsrc_var_class_count + cx.sections.rsrc_class_count;
    return cdb_size(cx);
}

namespace {

/* Fills the image in the machine's own byte order. */
void fill_image(cdgen &cx, char *image) {
    cx.image.chp = image;
    cx.image.dsect_anchs = cx.image.chp + sizeof(orb_cdb_header_t);
    cx.image.dsect_idx = 0;
    cx.image.dsp = cx.image.dsect_anchs + sizeof(cdb_dsect_anchor_t) * static_cast<size_t>(cx.image.dsect_count);
    add_rsrc_class_tbls(cx);
    add_rsrc_mgr_tbls(cx);
    add_rsrc_cmmap_tbls(cx);
    if (cx.sections.rsrc_var_class_tbl.tbl_base != nullptr)
        add_rsrc_var_class_tbls(cx);
    write_header(cx);
}

} // namespace

void bld_cdb(cdgen &cx) {
    char *image = get_mapfile(cx, fit_image(cx));
    try {
        fill_image(cx, image);
        flush_mapfile(cx);
    } catch (...) { /* before the message is printed */
        cx.output.discard();
        throw;
    }
}

size_t fill_memory(cdgen &cx, std::span<std::byte> zeros) {
    cx.output.gross_file_size = zeros.size();
    fill_image(cx, reinterpret_cast<char *>(zeros.data()));
    return static_cast<size_t>(cx.image.dsp - cx.image.chp);
}
