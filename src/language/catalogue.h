/* catalogue.h: the source language as data: stanza kinds and their attributes. */
#ifndef CDGEN_LANGUAGE_CATALOGUE_H
#define CDGEN_LANGUAGE_CATALOGUE_H

#include "cdb.h"
#include "language/name_index.h"
#include "language/name_pattern.h"

#include <array>
#include <span>
#include <string_view>

/* Indexes of sc_tables. */
enum stanza_id {
    SC_CONTROL_DEFINITION,
    SC_CLASS_TO_MANAGER_MAPPING,
    SC_RESOURCE_VARIABLE_CLASS,
    SC_RESOURCE_CLASS,
    SC_PERSISTENT_RESOURCE_ATTRIBUTE,
    SC_PERSISTENT_CLASS_ATTRIBUTE,
    SC_DYNAMIC_RESOURCE_ATTRIBUTE,
    SC_DYNAMIC_CLASS_ATTRIBUTE,
    SC_CLASS_ACTION,
    SC_RESOURCE_ACTION,
    SC_PATTR_SD_DEFINITION,
    SC_DATTR_SD_DEFINITION,
    SC_DEFINE_SD_DEFINITION,
    SC_UNDEFINE_SD_DEFINITION,
    SC_ONLINE_SD_DEFINITION,
    SC_OFFLINE_SD_DEFINITION,
    SC_RESET_SD_DEFINITION,
    SC_ACTION_IN_SD_DEFINITION,
    SC_ACTION_OUT_SD_DEFINITION,
    SC_COUNT
};

enum sd_type_t {
    SD_TYPE_ONLINE,
    SD_TYPE_OFFLINE,
    SD_TYPE_DEFINE,
    SD_TYPE_UNDEFINE,
    SD_TYPE_RESET,
    SD_TYPE_ACT_IN,
    SD_TYPE_ACT_RESP,
    SD_TYPE_PATTR,
    SD_TYPE_DATTR,
    SD_TYPE_UNKNOWN
};

constexpr vx_uint32_t OPTIONAL = 0x80000000u; /* set in req_bit if the attribute is optional */

/* How an attribute's text is converted and stored: an index of the value handlers. */
enum attr_type {
    AT_UINT8 = 0, /* no attribute uses it */
    AT_UINT16 = 1,
    AT_UINT32 = 2, /* no attribute uses it */
    AT_STRING = 3,
    AT_CLASS_PROPS = 4,
    AT_VERSION = 5,
    AT_PERM_TEMPLATE = 6,
    AT_MANAGER = 7,
    AT_LOCATOR = 8,
    AT_ID = 9,
    AT_VARIETY = 10,
    AT_PATTR_PROPS = 11,
    AT_DATTR_PROPS = 12,
    AT_ACTION_PROPS = 13,
    AT_VALID_VALUE = 14,
    AT_DEFAULT_VALUE = 15,
    AT_VALUE_DISPLAY = 16,
    AT_DATA_TYPE = 17,
    AT_VARIABLE_TYPE = 18,
    AT_RANGE = 19,
    AT_INITIAL_VALUE = 20,
    AT_SD_INDEX = 21,
    AT_SD_NAME = 22,
    AT_SD_DESCRIPTION = 23,
    AT_SD_DISPLAY = 24,
    AT_SD_DATA_TYPE = 25,
    AT_SD_VALID_VALUE = 26,
    AT_SD_VALUE_DISPLAY = 27,
    AT_SD_DEFAULT_VALUE = 28,
    AT_LIST_ACTION_CLASS = 29,
    AT_LIST_ACTION_RSRC = 30,
    AT_PERMISSION = 31,
    AT_COUNT
};

struct table_attrs {
    const char *ta_name;
    int ta_type;         /* attr_type */
    int ta_offset;       /* of the field in the stanza's staging record */
    vx_uint32_t req_bit; /* the attribute's bit in req_mask or, with OPTIONAL added, in opt_mask */
    int dup_allowed;     /* true: may be given several times in one stanza */
    size_t ta_length = std::string_view(ta_name).size();
    language::name_pattern ta_pattern{ta_name};
};

/* The differences between the four attribute kinds while their lines are parsed. */
struct attr_kind {
    int sd_attr_type;      /* 0 persistent, 1 dynamic */
    int value_offset;      /* ra_dflt_value or ra_init_value */
    int sd_offset;         /* u_ra_sd */
    int max_sd_idx_offset; /* ra_max_sd_idx */
};

/* The owner of a run of elements, whose record refers to the run's SD section; in runs of attributes, the attribute. */
struct sd_owner {
    sd_type_t type;
    cdb_ref_t rsrc_class_t::*of_class;
    cdb_ref_t rsrc_action_t::*of_action;

    bool is_attribute() const {
        return type == SD_TYPE_PATTR || type == SD_TYPE_DATTR;
    }
};

/* The record that a stanza fills. */
enum staged_record {
    STAGED_CLASS,
    STAGED_CMMAP,
    STAGED_VARIABLE_CLASS,
    STAGED_PATTR,
    STAGED_PATTR_C,
    STAGED_DATTR,
    STAGED_DATTR_C,
    STAGED_ACTION,
    STAGED_ACTION_C,
    STAGED_SD_DEF,
    STAGED_COUNT
};

/* The tables that a stanza's strings and lists go to. */
enum staged_tables {
    TABLES_OF_CLASS,          /* strings and lists of the open class */
    TABLES_OF_CMMAP,          /* strings only */
    TABLES_OF_VARIABLE_CLASS, /* strings of its own; elements in the tables of the open class */
    TABLES_COUNT
};

/* A stanza kind. */
struct srtable_ctrl {
    const char *sc_name; /* null ends sc_tables */
    staged_record sc_record;
    staged_tables sc_side_tables;
    std::span<const table_attrs> sc_attrs;
    name_index sc_attr_names;    /* of sc_attrs */
    vx_uint32_t req_mask_cmplt;  /* what req_mask is when every required attribute has been seen */
    int dt_offset;               /* of the data type in the record; -1 without one */
    const attr_kind *sc_attr;    /* attribute kinds only */
    const sd_owner *sc_sd_owner; /* SD kinds only */
};

extern const std::array<srtable_ctrl, SC_COUNT + 1> sc_tables;

/* The index of a stanza kind by its exact name, or -1. */
int set_table_id(std::string_view name);
/* A kind's attribute by its exact name, or null. */
const table_attrs *find_attr(const srtable_ctrl &scp, std::string_view name);

#endif
