/* order.cpp: the order of a class's stanzas. */

#include "cdef/source/order.h"

#include "cdef/source/runs.h"

#include <numeric>
#include <optional>

namespace cdef::source {

namespace {

template <class List> std::vector<traces> traces_of(const List &records) {
    std::vector<traces> found;
    found.reserve(records.size());
    for (const auto &r : records) {
        if constexpr (requires { r.record().u_ac_name; })
            found.push_back({r.record().u_ac_variety_list.offset[0], r.record().u_ac_name.offset[0]});
        else
            found.push_back({r.record().u_ra_variety_list.offset[0], r.record().u_ra_name.offset[0]});
    }
    return found;
}

std::array<std::vector<traces>, RECORD_TABLES> traces_of(const cdb::resource_class &c) {
    using enum cdb::level;
    return {traces_of(c.persistent_attributes(of_class)),
            traces_of(c.dynamic_attributes(of_class)),
            traces_of(c.persistent_attributes(of_resource)),
            traces_of(c.dynamic_attributes(of_resource)),
            traces_of(c.actions(of_class)),
            traces_of(c.actions(of_resource))};
}

std::vector<traced_step> inputs_of(const cdb::resource_class &c) {
    std::vector<traced_step> inputs;
    for (std::size_t i = 0; i < class_inputs.size(); ++i)
        if (cdb::sd_definition run = c.sd_input(class_inputs[i].reference); !run.empty())
            inputs.push_back({{table::inputs, i}, {0, run[0].record().u_sd_field_name.offset[0]}});
    return inputs;
}

/* The next record, from the table whose next variety list comes first; no value when all are done. */
std::optional<traced_step> next_record(const std::array<std::vector<traces>, RECORD_TABLES> &records,
                                       const std::array<std::size_t, RECORD_TABLES> &done) {
    std::optional<traced_step> next;
    for (std::size_t t = 0; t < RECORD_TABLES; ++t) {
        if (done[t] == records[t].size())
            continue;
        traced_step candidate = {{static_cast<table>(t), done[t]}, records[t][done[t]]};
        if (!next || candidate.left.variety_list < next->left.variety_list)
            next = candidate;
    }
    return next;
}

bool is_structured(const cdb::resource_class &c, const step &s) {
    cdb::level level = level_of(s.from);
    if (s.from == table::persistent_attributes || s.from == table::persistent_class_attributes)
        return cdb::element_type(c.persistent_attributes(level)[s.index].type()) == VX_SD_PTR;
    return is_dynamic(s.from) && cdb::element_type(c.dynamic_attributes(level)[s.index].type()) == VX_SD_PTR;
}

/* The last run for the class that directly follows an attribute of structured data or its run. */
std::optional<std::size_t> last_misplaced_run(const class_plan &plan) {
    for (std::size_t i = plan.order.size(); i-- > 1;)
        if (plan.order[i].from == table::inputs && i != plan.map_before() &&
            is_structured(plan.view, plan.order[i - 1]))
            return i;
    return std::nullopt;
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
    if (is_dynamic(s.from)) {
        cdb::dynamic_attribute attr = c.dynamic_attributes(level_of(s.from))[s.index];
        return is_late(attr, attr.initial_value());
    }
    return false;
}

/* An attribute whose run ends the file comes last. This is possible if no attribute of its kind follows it, because the
 * completion of other kinds does not depend on it. */
void put_last(class_plan &plan) {
    auto late =
        std::find_if(plan.order.begin(), plan.order.end(), [&](const step &s) { return is_late(plan.view, s); });
    if (late == plan.order.end() || !plan.is_last || late->index + 1 != plan.count(late->from))
        return;
    std::rotate(late, late + 1, plan.order.end());
    plan.whole.ends_in_run = true;
}

} // namespace

std::vector<step> order_of(const std::array<std::vector<traces>, RECORD_TABLES> &records,
                           std::vector<traced_step> inputs) {
    std::stable_sort(inputs.begin(), inputs.end(),
                     [](const traced_step &a, const traced_step &b) { return a.left.name < b.left.name; });
    auto input = inputs.begin();
    std::array<std::size_t, RECORD_TABLES> done = {};
    std::vector<step> order;
    order.reserve(std::accumulate(records.begin(), records.end(), inputs.size(),
                                  [](std::size_t sum, const std::vector<traces> &of) { return sum + of.size(); }));
    while (std::optional<traced_step> next = next_record(records, done)) {
        for (; input != inputs.end() && input->left.name < next->left.name; ++input)
            order.push_back(input->what);
        order.push_back(next->what);
        ++done[static_cast<std::size_t>(next->what.from)];
    }
    for (; input != inputs.end(); ++input)
        order.push_back(input->what);
    return order;
}

void plan_order(class_plan &plan) {
    plan.order = order_of(traces_of(plan.view), inputs_of(plan.view));
    put_last(plan);
}

/* The map stays at the end if the run of an attribute would end the file without it. */
void separate_runs(class_plan &plan) {
    while (std::optional<std::size_t> misplaced = last_misplaced_run(plan)) {
        if (plan.is_last && !plan.map_before() && !is_structured(plan.view, plan.order.back())) {
            plan.whole.map_before = misplaced;
            continue;
        }
        auto run = plan.order.begin() + static_cast<std::ptrdiff_t>(*misplaced);
        std::rotate(plan.order.begin(), run, run + 1);
    }
}

} // namespace cdef::source
