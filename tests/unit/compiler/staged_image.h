/* staged_image.h: sections staged with known bytes, and what the image has to hold for them. */
#ifndef CDGEN_TESTS_STAGED_IMAGE_H
#define CDGEN_TESTS_STAGED_IMAGE_H

#include "compiler/cdgen.h"

#include "compiler/image_fixture.h"

#include <functional>

namespace staged {

using by_hand::image;

/* A class's side tables, in the order of the file. */
inline constexpr cdb_ref_t rsrc_class_t::*side_tables[] = {
    &rsrc_class_t::u_rc_pattrsC,  &rsrc_class_t::u_rc_dattrsC,  &rsrc_class_t::u_rc_pattrs,
    &rsrc_class_t::u_rc_dattrs,   &rsrc_class_t::u_rc_actionsC, &rsrc_class_t::u_rc_actions,
    &rsrc_class_t::u_rc_errors,   &rsrc_class_t::u_rc_depends,  &rsrc_class_t::u_rc_variety_lists,
    &rsrc_class_t::u_rc_sbs_defs, &rsrc_class_t::u_rc_sd_defs,  &rsrc_class_t::u_rc_valid_vals,
    &rsrc_class_t::u_rc_strings};

/* Bytes of each. */
struct class_bytes {
    size_t of[std::size(side_tables)] = {};
};

class Builder : public testing::Test {
protected:
    /* A staging table of so many equal bytes; never allocated if there are none. */
    tbl *table(size_t size, char byte = 's') {
        tbl *t = make_tbl(cx, 64, "Table");
        if (size > 0)
            memset(alloc_tble(cx, t, size), byte, size);
        return t;
    }

    template <class Record> void append(tbl *t, int &count, const Record &record) {
        memcpy(alloc_tble(cx, t, sizeof record), &record, sizeof record);
        ++count;
    }

    /* A record with arbitrary bytes where nothing else is said. */
    template <class Record> static Record arbitrary() {
        image bytes(sizeof(Record));
        Record record;
        memcpy(&record, bytes.at(0), sizeof record);
        return record;
    }

    /* The tables hold the letters from a on. */
    void add_class(const class_bytes &bytes, vx_uint16_t id = 0) {
        auto record = arbitrary<rsrc_class_t>();
        char letter = 'a';
        const size_t *size = bytes.of;
        for (auto field : side_tables)
            stage_tbl(record.*field, table(*size++, letter++));
        record.rc_class_id = id;
        append(&cx.sections.rsrc_class_tbl, cx.sections.rsrc_class_count, record);
    }

    void add_mgr(size_t strings, vx_uint16_t id = 0) {
        auto record = arbitrary<rsrc_mgr_t>();
        record.rm_id = id;
        stage_tbl(record.u_rm_strings_table, table(strings, 'n'));
        append(&cx.sections.rsrc_mgr_tbl, cx.sections.rsrc_mgr_count, record);
    }

    void add_map(size_t strings) {
        auto record = arbitrary<rsrc_cmmap_t>();
        stage_tbl(record.u_rcm_strings, table(strings, 'o'));
        append(&cx.sections.rsrc_cmmap_tbl, cx.sections.rsrc_cmmap_count, record);
    }

    void add_variable_class(size_t strings, vx_uint32_t ids) {
        auto record = arbitrary<rsrc_variable_class_t>();
        record.rvc_var_count = ids;
        stage_tbl(record.u_rvc_string_tbl, table(strings, 'p'));
        append(&cx.sections.rsrc_var_class_tbl, cx.sections.rsrc_var_class_count, record);
    }

    rsrc_class_t &staged_class(size_t n = 0) {
        return records_of<rsrc_class_t>(&cx.sections.rsrc_class_tbl)[n];
    }

    cdgen cx;
};

inline std::string message_of(const fatal_exit &failure) {
    auto [first, second, third] = words_of(failure);
    return std::string(first) + second + third;
}

/* The message of the fatal exit; status and line are always the same. */
inline std::string fatal_message(const std::function<void()> &run) {
    try {
        run();
    } catch (const fatal_exit &failure) {
        EXPECT_EQ(failure.code, 1);
        EXPECT_EQ(failure.line, 0);
        return message_of(failure);
    }
    return "none";
}
inline image blank(size_t size) {
    image made(size);
    std::fill(made.bytes.begin(), made.bytes.end(), '\0');
    return made;
}

template <class Record> void put_arbitrary(image &to, size_t at) {
    to.text(at, {image(sizeof(Record)).at(0), sizeof(Record)});
}

inline void put_reference(image &to, size_t at, vx_uint32_t offset) {
    to.u32(at, offset).u32(at + 4, 0);
}

inline void put_anchor(image &to, size_t n, vx_uint32_t type, vx_uint32_t offset, vx_uint32_t length) {
    size_t at = 80 + 16 * n;
    to.u32(at, type).u32(at + 4, offset).u32(at + 8, length).u32(at + 12, 0);
}

/* A class as it is staged by add_class(), with the offsets of its tables from pattrsC to strings. */
inline void put_class(image &to, size_t at, vx_uint16_t id, const std::vector<vx_uint32_t> &offsets) {
    const size_t references[] = {24, 32, 40, 48, 96, 104, 112, 120, 128, 136, 144, 152, 160};
    put_arbitrary<rsrc_class_t>(to, at);
    for (size_t i = 0; i < std::size(references); ++i)
        put_reference(to, at + references[i], offsets[i]);
    to.u16(at + 208, id);
}

} // namespace staged

#endif
