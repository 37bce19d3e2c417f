/* cdgen_staging.h: what the stanzas of a source fill: records, tables of records, and data that later lines need. */
#ifndef CDGEN_CDGEN_STAGING_H
#define CDGEN_CDGEN_STAGING_H

#include "compiler/cdgen_tables.h"
#include "language/limits.h"

#include <cstddef>
#include <memory>
#include <optional>

/* A staging record is open while its first word, the cb_ID, is not 0. */
struct staging_records {
    rsrc_class_t cb_rsrc_class = {};
    rsrc_cmmap_t cb_rsrc_cmmap = {};
    rsrc_mgr_t cb_rsrc_mgr = {};
    rsrc_variable_class_t cb_rsrc_variable_class = {};
    rsrc_pattr_t cb_rsrc_pattr = {};
    rsrc_pattr_t cb_rsrc_pattrC = {};
    rsrc_dattr_t cb_rsrc_dattr = {};
    rsrc_dattr_t cb_rsrc_dattrC = {};
    rsrc_action_t cb_rsrc_action = {};
    rsrc_action_t cb_rsrc_actionC = {};
    sd_def_t cb_sd_def = {};
};

/* The completed records that become sections of the image. */
struct section_tables {
    tbl rsrc_class_tbl{16 * sizeof(rsrc_class_t), "ResourceClasses"};
    tbl rsrc_mgr_tbl{8 * sizeof(rsrc_mgr_t), "ResourceManagers"};
    tbl rsrc_cmmap_tbl{8 * sizeof(rsrc_cmmap_t), "ResourceCMMaps"};
    tbl rsrc_var_class_tbl{8 * sizeof(rsrc_variable_class_t), "ResourceVariableClasses"};
    vx_uint64_t dropped_class_sizes =
        0; /* of the sections of classes that are counted, but not in their table any more */
    int rsrc_class_count = 0;
    int rsrc_mgr_count = 0;
    int rsrc_cmmap_count = 0;
    int rsrc_var_class_count = 0;
};

constexpr size_t LOCATOR_SIZE = VALUE_MAX_CHARS + 1; /* the longest value and its NUL */

/* A Locator, kept until the attribute that it names is known. */
struct _rc_locator_t {
    vx_uint16_t *ptr = nullptr; /* the field to fill; null while none was given */
    char name[LOCATOR_SIZE] = {};
};

/* Names that are used at the end of the source. */
struct names_for_later {
    std::unique_ptr<char, free_memory> rm_name; /* the resource manager; null until named */
    struct _rc_locator_t _rc_locator;
};

/* The lists of valid values of the open attributes. */
struct valid_value_lists {
    std::optional<size_t> vvdisp; /* offset of the latest valid value's vv_disp_msgid in the valid-values table */
    vx_uint16_t pattr_vv_found = 0;
    vx_uint16_t pattrC_vv_found = 0;
    vx_uint16_t dattr_vv_found = 0;
    vx_uint16_t dattrC_vv_found = 0;
};

/* The Range lines of the open dynamic attributes. */
struct range_state {
    vx_uint16_t dattr_range_found = 0; /* deliberately one flag for both kinds, cleared only at a completion */
    vx_data_type_t dattr_range_type = VX_UNKNOWN; /* of the range in the open resource attribute, if it has one */
};

#endif
