/* lists.cpp: whose the first list of valid values of a class is. */

#include "compare/compare.h"

#include <algorithm>

namespace cdef {

namespace {

constexpr cdb_ref_t rsrc_class_t::*inputs[] = {&rsrc_class_t::u_rc_def_input, &rsrc_class_t::u_rc_undef_input,
                                               &rsrc_class_t::u_rc_online_input, &rsrc_class_t::u_rc_offline_input,
                                               &rsrc_class_t::u_rc_reset_input};

/* An attribute that may refer to the first list without having it. */
struct suspect {
    table from;
    std::uint32_t began; /* offset of its variety list, which shows the order of stanzas */
    bool can_have_it;
};

bool is_proper(const cdb::value &v, const cdb::bytes &strings) {
    if (v.type() == VX_CHAR_PTR || v.type() == VX_BINARY_PTR)
        return v.present() && !misplaced(v, strings) && (v.type() == VX_BINARY_PTR || !v.text().empty());
    return v.type() >= VX_INT32 && v.type() <= VX_FLOAT64;
}

/* The list could have been given in the attribute's stanza: it is of its type, and all required lines are there. */
template <class Record> bool can_have_it(const cdb::attribute<Record> &attr, const cdb::bytes &strings) {
    cdb::valid_value_list list = attr.valid_values();
    bool complete = attr.type() != VX_UNKNOWN && !attr.varieties().empty();
    return complete && !list.empty() && std::all_of(list.begin(), list.end(), [&](const cdb::valid_value &v) {
               return is_proper(v.low, strings) && is_proper(v.high, strings);
           });
}

bool has_first_list(const cdb::sd_definition &definition) {
    return std::any_of(definition.begin(), definition.end(),
                       [](const cdb::sd_element &e) { return e.record().u_sd_valid_vals.offset[0] == 0; });
}

/* Who refers to the first list: suspects, and whether there is anybody else. */
class claims {
public:
    claims(const cdb::resource_class &of, bool is_last_class) : c(of), is_last(is_last_class) {
        add(table::persistent_class_attributes, c.persistent_attributes(cdb::level::of_class));
        add(table::dynamic_class_attributes, c.dynamic_attributes(cdb::level::of_class));
        add(table::persistent_attributes, c.persistent_attributes(cdb::level::of_resource));
        add(table::dynamic_attributes, c.dynamic_attributes(cdb::level::of_resource));
        for (cdb::level level : {cdb::level::of_resource, cdb::level::of_class})
            for (const cdb::action &a : c.actions(level))
                owned = owned || has_first_list(a.input()) || has_first_list(a.response());
        for (auto input : inputs)
            owned = owned || has_first_list(c.sd_input(input));
    }

    /* Of several suspects the one that came first has it. */
    const suspect *owner() const {
        const suspect *first = nullptr;
        for (const suspect &s : suspects)
            if (!owned && s.can_have_it && (first == nullptr || s.began < first->began))
                first = &s;
        return first;
    }

    std::vector<suspect> suspects;

private:
    template <class List> void add(table from, const List &attributes) {
        for (std::size_t i = 0; i < attributes.size(); ++i) {
            auto attr = attributes[i];
            owned = owned || has_first_list(attr.structure());
            if (attr.record().u_ra_valid_vals.offset[0] != 0)
                continue;
            if (is_last || i + 1 != attributes.size() || from == table::persistent_class_attributes)
                owned = true;
            else
                suspects.push_back(
                    {from, attr.record().u_ra_variety_list.offset[0], can_have_it(attr, c.side_tables().strings)});
        }
    }

    const cdb::resource_class &c;
    bool is_last;
    bool owned = false;
};

} // namespace

std::array<bool, ATTRIBUTE_TABLES> without_valid_values(const cdb::resource_class &c, bool is_last_class) {
    std::array<bool, ATTRIBUTE_TABLES> without = {};
    if (is_last_class)
        return without;
    claims found(c, is_last_class);
    const suspect *owner = found.owner();
    for (const suspect &s : found.suspects)
        without[static_cast<std::size_t>(s.from)] = &s != owner;
    return without;
}

} // namespace cdef
