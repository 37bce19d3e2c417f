/* stanza.cpp: the stanzas of attributes, actions and inputs of a class. */

#include "cdef/source/stanza.h"

#include "cdef/source/error.h"
#include "cdef/source/lines.h"
#include "cdef/source/lists.h"
#include "cdef/source/runs.h"
#include "cdef/source/structure.h"
#include "cdef/source/text.h"
#include "format/constants.h"
#include "format/names.h"

namespace cdef::source {

namespace {

/* The runs of SD stanzas that belong to a record. */
struct run_names {
    std::string_view run;       /* an attribute's structure; an action's input */
    std::string_view other_run; /* an earlier run that it replaces; or an action's response */
};

constexpr run_names runs_of(table t) {
    if (t == table::class_actions || t == table::actions)
        return {"ActionInSDDefinition", "ActionOutSDDefinition"};
    return is_dynamic(t) ? run_names{"DAttrSDDefinition", "PAttrSDDefinition"}
                         : run_names{"PAttrSDDefinition", "DAttrSDDefinition"};
}

/* The compiler adds InvalForDefine to a completed persistent attribute without another such property. */
std::uint32_t given_properties(std::uint32_t bits, bool cut_short, const record_name &place) {
    if (cut_short || (bits & (REQD_FOR_DEFINE | OPT_FOR_DEFINE)) != 0)
        return bits;
    if ((bits & INVAL_FOR_DEFINE) == 0)
        no_source(place, "none of ReqdForDefine, OptForDefine and InvalForDefine is set, which no source can do");
    return bits & ~INVAL_FOR_DEFINE;
}

/* One attribute's stanza. */
template <class Record> class attribute_writer {
public:
    attribute_writer(source_writer &to, const class_plan &of, const step &s, const cdb::attribute<Record> &attribute)
        : out(to), from({.record = bytes_of(attribute.record()),
                         .strings = of.view.side_tables().strings,
                         .place = place_of(side_table_of(s.from).stanza, attribute.name()),
                         .is_completed = !of.is_cut_short(s)}),
          plan(of), at(s), attr(attribute), cut_short(of.is_cut_short(s)) {}

    void write() {
        std::span<const stanza_line> lines = lines_of(stanza_of(at.from));
        auto required = static_cast<std::size_t>(
            std::count_if(lines.begin(), lines.end(), [](const stanza_line &l) { return l.is_required(); }));
        out.stanza(side_table_of(at.from).stanza, from.place);
        write_lines(*this, lines.first(required));
        require_type_and_varieties();
        if (is_complete(attr))
            write_lines(*this, lines.subspan(required));
        else
            require_nothing_more(lines.subspan(required));
        write_runs();
    }

    static constexpr auto own_lines() {
        using w = attribute_writer;
        if constexpr (DYNAMIC)
            return std::to_array<own_line<w>>({{offsetof(Record, u_ra_variety_list), &w::write_variety_lines},
                                               {offsetof(Record, u_ra_vclass), &w::write_variable_class},
                                               {offsetof(Record, ra_init_value), &w::write_values},
                                               {offsetof(Record, u_ra_valid_vals), &w::write_values},
                                               {offsetof(Record, ra_max_value), &w::write_values}});
        else
            return std::to_array<own_line<w>>({{offsetof(Record, u_ra_variety_list), &w::write_variety_lines},
                                               {offsetof(Record, ra_props), &w::write_given_properties},
                                               {offsetof(Record, ra_dflt_value), &w::write_values},
                                               {offsetof(Record, u_ra_valid_vals), &w::write_values}});
    }

    source_writer &out;
    stanza_record from;

private:
    static constexpr bool DYNAMIC = std::is_same_v<Record, rsrc_dattr_t>;

    cdb::value own_value() const {
        if constexpr (DYNAMIC)
            return attr.initial_value();
        else
            return attr.default_value();
    }

    cdb::valid_value_list own_valid_values() const {
        return plan.owns(at, offsetof(Record, u_ra_valid_vals)) ? attr.valid_values() : cdb::valid_value_list();
    }

    void require_type_and_varieties() const {
        if (!cut_short && !is_complete(attr))
            no_source(from.place, "it has no data type or no varieties, which a source must give");
        if (!cut_short && attr.type() == VX_SBS_PTR)
            no_source(from.place, "its data type has no values");
    }

    void write_variety_lines() {
        write_varieties(out, attr.varieties());
    }

    void write_variable_class() requires DYNAMIC {
        if (!plan_of().variable_class.empty())
            out.line("VariableClass", plan_of().variable_class);
    }

    void write_given_properties() requires(!DYNAMIC) {
        std::uint32_t bits = given_properties(attr.record().ra_props, cut_short, from.place);
        std::string names = properties_text(bits, pa_props, from.place);
        if (!names.empty())
            out.line("Properties", names);
    }

    /* The value, valid values and bounds. */
    void write_values() {
        write_value();
        write_valid_values(out, DYNAMIC ? "ValidStateValue" : "ValidValue", own_valid_values());
        if constexpr (DYNAMIC)
            if (!plan_of().range.empty())
                out.line("Range", plan_of().range);
    }

    const dynamic_plan &plan_of() const {
        return plan.of(level_of(at.from))[at.index];
    }

    /* Values given to an attribute cut short, or to a persistent class attribute, are not kept. */
    void write_value() {
        cdb::value value = own_value();
        if (cdb::element_type(attr.type()) == VX_SD_PTR)
            return;
        bool none = cut_short && (cdb::is_out_of_line(attr.type()) ? !value.present() : is_default(value));
        if (none || (!cut_short && is_default(value)))
            return;
        if (cut_short || at.from == table::persistent_class_attributes)
            no_source(from.place, "it has a value, which no line can set");
        write_value_lines(DYNAMIC ? "InitialValue" : "DefaultValue", value);
    }

    /* One line for each element of an array; an initial value has only one line. */
    void write_value_lines(std::string_view name, const cdb::value &value) {
        if (!cdb::is_array(value.type()))
            return out.line_of_any(name, texts_of(value, false));
        std::size_t count = value.elements().size();
        if (count == 0 || (DYNAMIC && count != 1))
            no_source(from.place, "no lines can give an array of " + std::to_string(count) + " elements");
        for (const cdb::value &element : value.elements())
            out.line_of_any(name, texts_of(element, false));
    }

    /* Refuses values that only optional lines give, because such lines cannot follow. */
    void require_nothing_more(std::span<const stanza_line> optional) {
        bool more = std::any_of(optional.begin(), optional.end(),
                                [&](const stanza_line &l) { return is_plain(l) && !is_default(l, from); });
        if (more || !own_valid_values().empty())
            no_source(from.place, "it has optional attributes, which can only follow a data type and varieties");
        write_value();
    }

    void write_runs() {
        run_names names = runs_of(at.from);
        attribute_structure s = {.stanza = names.run,
                                 .other_stanza = names.other_run,
                                 .definition = attr.structure(),
                                 .value = own_value(),
                                 .highest_index = attr.record().ra_max_sd_idx,
                                 .ends_file = plan.ends_in_run() && is_last_step()};
        if (cdb::element_type(attr.type()) == VX_SD_PTR)
            write_structure(out, s, from.place);
        else if (!s.definition.empty() || s.highest_index != NO_SD_INDEX)
            no_source(from.place, "it has a structure, but its data type is not SD");
    }

    bool is_last_step() const {
        return plan.order.back().from == at.from && plan.order.back().index == at.index;
    }

    const class_plan &plan;
    step at;
    const cdb::attribute<Record> &attr;
    bool cut_short;
};

/* One action's stanza. */
class action_writer {
public:
    action_writer(source_writer &to, const class_plan &plan, table of, const cdb::action &written)
        : out(to), from({.record = bytes_of(written.record()),
                         .strings = plan.view.side_tables().strings,
                         .place = place_of(side_table_of(of).stanza, written.name())}),
          in(of), action(written) {}

