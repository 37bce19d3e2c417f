/* stepwise.h: a compilation for callers that take its steps themselves and continue after an error. Without an error it
 * does what compile() does, except for writing the database. After one, the caller names what is given up. */
#ifndef CDGEN_COMPILER_STEPWISE_H
#define CDGEN_COMPILER_STEPWISE_H

#include "compiler/cdgen_read.h"

/* For callers that only want the compilation. */
struct no_observer final : line_observer {
    void attribute_read(const table_attrs &, std::string_view) override {}
    bool excuses_missing(int) const override {
        return false;
    }
};

class stepwise_compiler {
public:
    /* The names must stay as long as the compiler. Nothing is written to the output, but a class without a Name is
     * named after it. */
    stepwise_compiler(const char *source, const char *output, line_observer &observer);

    /* ---- Steps; each throws fatal_exit ---- */

    void open();
    /* The same for a descriptor that is open, or -1 with errno; it is closed with the source. */
    void open(int fd);
    /* The same for a source in memory, which must stay until it has been read. */
    void open_bytes(std::string_view bytes);
    source_line next_line();
    void close();

    /* A header, if no blank is in front, or an attribute line, which is taken apart. If a header fails, the stanza
     * before it is still the current one. */
    void take_line(const attr_text &text);

    /* A source in memory, from its first line to the last closing step. */
    void take_source(std::string_view bytes);
    /* The same in parts: the next lines, each with its newline, and, after the last ones, the closing steps. */
    void take_lines(std::string_view lines);
    void take_end();

    /* The steps at the end of the source, to be taken in this order. */
    static size_t closing_steps();
    void take_closing_step(size_t step);
    /* Returns the most bytes that the database will have. */
    size_t size_image();
    /* Gives back what only an image needs of the class that was completed last. */
    void drop_latest_class();
    /* The database, in the machine's own byte order; after all closing steps. */
    std::vector<std::byte> image();
    /* The same in memory that is filled with zeros and has size_image() bytes; returns the part that is used. */
    std::span<std::byte> image_in(std::span<std::byte> zeros);
    /* That image in the other byte order. */
    std::vector<std::byte> reversed(std::vector<std::byte> image) const;

    /* ---- State ---- */

    int line_number() const {
        return cx.source.shown_line();
    }

    /* Whether a record of the kind is open. The kinds of structured data share one. */
    bool is_open(int kind) const;
    bool run_is_open() const {
        return cx.staged.cb_sd_def.sd_cb_ID != 0;
    }
    bool class_is_open() const {
        return cx.staged.cb_rsrc_class.rc_cb_ID != 0;
    }
    /* Whether the open class has a Name. */
    bool class_has_name() const {
        return cx.staged.cb_rsrc_class.u_rc_name.offset[0] != CDB_NONE;
    }
    /* The kind of the stanza before the current one; -1: none. */
    int previous_kind() const;
    /* The required attributes that a kind's latest stanza has given. */
    vx_uint32_t required_seen(int kind) const {
        return cx.framing.stanzas[static_cast<size_t>(kind)].req_mask;
    }
    /* The data type that the current stanza has given; unknown if its kind takes none. */
    vx_data_type_t data_type() const;

    /* The index of the run's latest element, and the one that the next element must have. */
    int element_index() const {
        return cx.sd.index();
    }
    int expected_index() const {
        return cx.sd.expected_index();
    }
    /* Whether the elements that follow, or that are open, make the value of an attribute. */
    bool run_makes_value() const {
        return cx.sd.makes_value();
    }
    /* Whether the run's highest index is stored. */
    bool run_has_highest_index() const {
        return cx.sd.highest_index() != nullptr;
    }
    /* errno as the number conversions see it. */
    int conversion_errno() const {
        return cx.conv_errno;
    }

    /* ---- Recoveries ---- */

    /* Opens a class for stanzas that have none. False if a class is open. */
    bool open_placeholder_class();
    /* The open record of a kind is not completed. */
    void drop_record(int kind);
    /* The open element lacks nothing any more. */
    void complete_element();
    /* The open run is not completed. */
    void give_up_run();
    /* Begins a run of a kind whose elements belong to nothing, with its first stanza. */
    void begin_ownerless_run(int kind);
    void expect_index(int index);
    /* An earlier overflow does not count any more. */
    void forget_overflow();

private:
    cdgen cx;
    cdb_ref_t nobody = {}; /* refers to the elements of a run that belongs to nothing */
};

#endif
