/* stepwise.cpp: the steps of a compilation one by one, and what callers repair after an error. */

#include "compiler/stepwise.h"

#include "compiler/cdgen_closing.h"
#include "compiler/cdgen_kinds.h"
#include "compiler/cdgen_stanzas.h"
#include "compiler/cdgen_swap.h"

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
    cx.options.observer = &observer;
    cx.options.explanations = nullptr;
    cx.options.cdefsrc = source;
    cx.options.cdefname = output;
}

/* ---- Steps ----------------------------------------------------------------------------------------------------- */

void stepwise_compiler::open() {
    open_source(cx, cx.options.cdefsrc);
}

void stepwise_compiler::open(int fd) {
    ::take_source(cx, cx.options.cdefsrc, fd);
}

void stepwise_compiler::open_bytes(std::string_view bytes) {
    ::take_source(cx, bytes);
}

source_line stepwise_compiler::next_line() {
    return ::next_line(cx);
}

void stepwise_compiler::close() {
    cx.source.cdb_fp.close();
}

void stepwise_compiler::take_line(const attr_text &text) {
    if (text.name != text.line) /* an attribute line begins no stanza */
        return ::take_line(cx, text);
    auto before = std::tuple(cx.framing.scp, cx.framing.prev_scp, cx.framing.curr_sd_scp, cx.framing.state,
                             cx.framing.record, cx.framing.table_id);
    try {
        ::take_line(cx, text);
    } catch (const fatal_exit &) {
        std::tie(cx.framing.scp, cx.framing.prev_scp, cx.framing.curr_sd_scp, cx.framing.state, cx.framing.record,
                 cx.framing.table_id) = before;
        throw;
    }
}

void stepwise_compiler::take_source(std::string_view bytes) {
    open_bytes({});
    take_lines(bytes);
    take_end();
}

void stepwise_compiler::take_lines(std::string_view lines) {
    cx.source.cdb_fp.memory = lines;
    for (source_line line = next_line(); line.begin != nullptr; line = next_line())
        if (attr_text text = find_text(line); text.end != nullptr)
            take_line(text);
}

void stepwise_compiler::take_end() {
    close();
    for (size_t step = 0; step < closing_steps(); ++step)
        take_closing_step(step);
}

size_t stepwise_compiler::closing_steps() {
    return ::closing_steps.size();
}

void stepwise_compiler::take_closing_step(size_t step) {
    ::closing_steps[step](cx);
}

size_t stepwise_compiler::size_image() {
    return fit_image(cx);
}

void stepwise_compiler::drop_latest_class() {
    ::drop_latest_class(cx);
}

std::vector<std::byte> stepwise_compiler::image() {
    std::vector<std::byte> whole(size_image());
    whole.resize(image_in(whole).size());
    return whole;
}

std::span<std::byte> stepwise_compiler::image_in(std::span<std::byte> zeros) {
    return zeros.first(fill_memory(cx, zeros));
}

std::vector<std::byte> stepwise_compiler::reversed(std::vector<std::byte> image) const {
    cdgen_cdef_swap(reinterpret_cast<char *>(image.data()), cx.stray.nowhere, cx.stray.to_numbers);
    return image;
}

/* ---- State ----------------------------------------------------------------------------------------------------- */

bool stepwise_compiler::is_open(int kind) const {
    vx_uint32_t identifier = 0;
    memcpy(&identifier, record_of(cx, row_of(kind)), sizeof identifier);
    return identifier != 0;
}

int stepwise_compiler::previous_kind() const {
    return cx.framing.prev_scp == nullptr ? -1 : static_cast<int>(cx.framing.prev_scp - sc_tables.data());
}

vx_data_type_t stepwise_compiler::data_type() const {
    vx_data_type_t type = VX_UNKNOWN;
    if (cx.framing.scp->dt_offset >= 0)
        memcpy(&type, record_of(cx, *cx.framing.scp) + cx.framing.scp->dt_offset, sizeof type);
    return type;
}

/* ---- Recoveries ------------------------------------------------------------------------------------------------ */

bool stepwise_compiler::open_placeholder_class() {
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
    cx.sd.element.complete();
}

void stepwise_compiler::give_up_run() {
    cx.staged.cb_sd_def.sd_cb_ID = 0;
    cx.sd.give_up();
}

void stepwise_compiler::begin_ownerless_run(int kind) {
    cx.sd.begin_for(nobody, mk_sd_sec(cx));
    make_current(cx, row_of(kind));
    cx.framing.curr_sd_scp = cx.framing.scp;
    cx.framing.table_id = kind;
    sc_init_tbl (*cx.framing.scp)(cx);
    cx.framing.state->restart();
    cx.framing.state->dflt = {};
}

void stepwise_compiler::expect_index(int index) {
    cx.sd.expect_index(index);
}

void stepwise_compiler::forget_overflow() {
    cx.conv_errno = 0;
}
