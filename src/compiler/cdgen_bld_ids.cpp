/* cdgen_bld_ids.cpp: the variable IDs of each variable class. */

#include "compiler/cdgen_variable_ids.h"

#include "compiler/cdgen_context.h"

#include <algorithm>
#include <functional>
#include <optional>
#include <string_view>
#include <tuple>
#include <vector>

namespace {

constexpr size_t VARIABLE_IDS_AU = 64;

/* Finds variable classes by name; if several have the same name, the first. In order rather than in a table of hashes,
 * because names can be chosen so that their hashes are equal; by hash first, because hashes are compared faster. */
class class_index {
public:
    explicit class_index(std::span<rsrc_variable_class_t> all) : classes(all) {
        entries.reserve(classes.size());
        for (vx_uint32_t position = 0; position < classes.size(); ++position)
            add(position);
        std::ranges::sort(entries, comes_before);
    }

    rsrc_variable_class_t *find(std::string_view name) const {
        auto found = std::ranges::lower_bound(entries, entry{hash_of(name), name, 0}, comes_before);
        return found == entries.end() || found->name != name ? nullptr : &classes[found->position];
    }

private:
    struct entry {
        size_t hash;
        std::string_view name;
        vx_uint32_t position;
    };

    static bool comes_before(const entry &one, const entry &other) {
        return std::tie(one.hash, one.name, one.position) < std::tie(other.hash, other.name, other.position);
    }

    static size_t hash_of(std::string_view name) {
        return std::hash<std::string_view>()(name);
    }

    /* A variable class without a name has no strings. */
    void add(vx_uint32_t position) {
        const rsrc_variable_class_t &added = classes[position];
        const tbl_content *strings = staged_content(added.u_rvc_string_tbl);
        if (strings == nullptr || strings->tbl_base == nullptr)
            return;
        std::string_view name = strings->tbl_base + added.u_rvc_name.offset[0];
        entries.push_back({hash_of(name), name, position});
    }

    std::span<rsrc_variable_class_t> classes;
    std::vector<entry> entries;
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
