/* compose.cpp: the source of a database, stanza by stanza. */

#include "cdef/source/compose.h"

#include "cdef/source/check.h"
#include "cdef/source/error.h"
#include "cdef/source/groups.h"
#include "cdef/source/order.h"
#include "cdef/source/range.h"
#include "cdef/source/stanza.h"
#include "cdef/source/text.h"
#include "format/names.h"
#include "text/append.h"
#include "text/shown.h"

#include <unordered_set>

namespace cdef::source {

namespace {

constexpr std::uint32_t PERMISSIONS_GIVEN = 0xEEEEEEEE;
constexpr std::uint16_t NO_LOCATOR = 0xFFFF;
constexpr std::string_view SUFFIX = ".cdef";

constexpr std::string_view HEADING =
    "Written by 'cdef source' from a database.\n"
    "What a database does not hold is not here either: comments, lines without effect (a Locator or\n"
    "a VariableClass that names nothing, a DefaultValue of a class attribute, ListAction lines), and\n"
    "the texts of permission templates.";

/* ---- The class ------------------------------------------------------------------------------------------------- */

bool can_be_given(std::string_view name, std::string_view value) {
    return attribute_line(name, value).has_value();
}

/* The compiler takes the first persistent attribute of the name that a Locator gives, and the low half of its Id. */
std::string locator_name(const cdb::resource_class &c) {
    std::unordered_set<std::string_view> seen;
    for (const cdb::persistent_attribute &attr : c.persistent_attributes(cdb::level::of_resource)) {
        bool first = seen.insert(attr.name()).second;
        if (first && static_cast<std::uint16_t>(attr.id()) == c.record().rc_locator &&
            can_be_given("Locator", attr.name()))
            return std::string(attr.name());
    }
    no_source(place_of("ResourceClass", c.name()), "its locator is the Id of no persistent attribute");
}

/* Only then may a name and a locator follow. */
bool has_all_required(const rsrc_class_t &rc) {
    return rc.rc_perm_temp == PERMISSIONS_GIVEN && rc.rc_perm_tempC == PERMISSIONS_GIVEN;
}

bool can_be_named(const cdb::resource_class &c) {
    return has_all_required(c.record()) && can_be_given("Name", c.name());
}

/* A name that no line gives can only come from the output file's. */
void require_default_name(const cdb::resource_class &c, std::optional<std::string> &output) {
    if (c.name().find(SUFFIX) != std::string_view::npos || (output && *output != c.name()))
        no_source(place_of("ResourceClass", c.name()), "no line and no file gives it its name");
    output = c.name();
}

void write_permissions(source_writer &out, std::string_view name, std::uint32_t bits, const std::string &place) {
    if (bits != 0 && bits != PERMISSIONS_GIVEN)
        no_source(place, "no line sets " + std::string(name));
    if (bits != 0)
        out.line(name, 0);
}

void write_class_properties(source_writer &out, const rsrc_class_t &rc, const std::string &place) {
    std::string names;
    std::uint32_t bits = rc.rc_props;
    for (const props_t &p : rc_props) {
        if ((bits & p.p) == 0)
            continue;
        names.append(names.empty() ? "" : ",").append(p.s);
        bits &= ~p.p;
    }
    if (bits != 0)
        no_source(place, "no property has bit " + std::to_string(bits));
    if (!names.empty() || has_all_required(rc))
        out.line("Properties", names.empty() ? std::string_view(",") : names);
}

void write_resource_class(source_writer &out, const class_plan &plan) {
    const rsrc_class_t &rc = plan.view.record();
    std::string place = place_of("ResourceClass", plan.view.name());
    out.blank_line();
    out.stanza("ResourceClass", place);
    out.line("Description", rc.rc_dscr_msgid);
    out.line("DisplayName", rc.rc_disp_msgid);
    write_class_properties(out, rc, place);
    write_permissions(out, "ClassPermTemplate", rc.rc_perm_tempC, place);
    write_permissions(out, "ResourcePermTemplate", rc.rc_perm_temp, place);
    if (can_be_named(plan.view))
        out.line("Name", plan.view.name());
    std::uint16_t none = plan.is_last ? NO_LOCATOR : 0; /* a locator is looked up in the last class only */
    if (rc.rc_locator == none)
        return;
    if (!plan.is_last || !has_all_required(rc))
        no_source(place, "no line sets its locator");
    out.line("Locator", locator_name(plan.view));
}

void write_control_definition(source_writer &out, const cdb::resource_class &c) {
    std::uint32_t version = c.record().rc_version;
    std::string text;
    text::appendf(text, "%u.%u.%u.%u", version >> 24, version >> 16 & 255, version >> 8 & 255, version & 255);
    out.blank_line();
    out.stanza("ControlDefinition", place_of("ResourceClass", c.name()));
    out.line("FileVersion", text);
}

/* ---- The other sections ---------------------------------------------------------------------------------------- */

void write_variable_class(source_writer &out, const cdb::variable_class &v) {
    out.blank_line();
    out.stanza("ResourceVariableClass", place_of("ResourceVariableClass", v.name()));
    if (!v.name().empty())
        out.line("VariableClass", v.name());
    out.line("ObservationInterval", v.record().rvc_obsv_interval);
    out.line("ReportingInterval", v.record().rvc_report_interval);
    if (v.alias().empty())
        return;
    if (v.name().empty())
        no_source("ResourceVariableClass ''", "an alias of a variable class without a name");
    out.line("Alias", v.alias());
}

void write_map(source_writer &out, const cdb::database &db) {
    cdb::class_map map = *db.maps().begin();
    const rsrc_cmmap_t &r = map.record();
    if (r.rcm_first_key > r.rcm_last_key)
        no_source("ClassToManagerMapping", "its first key is above its last");
    out.blank_line();
    out.stanza("ClassToManagerMapping", "ClassToManagerMapping");
    out.line("ResourceManager", (*db.managers().begin()).name());
    out.line("FirstKey", r.rcm_first_key);
    out.line("LastKey", r.rcm_last_key);
    if (!map.message_catalog().empty())
        out.line("MessageCatalog", map.message_catalog());
    out.line("DescriptiveMessageSet", r.rcm_dscr_msg_set);
}

/* ---- The whole ------------------------------------------------------------------------------------------------- */

std::vector<class_plan> plans_of(const cdb::database &db, const cdb::ownership &owners) {
    std::vector<class_plan> plans;
    for (const cdb::resource_class &c : db.classes())
        plans.emplace_back(c, owners);
    plans.back().is_last = true;
    for (class_plan &plan : plans) {
        plan_order(plan);
        for (cdb::level level : {cdb::level::of_resource, cdb::level::of_class})
            plan.of(level).resize(plan.view.dynamic_attributes(level).size());
    }
    plan_ranges(plans);
    plan_variable_classes(plans, db);
    return plans;
}

/* Comment lines, however long the text is. */
void write_long_comment(source_writer &out, std::string_view text) {
    constexpr std::size_t WIDTH = 100;
    for (; !text.empty(); text.remove_prefix(std::min(WIDTH, text.size())))
        out.comment(text.substr(0, WIDTH));
}

void write_heading(source_writer &out, const std::vector<class_plan> &plans) {
    out.comment(HEADING);
    std::optional<std::string> output;
    for (const class_plan &plan : plans)
        if (!can_be_named(plan.view))
            require_default_name(plan.view, output);
    if (output)
        write_long_comment(out, "The class is called after the output file, which has to be " +
                                    text::quoted_ascii(*output + std::string(SUFFIX)) + ".");
}

} // namespace

std::string source_of(const cdb::database &db, const cdb::ownership &owners) {
    require_settable(db);
    std::vector<class_plan> plans = plans_of(db, owners);
    bool map_first = plans.back().ends_in_run;
    source_writer out;
    write_heading(out, plans);
    for (const class_plan &plan : plans) {
        write_control_definition(out, plan.view);
        write_resource_class(out, plan);
        if (&plan == &plans.front())
            for (const cdb::variable_class &v : db.variable_classes())
                write_variable_class(out, v);
        if (plan.is_last && map_first)
            write_map(out, db);
        write_steps(out, plan);
    }
    if (!map_first)
        write_map(out, db);
    return out.text;
}

} // namespace cdef::source
