/* cdgen_context.h: all state of one compilation. */
#ifndef CDGEN_CDGEN_CONTEXT_H
#define CDGEN_CDGEN_CONTEXT_H

#include "compiler/cdgen_error.h"
#include "compiler/cdgen_framing.h"
#include "compiler/cdgen_image.h"
#include "compiler/cdgen_observer.h"
#include "compiler/cdgen_output.h"
#include "compiler/cdgen_sd_run.h"
#include "compiler/cdgen_source.h"
#include "compiler/cdgen_staging.h"
#include "compiler/cdgen_variable_ids.h"

#include <cstdio>

/* The options of a compilation. */
struct compile_options {
    int interactive = 1; /* messages end with a newline */
    int debugLevel = 0;
    int swap_endianness = 0;
    const char *cdefsrc = nullptr;
    const char *cdefname = nullptr;
    line_observer *observer = nullptr;
    FILE *explanations = stdout; /* where traces that explain an error are written; null: nowhere */
};

struct cdgen {
    cdgen() = default;
    cdgen(const cdgen &) = delete;
    cdgen &operator=(const cdgen &) = delete;

    compile_options options;
    source_reader source;
    stanza_framing framing;
    staging_records staged;
    section_tables sections;
    table_store store;
    names_for_later later;
    valid_value_lists valid_values;
    range_state range;
    sd_run sd;
    text_pool line_texts; /* out-of-line values of the latest line that has such values and serialises them at once */
    /* errno as the number conversions see it. Nothing clears it: after an overflow, every later 0 or limit value is
     * refused. Existing sources rely on this. */
    int conv_errno = 0;
    variable_id_lists variable_ids;
    stray_references stray;
    image_cursor image;
    output_file output;
};

/* The table also grows if its end is reached exactly. A table without a block has no room. */
inline void *alloc_tble(cdgen &cx, tbl *t, size_t s) {
    if (s >= t->room() || cx.options.debugLevel > 2)
        make_room(cx, *t, s);
    char *reserved = t->tbl_next;
    t->tbl_next += s;
    return reserved;
}

#endif
