/* cdgen_variable_ids.h: the variable IDs of each variable class. */
#ifndef CDGEN_CDGEN_VARIABLE_IDS_H
#define CDGEN_CDGEN_VARIABLE_IDS_H

#include "compiler/cdgen_tables.h"
#include "language/limits.h"

#include <array>
#include <cstddef>

struct cdgen;

/* A variable class and the list of its variable IDs. */
struct tbl_pair {
    const rsrc_variable_class_t *rvcp;
    tbl *tp;
};

struct variable_id_lists {
    std::array<tbl_pair, VARIABLE_CLASSES_MAX> tbl_entries = {};
    size_t tbl_entry_used = 0;
};

/* Variable IDs: gives each variable class the list of its dynamic attributes. */
void bld_var_id_tbls(cdgen &cx);
tbl *find_tbl_entry(cdgen &cx, const rsrc_variable_class_t *rvcp);
void add_tbl_entry(cdgen &cx, const rsrc_variable_class_t *rvcp, tbl *entry_ptr);

#endif
