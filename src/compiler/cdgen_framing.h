/* cdgen_framing.h: which stanza is current, and the state of each kind's latest one. */
#ifndef CDGEN_CDGEN_FRAMING_H
#define CDGEN_CDGEN_FRAMING_H

#include "compiler/cdgen_tables.h"
#include "language/attribute_order.h"

#include <array>
#include <memory>

/* Values that are kept until their attribute is completed, in one 8-byte cell each. For an SD-typed attribute these are
 * the types of its elements. */
struct dflt_values {
    dflt_values(const char *name, vx_data_type_t type = VX_UNKNOWN) : cells(32, name), sd_type(type) {}

    /* Empty, as if new, except that memory is reused. */
    void restart(const char *name, vx_data_type_t type = VX_UNKNOWN, bool traced = true) {
        if (traced)
            cells.restart(name);
        else
            cells.restart_untraced(name);
        texts.clear();
        sd_type = type;
    }

    struct tbl cells;
    text_pool texts;        /* the memory that the cells point to */
    vx_data_type_t sd_type; /* of an SD-typed attribute: its type, VX_SD_PTR or VX_SD_PTR_ARRAY; or unknown */
};

/* The list is shared by an SD-typed attribute's stanza and the SD stanzas that follow it. */
struct dflt_tbl {
    std::shared_ptr<dflt_values> tbl;
    size_t num_elems = 0;
};

/* The state of a kind's current stanza. */
struct stanza_state {
    /* Clears the state for a new stanza of the kind. */
    void restart() {
        req_mask = opt_mask = 0;
        order.restart();
    }

    vx_uint32_t req_mask = 0; /* required attributes seen */
    vx_uint32_t opt_mask = 0; /* optional attributes seen, with their OPTIONAL bit */
    language::attribute_order order;
    dflt_tbl dflt;
};

/* The current stanza. */
struct stanza_framing {
    /* No stanza is current any more. */
    void leave() {
        table_id = -1;
        state = nullptr;
    }

    int table_id = -1; /* its stanza_id; -1 before the first header */
    const srtable_ctrl *scp = nullptr;
    const srtable_ctrl *prev_scp = nullptr;
    const srtable_ctrl *curr_sd_scp = nullptr; /* of the latest header */
    stanza_state *state = nullptr;             /* that of scp; null before the first header */
    char *record = nullptr;                    /* the staging record that scp fills */
    bool watched = false;                      /* its lines are observed or traced */
    std::array<stanza_state, SC_COUNT> stanzas;
    std::shared_ptr<dflt_values> spare_dflt; /* no longer held by any stanza; for reuse */
};

#endif