    void write() {
        out.stanza(side_table_of(in).stanza, from.place);
        write_lines(*this, lines_of(stanza_of(in)));
        write_runs();
    }

    static constexpr auto own_lines() {
        return std::to_array<own_line<action_writer>>(
            {{offsetof(rsrc_action_t, u_ac_variety_list), &action_writer::write_variety_lines}});
    }

    source_writer &out;
    stanza_record from;

private:
    void write_variety_lines() {
        write_varieties(out, action.varieties());
        if (action.varieties().empty())
            no_source(from.place, "it has no varieties, which a source must give");
    }

    void write_runs() {
        run_names names = runs_of(in);
        bool response_first = action.record().u_ac_sd_resp.offset[0] < action.record().u_ac_sd_input.offset[0];
        if (response_first)
            write_run(out, names.other_run, action.response(), from.place);
        write_run(out, names.run, action.input(), from.place);
        if (!response_first)
            write_run(out, names.other_run, action.response(), from.place);
    }

    table in;
    const cdb::action &action;
};

void write_action(source_writer &out, const class_plan &plan, const step &s) {
    cdb::action action = plan.view.actions(level_of(s.from))[s.index];
    action_writer(out, plan, s.from, action).write();
}

void write_step(source_writer &out, const class_plan &plan, const step &s) {
    switch (s.from) {
    case table::persistent_class_attributes:
    case table::persistent_attributes: {
        cdb::persistent_attribute attr = plan.view.persistent_attributes(level_of(s.from))[s.index];
        return attribute_writer<rsrc_pattr_t>(out, plan, s, attr).write();
    }
    case table::dynamic_class_attributes:
    case table::dynamic_attributes: {
        cdb::dynamic_attribute attr = plan.view.dynamic_attributes(level_of(s.from))[s.index];
        return attribute_writer<rsrc_dattr_t>(out, plan, s, attr).write();
    }
    case table::class_actions:
    case table::actions:
        return write_action(out, plan, s);
    case table::inputs:
        return write_run(out, class_inputs[s.index].stanza(), plan.view.sd_input(class_inputs[s.index].reference),
                         place_of("ResourceClass", plan.view.name()));
    }
}

} // namespace

std::vector<std::size_t> own_attribute_fields(stanza_id stanza) {
    switch (stanza) {
    case SC_PERSISTENT_CLASS_ATTRIBUTE:
    case SC_PERSISTENT_RESOURCE_ATTRIBUTE:
        return own_fields_of<attribute_writer<rsrc_pattr_t>>();
    case SC_DYNAMIC_CLASS_ATTRIBUTE:
    case SC_DYNAMIC_RESOURCE_ATTRIBUTE:
        return own_fields_of<attribute_writer<rsrc_dattr_t>>();
    case SC_CLASS_ACTION:
    case SC_RESOURCE_ACTION:
        return own_fields_of<action_writer>();
    default:
        return {};
    }
}

void write_steps(source_writer &out, const class_plan &plan, std::size_t first, std::size_t last) {
    for (const step &s : std::span(plan.order).subspan(first, last - first))
        write_step(out, plan, s);
}

} // namespace cdef::source
