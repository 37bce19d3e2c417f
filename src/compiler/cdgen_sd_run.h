/* cdgen_sd_run.h: a run of structured-data stanzas. */
#ifndef CDGEN_CDGEN_SD_RUN_H
#define CDGEN_CDGEN_SD_RUN_H

#include "cdb.h"

#include <cstddef>

/* What the open element has supplied. */
struct sd_element_state {
    bool is_complete() const {
        return sd_dt_found && sd_disp_found && sd_name_found && sd_desc_found;
    }
    /* Valid values are forgotten apart: they need not be given. */
    void forget() {
        sd_dt_found = sd_disp_found = sd_name_found = sd_desc_found = 0;
    }
    void complete() {
        sd_dt_found = sd_disp_found = sd_name_found = sd_desc_found = 1;
    }

    int sd_name_found = 0;
    int sd_desc_found = 0;
    int sd_disp_found = 0;
    int sd_dt_found = 0;
    int sd_vv_found = 0;
};

/* A run is announced by an attribute of structured data, or belongs to a class or an action; it is open while the
 * staging record cb_sd_def is. */
struct sd_run {
    /* An attribute's record is about to be followed by its elements. type: 0 persistent, 1 dynamic */
    void announce(vx_value_t *value, cdb_ref_t *section, vx_uint16_t *highest_index, int type) {
        attr_dflt_val = value;
        curr_sd_tbl = section;
        max_sd_idx = highest_index;
        sd_attr_type = type;
    }
    /* The attribute that came before keeps what its own run gave it. */
    void leave_attribute() {
        attr_dflt_val = nullptr;
        max_sd_idx = nullptr;
    }
    /* What follows belongs to nothing yet. */
    void forget_owner() {
        leave_attribute();
        curr_sd_tbl = nullptr;
    }
    /* The first element makes the section, at this offset. */
    void begin(vx_uint32_t section) {
        curr_sd_tbl->offset[0] = section;
        sd_num_elems = 0;
    }
    /* The elements of the run belong to the field, and to no attribute. */
    void begin_for(cdb_ref_t &field, vx_uint32_t section) {
        leave_attribute();
        curr_sd_tbl = &field;
        field.offset[0] = section;
    }
    void end() {
        if (max_sd_idx != nullptr)
            *max_sd_idx = static_cast<vx_uint16_t>(curr_sdeli);
        restart_indexes();
    }
    void give_up() {
        forget_owner();
        restart_indexes();
    }

    vx_value_t *attr_dflt_val = nullptr; /* while the current attribute is of an SD type: its value */
    cdb_ref_t *curr_sd_tbl = nullptr;    /* what refers to the SD section of the current run */
    vx_uint16_t *max_sd_idx = nullptr;   /* of the current SD-typed attribute */
    int sd_attr_type = 0;                /* 0 persistent, 1 dynamic */
    int curr_sdeli = -1;                 /* latest element index */
    int expected_sdeli = 0;              /* next element index */
    size_t sd_num_elems = 0;             /* elements of the current attribute run */
    sd_element_state element;

private:
    void restart_indexes() {
        curr_sdeli = -1;
        expected_sdeli = 0;
    }
};

#endif
