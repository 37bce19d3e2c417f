/* cdgen_sd_run.h: a run of structured-data stanzas. */
#ifndef CDGEN_CDGEN_SD_RUN_H
#define CDGEN_CDGEN_SD_RUN_H

#include "cdb.h"

#include <cstddef>

/* Which attributes the open element has given. */
struct sd_element_state {
    bool is_complete() const {
        return sd_dt_found && sd_disp_found && sd_name_found && sd_desc_found;
    }
    /* Valid values are cleared separately, because they are optional. */
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

/* The index of the element after the one with this index. The largest int is followed by the smallest, so that every
 * index has a next one. */
constexpr int index_after(int index) {
    return static_cast<int>(static_cast<unsigned>(index) + 1);
}

/* The owner of a run of elements. */
enum class sd_run_state {
    NO_OWNER,     /* nobody yet: the owner is looked up when a run begins */
    OF_ATTRIBUTE, /* an attribute, whose value the elements make */
    OF_FIELD      /* a class or an action, or nobody: a field refers to the section, and the elements make no value */
};

/* A run of elements. It is open while the staging record cb_sd_def is.
 *
 *   announce    any state -> OF_ATTRIBUTE
 *   belong_to   NO_OWNER -> OF_FIELD, if there is a field
 *   begin_for   any state -> OF_FIELD
 *   begin, end  keep the state: another run of the same owner may follow
 *   forget_owner, give_up   any state -> NO_OWNER */
class sd_run {
public:
    /* An attribute's record is about to be followed by its elements. type: 0 persistent, 1 dynamic */
    void announce(vx_value_t *value, cdb_ref_t *section, vx_uint16_t *highest_index, int type) {
        now = sd_run_state::OF_ATTRIBUTE;
        attr_dflt_val = value;
        curr_sd_tbl = section;
        max_sd_idx = highest_index;
        sd_attr_type = type;
    }
    /* Keeps an owner that is already known. field may be null; the run then still has no owner. */
    void belong_to(cdb_ref_t *field) {
        if (curr_sd_tbl != nullptr || field == nullptr)
            return;
        now = sd_run_state::OF_FIELD;
        curr_sd_tbl = field;
    }
    /* The first element makes the section, at this offset. There must be an owner. */
    void begin(vx_uint32_t section) {
        curr_sd_tbl->offset[0] = section;
        sd_num_elems = 0;
    }
    void begin_for(cdb_ref_t &field, vx_uint32_t section) {
        forget_owner();
        belong_to(&field);
        field.offset[0] = section;
    }
    /* Stores the highest index in an attribute's record. */
    void end() {
        if (max_sd_idx != nullptr)
            *max_sd_idx = static_cast<vx_uint16_t>(curr_sdeli);
        restart_indexes();
    }
    /* What the owner has already been given is kept. */
    void forget_owner() {
        now = sd_run_state::NO_OWNER;
        attr_dflt_val = nullptr;
        curr_sd_tbl = nullptr;
        max_sd_idx = nullptr;
    }
    void give_up() {
        forget_owner();
        restart_indexes();
    }

    sd_run_state state() const {
        return now;
    }
    bool has_section() const {
        return curr_sd_tbl != nullptr;
    }
    bool makes_value() const {
        return now == sd_run_state::OF_ATTRIBUTE;
    }
    /* The value that the elements make; null if they do not make a value. */
    vx_value_t *value() const {
        return attr_dflt_val;
    }
    /* Refers to the section of the run; null without an owner. */
    cdb_ref_t *section() const {
        return curr_sd_tbl;
    }
    /* The type of the attribute's value; null for other owners. */
    vx_uint16_t *highest_index() const {
        return max_sd_idx;
    }
    /* The kind of the latest attribute that was announced: 0 persistent, 1 dynamic. */
    int attribute_type() const {
        return sd_attr_type;
    }

    /* ---- Elements ---- */

    void set_index(int index) {
        curr_sdeli = index;
    }
    void expect_index(int index) {
        expected_sdeli = index;
    }
    /* Index of the latest element; -1 before the first. */
    int index() const {
        return curr_sdeli;
    }
    int expected_index() const {
        return expected_sdeli;
    }
    /* Counts one more element of the value. */
    void count_element() {
        ++sd_num_elems;
    }
    size_t elements() const {
        return sd_num_elems;
    }

    sd_element_state element;

private:
    void restart_indexes() {
        curr_sdeli = -1;
        expected_sdeli = 0;
    }

    sd_run_state now = sd_run_state::NO_OWNER;
    vx_value_t *attr_dflt_val = nullptr;
    cdb_ref_t *curr_sd_tbl = nullptr;
    vx_uint16_t *max_sd_idx = nullptr;
    int sd_attr_type = 0;
    int curr_sdeli = -1;
    int expected_sdeli = 0;
    size_t sd_num_elems = 0; /* elements of the current attribute run */
};

#endif
