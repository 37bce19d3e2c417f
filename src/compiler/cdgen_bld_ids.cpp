/* cdgen_bld_ids.cpp: the variable IDs of each variable class. */

#include "compiler/cdgen_variable_ids.h"

#include "compiler/cdgen_context.h"

#include <algorithm>
#include <optional>
#include <string_view>
#include <utility>
#include <vector>

namespace {

constexpr size_t VARIABLE_IDS_AU = 64;

/* Finds variable classes by name; if several have the same name, the first. In order, because names can be chosen so
 * that each of them has the same place in a table of hashes. */
class class_index {
public:
    explicit class_index(std::span<rsrc_variable_class_t> all) : classes(all) {
        by_name.reserve(classes.size());
        for (vx_uint32_t position = 0; position < classes.size(); ++position)
            if (is_named(classes[position]))
                by_name.push_back(position);
        std::ranges::sort(by_name, {}, [this](vx_uint32_t position) { return std::pair(name_of(position), position); });
    }

    rsrc_variable_class_t *find(std::string_view name) const {
        auto found = std::ranges::lower_bound(by_name, name, {}, [this](vx_uint32_t at) { return name_of(at); });
        return found == by_name.end() || name_of(*found) != name ? nullptr : &classes[*found];
    }

private:
    /* A variable class without a name has no strings. */
    static bool is_named(const rsrc_variable_class_t &variable_class) {
        const tbl_content *strings = staged_content(variable_class.u_rvc_string_tbl);
        return strings != nullptr && strings->tbl_base != nullptr;
    }

    std::string_view name_of(vx_uint32_t position) const {
        const rsrc_variable_class_t &named = classes[position];
        return staged_content(named.u_rvc_string_tbl)->tbl_base + named.u_rvc_name.offset[0];
    }

    std::span<rsrc_variable_class_t> classes;
    std::vector<vx_uint32_t> by_name;
};

/* Deliberately, a name that no variable class has is silently dropped. */
void add_varID_to_var_class(cdgen &cx, const class_index &index, const char *srch_name, var_id_t varID) {
    rsrc_variable_class_t *rvcp = index.find(srch_name);
    if (rvcp == nullptr)
        return;
    tbl *list = find_tbl_entry(cx, rvcp);
    if (list == nullptr) {
        list = make_tbl(cx, VARIABLE_IDS_AU, "VariableIDs");
        add_tbl_entry(cx, rvcp, list);
    }
    memcpy(alloc_tble(cx, list, sizeof varID), &varID, sizeof varID);
    ++rvcp->rvc_var_count;
}

/* In a file no attribute refers to its variable class. */
void take_ids(cdgen &cx, std::optional<class_index> &index, const rsrc_class_t &rsrc_class, const cdb_ref_t &dattrs,
              var_id_t mark) {
    tbl_content *strings = staged_content(rsrc_class.u_rc_strings);
    for (rsrc_dattr_t &attr : records_of<rsrc_dattr_t>(staged_content(dattrs))) {
        vx_uint32_t name = attr.u_ra_vclass.offset[0];
        if (name != CDB_NONE) {
            if (!index)
                index.emplace(records_of<rsrc_variable_class_t>(&cx.sections.rsrc_var_class_tbl));
            add_varID_to_var_class(cx, *index, static_cast<const char *>(tbl_at(strings, name, 1)),
                                   static_cast<var_id_t>(attr.ra_attr_id) | mark);
        }
        attr.u_ra_vclass = {};
    }
}

} // namespace

void bld_var_id_tbls(cdgen &cx) {
    std::optional<class_index> index; /* made if there is a name to look up */
    for (const rsrc_class_t &rsrc_class : records_of<rsrc_class_t>(&cx.sections.rsrc_class_tbl)) {
        take_ids(cx, index, rsrc_class, rsrc_class.u_rc_dattrsC, VAR_ID_CLASS_ATTR);
        take_ids(cx, index, rsrc_class, rsrc_class.u_rc_dattrs, 0);
    }
}

tbl *find_tbl_entry(cdgen &cx, const rsrc_variable_class_t *rvcp) {
    for (size_t i = 0; i < cx.variable_ids.tbl_entry_used; ++i)
        if (cx.variable_ids.tbl_entries[i].rvcp == rvcp)
            return cx.variable_ids.tbl_entries[i].tp;
    return nullptr;
}

void add_tbl_entry(cdgen &cx, const rsrc_variable_class_t *rvcp, tbl *entry_ptr) {
    if (cx.variable_ids.tbl_entry_used == cx.variable_ids.tbl_entries.size())
        bld_error_exit(MSG_TOO_MANY_VARIABLE_CLASSES, nullptr, nullptr, 1);
    cx.variable_ids.tbl_entries[cx.variable_ids.tbl_entry_used++] = {rvcp, entry_ptr};
}
