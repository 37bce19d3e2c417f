/* cdgen_bld_ids.cpp: the variable IDs of each variable class. */

#include "cdgen.h"

#include <string_view>
#include <unordered_map>

namespace {

constexpr size_t VARIABLE_IDS_AU = 64;

/* A variable class and its list, which is made with its first ID. */
struct class_and_list {
    rsrc_variable_class_t *rvcp;
    tbl *list;
};

/* Variable classes by name; of several with one name, the first. */
using class_index = std::unordered_map<std::string_view, class_and_list>;

/* One without a name, which is one without strings, is found under none. */
class_index index_by_name(cdgen &cx) {
    class_index index;
    for (rsrc_variable_class_t &variable_class : records_of<rsrc_variable_class_t>(&cx.rsrc_var_class_tbl)) {
        const tbl *strings = staged_tbl(variable_class.u_rvc_string_tbl);
        if (strings->tbl_base != nullptr)
            index.try_emplace(strings->tbl_base + variable_class.u_rvc_name.offset[0],
                              class_and_list{&variable_class, nullptr});
    }
    return index;
}

/* A name that is no variable class's is deliberately dropped in silence. */
void add_varID_to_var_class(cdgen &cx, class_index &index, const char *srch_name, var_id_t varID) {
    auto found = index.find(srch_name);
    if (found == index.end())
        return;
    auto &[rvcp, list] = found->second;
    if (list == nullptr) {
        list = make_tbl(cx, VARIABLE_IDS_AU, "VariableIDs");
        add_tbl_entry(cx, rvcp, list);
    }
    memcpy(alloc_tble(cx, list, sizeof varID), &varID, sizeof varID);
    ++rvcp->rvc_var_count;
}

/* In a file no attribute refers to its variable class. */
void take_ids(cdgen &cx, class_index &index, const rsrc_class_t &rsrc_class, const cdb_ref_t &dattrs, var_id_t mark) {
    tbl *strings = staged_tbl(rsrc_class.u_rc_strings);
    for (rsrc_dattr_t &attr : records_of<rsrc_dattr_t>(staged_tbl(dattrs))) {
        vx_uint32_t name = attr.u_ra_vclass.offset[0];
        if (name != CDB_NONE)
            add_varID_to_var_class(cx, index, static_cast<const char *>(tbl_at(cx, strings, name, 1)),
                                   static_cast<var_id_t>(attr.ra_attr_id) | mark);
        attr.u_ra_vclass = {};
    }
}

} // namespace

void bld_var_id_tbls(cdgen &cx) {
    class_index index = index_by_name(cx);
    for (const rsrc_class_t &rsrc_class : records_of<rsrc_class_t>(&cx.rsrc_class_tbl)) {
        take_ids(cx, index, rsrc_class, rsrc_class.u_rc_dattrsC, VAR_ID_CLASS_ATTR);
        take_ids(cx, index, rsrc_class, rsrc_class.u_rc_dattrs, 0);
    }
}

tbl *find_tbl_entry(cdgen &cx, const rsrc_variable_class_t *rvcp) {
    for (size_t i = 0; i < cx.tbl_entry_used; ++i)
        if (cx.tbl_entries[i].rvcp == rvcp)
            return cx.tbl_entries[i].tp;
    return nullptr;
}

void add_tbl_entry(cdgen &cx, const rsrc_variable_class_t *rvcp, tbl *entry_ptr) {
    if (cx.tbl_entry_used == cx.tbl_entries.size())
        bld_error_exit(cx, "Too many variable classes with dynamic attributes (100 at most)", nullptr, nullptr, 1);
    cx.tbl_entries[cx.tbl_entry_used++] = {rvcp, entry_ptr};
}

void del_tbl_entry(cdgen &cx, const rsrc_variable_class_t *rvcp) {
    for (size_t i = 0; i < cx.tbl_entry_used; ++i)
        if (cx.tbl_entries[i].rvcp == rvcp)
            cx.tbl_entries[i] = {};
}
