/* stanza.cpp: the stanzas of attributes, actions and inputs of a class. */

#include "cdef/source/stanza.h"

#include "cdef/source/error.h"
#include "cdef/source/lists.h"
#include "cdef/source/runs.h"
#include "cdef/source/structure.h"
#include "cdef/source/text.h"
#include "format/names.h"

namespace cdef::source {

namespace {

constexpr std::uint32_t REQD_FOR_DEFINE = 0x2;
constexpr std::uint32_t INVAL_FOR_DEFINE = 0x4;
constexpr std::uint32_t OPT_FOR_DEFINE = 0x8;
constexpr std::int64_t NO_GROUP = 255;
constexpr std::uint32_t DEFAULT_PERMISSION = 0x40;
constexpr std::string_view NO_PERMISSION = "-"; /* no permission letter */

/* The runs of SD stanzas that belong to a record. */
struct run_names {
    std::string_view run;       /* an attribute's structure; an action's input */
    std::string_view other_run; /* may come before it: one that it replaces; an action's response */
};

constexpr run_names runs_of(table t) {
    if (t == table::class_actions || t == table::actions)
        return {"ActionInSDDefinition", "ActionOutSDDefinition"};
    return is_dynamic(t) ? run_names{"DAttrSDDefinition", "PAttrSDDefinition"}
                         : run_names{"PAttrSDDefinition", "DAttrSDDefinition"};
}

void write_properties(source_writer &out, std::uint32_t bits, std::span<const props_t> known,
                      const std::string &place) {
    std::string names;
    for (const props_t &p : known) {
        if ((bits & p.p) == 0)
            continue;
        names += (names.empty() ? "" : ",") + std::string(p.s);
        bits &= ~p.p;
    }
    if (bits != 0)
        no_source(place, "no property has bit " + std::to_string(bits));
    if (!names.empty())
        out.line("Properties", names);
}

/* Of a completed persistent attribute the compiler adds InvalForDefine if nothing says otherwise. */
std::uint32_t given_properties(std::uint32_t bits, bool cut_short, const std::string &place) {
    if (cut_short || (bits & (REQD_FOR_DEFINE | OPT_FOR_DEFINE)) != 0)
        return bits;
    if ((bits & INVAL_FOR_DEFINE) == 0)
        no_source(place, "one of ReqdForDefine, OptForDefine and InvalForDefine is always set");
    return bits & ~INVAL_FOR_DEFINE;
}

/* One attribute's stanza. */
template <class Record> class attribute_writer {
public:
    attribute_writer(source_writer &to, const class_plan &of, const step &s, const cdb::attribute<Record> &attribute)
        : out(to), plan(of), at(s), stanza(side_table_of(s.from).stanza), attr(attribute),
          cut_short(of.is_cut_short(s)), place(place_of(stanza, attribute.name())) {}

    void write() {
        out.blank_line();
        out.stanza(stanza, place);
        write_required();
        if (is_complete(attr))
            write_optional();
        else
            require_nothing_more();
        write_runs();
    }

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

    void write_required() {
        const Record &r = attr.record();
        out.line("Name", attr.name());
        out.line("Description", r.ra_dscr_msgid);
        out.line("DisplayName", r.ra_disp_msgid);
        out.line("Id", r.ra_attr_id);
        if (attr.type() != VX_UNKNOWN)
            out.line("DataType", cdb::name_of(attr.type()));
        if constexpr (DYNAMIC)
            out.line("VariableType", vxVarStr[r.ra_var_type]);
        write_varieties(out, attr.varieties());
        if (!cut_short && !is_complete(attr))
            no_source(place, "no type or no varieties");
        if (!cut_short && attr.type() == VX_SBS_PTR)
            no_source(place, "a type without values");
    }

    void write_optional() {
        const Record &r = attr.record();
        if constexpr (DYNAMIC)
            if (!plan_of().variable_class.empty())
                out.line("VariableClass", plan_of().variable_class);
        out.optional_line("GroupID", r.ra_group_id, cut_short ? 0 : NO_GROUP);
        out.optional_line("GroupName", r.ra_group_msgid, 0);
        if constexpr (DYNAMIC)
            write_properties(out, r.ra_props, da_props, place);
        else
            write_properties(out, given_properties(r.ra_props, cut_short, place), pa_props, place);
        write_value();
        write_valid_values(out, DYNAMIC ? "ValidStateValue" : "ValidValue", own_valid_values());
        if constexpr (DYNAMIC)
            write_conditions();
    }

    void write_conditions() requires DYNAMIC {
        const Record &r = attr.record();
        if (!plan_of().range.empty())
            out.line("Range", plan_of().range);
        if (!attr.expression().empty())
            out.line("Expression", attr.expression());
        out.optional_line("ExpressionDescription", r.ra_expr_desc, 0);
        if (!attr.rearm_expression().empty())
            out.line("ReArmExpression", attr.rearm_expression());
        out.optional_line("ReArmDescription", r.ra_rearm_desc, 0);
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
            no_source(place, "no line sets its value");
        write_value_lines(DYNAMIC ? "InitialValue" : "DefaultValue", value);
    }

    /* One line for each element of an array; but an initial value has one line only. */
    void write_value_lines(std::string_view name, const cdb::value &value) {
        if (!cdb::is_array(value.type()))
            return out.line_of_any(name, texts_of(value, false));
        std::size_t count = value.elements().size();
        if (count == 0 || (DYNAMIC && count != 1))
            no_source(place, "no lines give an array of " + std::to_string(count) + " elements");
        for (const cdb::value &element : value.elements())
            out.line_of_any(name, texts_of(element, false));
    }

    /* Refuses what only optional lines give: they cannot follow. */
    void require_nothing_more() {
        const Record &r = attr.record();
        bool more = r.ra_props != 0 || r.ra_group_id != 0 || r.ra_group_msgid != 0 || !own_valid_values().empty();
        if constexpr (DYNAMIC)
            more = more || !attr.expression().empty() || !attr.rearm_expression().empty() || r.ra_expr_desc != 0 ||
                   r.ra_rearm_desc != 0;
        if (more)
            no_source(place, "optional lines, but no type or no varieties");
        write_value();
    }

    void write_runs() {
        run_names names = runs_of(at.from);
        attribute_structure s = {.stanza = names.run,
                                 .other_stanza = names.other_run,
                                 .definition = attr.structure(),
                                 .value = own_value(),
                                 .highest_index = attr.record().ra_max_sd_idx,
                                 .ends_file = plan.ends_in_run && is_last_step()};
        if (cdb::element_type(attr.type()) == VX_SD_PTR)
            write_structure(out, s, place);
        else if (!s.definition.empty() || s.highest_index != NO_INDEX)
            no_source(place, "a structure, but it is of another type");
    }

    bool is_last_step() const {
        return plan.order.back().from == at.from && plan.order.back().index == at.index;
    }

    source_writer &out;
    const class_plan &plan;
    step at;
    std::string_view stanza;
    const cdb::attribute<Record> &attr;
    bool cut_short;
    std::string place;
};

void write_permission(source_writer &out, std::uint32_t mask, const std::string &place) {
    if (mask == DEFAULT_PERMISSION)
        return;
    if (mask == 0)
        return out.line("Permission", NO_PERMISSION);
    for (const valid_perms_t &known : perm_list)
        if (known.mask == mask)
            return out.line("Permission", std::string_view(&known.permission, 1));
    no_source(place, "no permission letter stands for " + std::to_string(mask));
}

void write_action(source_writer &out, table from, const cdb::action &action) {
    std::string_view stanza = side_table_of(from).stanza;
    run_names names = runs_of(from);
    const rsrc_action_t &r = action.record();
    std::string place = place_of(stanza, action.name());
    out.blank_line();
    out.stanza(stanza, place);
    out.line("Name", action.name());
    out.line("Description", r.ac_dscr_msgid);
    out.line("DisplayName", r.ac_disp_msgid);
    out.line("Id", r.ac_action_id);
    write_varieties(out, action.varieties());
    if (action.varieties().empty())
        no_source(place, "no varieties");
    write_properties(out, r.ac_props, act_props, place);
    write_permission(out, r.ac_perms, place);
    out.optional_line("ConfirmationMsg", r.ac_confirm_msgid, 0);
    out.optional_line("TimeOut", r.ac_timeout, 0);
    bool response_first = r.u_ac_sd_resp.offset[0] < r.u_ac_sd_input.offset[0];
    if (response_first)
        write_run(out, names.other_run, action.response(), place);
    write_run(out, names.run, action.input(), place);
    if (!response_first)
        write_run(out, names.other_run, action.response(), place);
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
        return write_action(out, s.from, plan.view.actions(level_of(s.from))[s.index]);
    case table::inputs:
        out.blank_line();
        return write_run(out, class_inputs[s.index].stanza(), plan.view.sd_input(class_inputs[s.index].reference),
                         place_of("ResourceClass", plan.view.name()));
    }
}

} // namespace

void write_steps(source_writer &out, const class_plan &plan) {
    for (const step &s : plan.order)
        write_step(out, plan, s);
}

} // namespace cdef::source
