/* cdgen_bld_ids.cpp: the variable IDs of each variable class. */

#include "compiler/cdgen_variable_ids.h"

#include "compiler/cdgen_context.h"

#include <bit>
#include <functional>
#include <optional>
#include <string_view>

namespace {

constexpr size_t VARIABLE_IDS_AU = 64;

/* Finds variable classes by name; if several have the same name, the first. */
class class_index {
public:
    explicit class_index(std::span<rsrc_variable_class_t> all)
        : classes(all), slots(std::bit_ceil(2 * all.size() + 1)) {
        for (vx_uint32_t number = 1; number <= classes.size(); ++number)
            if (is_named(classes[number - 1]))
                enter(number);
    }

    rsrc_variable_class_t *find(std::string_view name) const {
        vx_uint32_t number = slots[slot_of(name)];
        return number == 0 ? nullptr : &classes[number - 1];
    }

private:
    /* A variable class without a name has no strings. */
    static bool is_named(const rsrc_variable_class_t &variable_class) {
        const tbl_content *strings = staged_content(variable_class.u_rvc_string_tbl);
        return strings != nullptr && strings->tbl_base != nullptr;
    }

    std::string_view name_of(vx_uint32_t number) const {
        const rsrc_variable_class_t &named = classes[number - 1];
        return staged_content(named.u_rvc_string_tbl)->tbl_base + named.u_rvc_name.offset[0];
    }

    /* The slot of the name, or the free slot where it may be entered. */
    size_t slot_of(std::string_view name) const {
        size_t slot = std::hash<std::string_view>()(name) % slots.size();
        while (slots[slot] != 0 && name_of(slots[slot]) != name)
            slot = (slot + 1) % slots.size();
        return slot;
    }

    void enter(vx_uint32_t number) {
        if (vx_uint32_t &slot = slots[slot_of(name_of(number))]; slot == 0)
            slot = number;
    }

    std::span<rsrc_variable_class_t> classes;
    std::vector<vx_uint32_t> slots; /* positions of classes, counted from 1; at least half of them are free: 0 */
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
