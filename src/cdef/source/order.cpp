/* order.cpp: the order of a class's stanzas. Records stand in a table for each kind, in the order of their
 * stanzas; how the kinds were mixed shows in the order of their variety lists, each made when its stanza began, and
 * that of names in the strings. The order matters little to a reader, but much to a Range, and to getting the same
 * bytes. */

#include "cdef/source/source.h"

#include <limits>

namespace cdef {

const std::array<class_input, 5> class_inputs = {{
    {"DefineSDDefinition", &rsrc_class_t::u_rc_def_input},
    {"UndefineSDDefinition", &rsrc_class_t::u_rc_undef_input},
    {"OnlineSDDefinition", &rsrc_class_t::u_rc_online_input},
    {"OfflineSDDefinition", &rsrc_class_t::u_rc_offline_input},
    {"ResetSDDefinition", &rsrc_class_t::u_rc_reset_input},
}};

namespace {

/* Where a stanza left its first traces. */
struct traces {
    std::uint32_t variety_list = 0;
    std::uint32_t name = 0; /* in the strings */
};

template <class Record> traces traces_of(const Record &record) {
    if constexpr (std::is_same_v<Record, rsrc_action_t>)
        return {record.u_ac_variety_list.offset[0], record.u_ac_name.offset[0]};
    else
        return {record.u_ra_variety_list.offset[0], record.u_ra_name.offset[0]};
}

traces traces_of(const cdb::resource_class &c, const step &s) {
    switch (s.from) {
    case table::persistent_class_attributes:
    case table::persistent_attributes:
        return traces_of(c.persistent_attributes(level_of(s.from))[s.index].record());
    case table::dynamic_class_attributes:
    case table::dynamic_attributes:
        return traces_of(c.dynamic_attributes(level_of(s.from))[s.index].record());
    case table::class_actions:
    case table::actions:
        return traces_of(c.actions(level_of(s.from))[s.index].record());
    case table::inputs:
        break;
    }
    cdb::sd_definition run = c.sd_input(class_inputs[s.index].reference);
    return {0, run.empty() ? 0 : run[0].record().u_sd_field_name.offset[0]};
}

/* The records of all tables, each table in its order, by their variety lists. */
std::vector<step> records_in_order(const class_plan &plan) {
    std::array<std::size_t, RECORD_TABLES> done = {};
    std::vector<step> order;
    for (;;) {
        std::optional<step> next;
        std::uint64_t first = std::numeric_limits<std::uint64_t>::max();
        for (std::size_t t = 0; t < RECORD_TABLES; ++t) {
            step candidate = {static_cast<table>(t), done[t]};
            if (candidate.index == plan.count(candidate.from))
                continue;
            std::uint64_t at = traces_of(plan.view, candidate).variety_list;
            if (at < first) {
                first = at;
                next = candidate;
            }
        }
        if (!next)
            return order;
        order.push_back(*next);
        ++done[static_cast<std::size_t>(next->from)];
    }
}

std::vector<step> inputs_in_order(const class_plan &plan) {
    std::vector<step> inputs;
    for (std::size_t i = 0; i < class_inputs.size(); ++i)
        if (!plan.view.sd_input(class_inputs[i].reference).empty())
            inputs.push_back({table::inputs, i});
    std::stable_sort(inputs.begin(), inputs.end(), [&](const step &a, const step &b) {
        return traces_of(plan.view, a).name < traces_of(plan.view, b).name;
    });
    return inputs;
}

template <class Record> bool is_late(const cdb::attribute<Record> &attr, const cdb::value &value) {
    return cdb::element_type(attr.type()) == VX_SD_PTR &&
           comes_too_late(attr.structure(), value, attr.record().ra_max_sd_idx);
}

bool is_late(const cdb::resource_class &c, const step &s) {
    if (s.from == table::persistent_attributes || s.from == table::persistent_class_attributes) {
        cdb::persistent_attribute attr = c.persistent_attributes(level_of(s.from))[s.index];
        return is_late(attr, attr.default_value());
    }
    if (s.from == table::dynamic_attributes || s.from == table::dynamic_class_attributes) {
        cdb::dynamic_attribute attr = c.dynamic_attributes(level_of(s.from))[s.index];
        return is_late(attr, attr.initial_value());
    }
    return false;
}

/* An attribute whose run ends the file comes last. It can, if nothing of its kind follows it: all others are completed
 * without regard to it. */
void put_last(class_plan &plan) {
    auto late =
        std::find_if(plan.order.begin(), plan.order.end(), [&](const step &s) { return is_late(plan.view, s); });
    if (late == plan.order.end() || !plan.is_last || late->index + 1 != plan.count(late->from))
        return;
    std::rotate(late, late + 1, plan.order.end());
    plan.ends_in_run = true;
}

} // namespace

std::size_t class_plan::count(table of_records) const {
    constexpr vx_uint16_t rsrc_class_t::*counts[RECORD_TABLES] = {
        &rsrc_class_t::rc_num_pattrsC, &rsrc_class_t::rc_num_dattrsC,  &rsrc_class_t::rc_num_pattrs,
        &rsrc_class_t::rc_num_dattrs,  &rsrc_class_t::rc_num_actionsC, &rsrc_class_t::rc_num_actions};
    return view.record().*counts[static_cast<std::size_t>(of_records)];
}

bool class_plan::owns(const step &attribute, std::size_t field_offset) const {
    constexpr cdb_ref_t rsrc_class_t::*tables[ATTRIBUTE_TABLES] = {
        &rsrc_class_t::u_rc_pattrsC, &rsrc_class_t::u_rc_dattrsC, &rsrc_class_t::u_rc_pattrs,
        &rsrc_class_t::u_rc_dattrs};
    bool is_dynamic = attribute.from == table::dynamic_class_attributes || attribute.from == table::dynamic_attributes;
    std::size_t first = (view.record().*tables[static_cast<std::size_t>(attribute.from)]).offset[0];
    std::size_t size = is_dynamic ? sizeof(rsrc_dattr_t) : sizeof(rsrc_pattr_t);
    return owners->is_own(view.side_tables().section, first + attribute.index * size + field_offset);
}

void plan_order(class_plan &plan) {
    std::vector<step> inputs = inputs_in_order(plan);
    auto next = inputs.begin();
    for (const step &s : records_in_order(plan)) {
        std::uint32_t name = traces_of(plan.view, s).name;
        while (next != inputs.end() && traces_of(plan.view, *next).name < name)
            plan.order.push_back(*next++);
        plan.order.push_back(s);
    }
    plan.order.insert(plan.order.end(), next, inputs.end());
    put_last(plan);
}

} // namespace cdef
