/* stepwise.cpp: the steps of a compilation one by one, and what callers repair after an error. */

#include "compiler/stepwise.h"

#include "compiler/cdgen_closing.h"
#include "compiler/cdgen_stanzas.h"

#include <tuple>

namespace {

const srtable_ctrl &row_of(int kind) {
    return sc_tables[static_cast<size_t>(kind)];
}

/* The staging record that stanzas of a kind fill; only looked at. */
const char *record_of(const cdgen &cx, const srtable_ctrl &row) {
    return sc_cb(const_cast<cdgen &>(cx), row);
}

} // namespace

stepwise_compiler::stepwise_compiler(const char *source, const char *output, line_observer &observer) {
    cx.observer = &observer;
    cx.explanations = nullptr;
    cx.cdefsrc = source;
    cx.cdefname = output;
}

/* ---- Steps ----------------------------------------------------------------------------------------------------- */

void stepwise_compiler::open() {
    open_source(cx, cx.cdefsrc);
}

void stepwise_compiler::open(int fd) {
    take_source(cx, cx.cdefsrc, fd);
}

void stepwise_compiler::open_bytes(std::string_view bytes) {
    take_source(cx, bytes);
}

source_line stepwise_compiler::next_line() {
    return ::next_line(cx);
}

void stepwise_compiler::close() {
    cx.cdb_fp.close();
}

void stepwise_compiler::take_line(const attr_text &text) {
    auto before = std::tuple(cx.scp, cx.prev_scp, cx.curr_sd_scp, cx.state, cx.table_id);
    try {
        ::take_line(cx, text);
    } catch (const fatal_exit &) {
        std::tie(cx.scp, cx.prev_scp, cx.curr_sd_scp, cx.state, cx.table_id) = before;
        throw;
    }
}

size_t stepwise_compiler::closing_steps() {
    return ::closing_steps.size();
}

void stepwise_compiler::take_closing_step(size_t step) {
    ::closing_steps[step](cx);
}

void stepwise_compiler::size_image() {
    fit_image(cx);
}

/* ---- State ----------------------------------------------------------------------------------------------------- */

bool stepwise_compiler::is_open(int kind) const {
    vx_uint32_t identifier = 0;
    memcpy(&identifier, record_of(cx, row_of(kind)), sizeof identifier);
    return identifier != 0;
}

int stepwise_compiler::previous_kind() const {
    return cx.prev_scp == nullptr ? -1 : static_cast<int>(cx.prev_scp - sc_tables.data());
}

vx_data_type_t stepwise_compiler::data_type() const {
    vx_data_type_t type = VX_UNKNOWN;
    if (cx.scp->dt_offset >= 0)
        memcpy(&type, record_of(cx, *cx.scp) + cx.scp->dt_offset, sizeof type);
    return type;
}

/* ---- Recoveries ------------------------------------------------------------------------------------------------ */

bool stepwise_compiler::forge_class() {
    if (class_is_open())
        return false;
    init_class_tbl(cx);
    return true;
}

void stepwise_compiler::drop_record(int kind) {
    constexpr vx_uint32_t none = 0;
    memcpy(sc_cb(cx, row_of(kind)), &none, sizeof none);
}

void stepwise_compiler::complete_element() {
    cx.sd_name_found = cx.sd_desc_found = cx.sd_disp_found = cx.sd_dt_found = 1;
}

void stepwise_compiler::give_up_run() {
    cx.cb_sd_def.sd_cb_ID = 0;
    cx.attr_dflt_val = nullptr;
    cx.curr_sd_tbl = nullptr;
    cx.max_sd_idx = nullptr;
    cx.curr_sdeli = -1;
    cx.expected_sdeli = 0;
}

void stepwise_compiler::begin_run_of_nobody(int kind) {
    cx.attr_dflt_val = nullptr;
    cx.max_sd_idx = nullptr;
    cx.curr_sd_tbl = &nobody;
    nobody.offset[0] = mk_sd_sec(cx);
    cx.scp = cx.curr_sd_scp = &row_of(kind);
    cx.state = &cx.stanzas[static_cast<size_t>(kind)];
    cx.table_id = kind;
    sc_init_tbl (*cx.scp)(cx);
    cx.state->req_mask = cx.state->opt_mask = 0;
    cx.state->dflt = {};
}

void stepwise_compiler::expect_index(int index) {
    cx.expected_sdeli = index;
}

void stepwise_compiler::forget_overflow() {
    cx.conv_errno = 0;
}
