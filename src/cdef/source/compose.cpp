/* compose.cpp: the source of a database, stanza by stanza. */

#include "cdef/source/compose.h"

#include "cdef/source/check.h"
#include "cdef/source/error.h"
#include "cdef/source/groups.h"
#include "cdef/source/lines.h"
#include "cdef/source/order.h"
#include "cdef/source/proof.h"
#include "cdef/source/range.h"
#include "cdef/source/stanza.h"
#include "cdef/source/structure.h"
#include "cdef/source/text.h"
#include "cdef/support/memory.h"
#include "format/constants.h"
#include "format/names.h"
#include "text/shown.h"

#include <unordered_set>

namespace cdef::source {

namespace {

constexpr std::string_view SUFFIX = ".cdef";

constexpr std::string_view HEADING =
    "Written by 'cdef source' from a database.\n"
    "The database does not contain the following, so it is missing here: comments, lines without\n"
    "effect (a Locator or a VariableClass with an unknown name, a DefaultValue of a class attribute,\n"
    "ListAction lines), and the texts of permission templates.";

/* ---- The class ------------------------------------------------------------------------------------------------- */

bool can_be_given(std::string_view name, std::string_view value) {
    std::string line;
    return append_attribute_line(line, name, value);
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
    no_source(place_of("ResourceClass", c.name()), "its locator is not the Id of a persistent attribute");
}

/* Only then may a name and a locator follow. */
bool has_all_required(const rsrc_class_t &rc) {
    return rc.rc_perm_temp == PERMISSIONS_GIVEN && rc.rc_perm_tempC == PERMISSIONS_GIVEN;
}

bool can_be_named(const cdb::resource_class &c) {
    return has_all_required(c.record()) && can_be_given("Name", c.name());
}

/* A name that no line can give can only come from the name of the output file. */
void require_default_name(const cdb::resource_class &c, std::optional<std::string> &output) {
    if (c.name().find(SUFFIX) != std::string_view::npos || (output && *output != c.name()))
        no_source(place_of("ResourceClass", c.name()), "neither a line nor a file name can give it its name");
    output = c.name();
}

class resource_class_writer {
public:
    resource_class_writer(source_writer &to, const class_plan &of)
        : out(to), from({.record = bytes_of(of.view.record()),
                         .strings = of.view.side_tables().strings,
                         .place = place_of("ResourceClass", of.view.name())}),
          plan(of), rc(of.view.record()) {
        if (!has_all_required(rc))
            from.no_optional_lines = "optional lines, but no permission templates";
    }

    void write() {
        out.stanza("ResourceClass", from.place);
        write_lines(*this, lines_of(SC_RESOURCE_CLASS));
    }

    static constexpr auto own_lines() {
        using w = resource_class_writer;
        return std::to_array<own_line<w>>({{offsetof(rsrc_class_t, rc_props), &w::write_properties},
                                           {offsetof(rsrc_class_t, rc_perm_tempC), &w::write_class_template},
                                           {offsetof(rsrc_class_t, rc_perm_temp), &w::write_resource_template},
                                           {offsetof(rsrc_class_t, u_rc_name), &w::write_name},
                                           {offsetof(rsrc_class_t, rc_locator), &w::write_locator}});
    }

    source_writer &out;
    stanza_record from;

private:
    /* A required line. Without properties it has a value that names none of them. */
    void write_properties() {
        std::string names = properties_text(rc.rc_props, rc_props, from.place);
        if (!names.empty() || has_all_required(rc))
            out.line("Properties", names.empty() ? std::string_view(",") : names);
    }

    void write_template(std::string_view name, std::uint32_t bits) {
        if (bits != 0 && bits != PERMISSIONS_GIVEN)
            no_source(from.place, "no line sets " + std::string(name));
        if (bits != 0)
            out.line(name, 0);
    }
    void write_class_template() {
        write_template("ClassPermTemplate", rc.rc_perm_tempC);
    }
    void write_resource_template() {
        write_template("ResourcePermTemplate", rc.rc_perm_temp);
    }

    void write_name() {
        if (can_be_named(plan.view))
            out.line("Name", plan.view.name());
    }

    void write_locator() {
        if (plan.whole.locator_in == plan.position)
            out.line("Locator", plan.whole.locator);
    }

    const class_plan &plan;
    const rsrc_class_t &rc;
};

/* A stanza whose lines are all plain. */
struct plain_stanza_writer {
    static constexpr std::array<own_line<plain_stanza_writer>, 0> own_lines() {
        return {};
    }

    void write(stanza_id stanza) {
        out.stanza(sc_tables[stanza].sc_name, from.place);
        write_lines(*this, lines_of(stanza));
    }

    source_writer &out;
    stanza_record from;
};

/* A locator is looked up in the last class only, but a line in any class can give it. The latest class that can have
 * the line gets it. */
void plan_locator(class_plans &plans) {
    std::optional<std::size_t> latest;
    plans.each([&](const class_plan &plan) {
        const rsrc_class_t &rc = plan.view.record();
        if (has_all_required(rc))
            latest = plan.position;
        bool is_given = rc.rc_locator != (plan.is_last ? NO_LOCATOR : 0);
        if (is_given && !(plan.is_last && latest))
            no_source(place_of("ResourceClass", plan.view.name()), "it has a locator, which no line can set");
        if (!is_given)
            return;
        plans.whole.locator = locator_name(plan.view);
        plans.whole.locator_in = latest;
    });
}

void write_control_definition(source_writer &out, const cdb::resource_class &c) {
    record_name place = place_of("ResourceClass", c.name());
    plain_stanza_writer{out, {.record = bytes_of(c.record()), .strings = c.side_tables().strings, .place = place}}
        .write(SC_CONTROL_DEFINITION);
}

/* ---- The other sections ---------------------------------------------------------------------------------------- */

void write_variable_class(source_writer &out, const cdb::variable_class &v) {
    stanza_record from = {.record = bytes_of(v.record()),
                          .strings = v.strings(),
                          .place = place_of("ResourceVariableClass", v.name()),
                          .may_lack_texts = true};
    if (v.name().empty())
        from.no_optional_lines = "an alias of a variable class without a name";
    plain_stanza_writer{out, from}.write(SC_RESOURCE_VARIABLE_CLASS);
}

class map_writer {
public:
    map_writer(source_writer &to, const cdb::database &database, const cdb::class_map &map)
        : out(to), from({.record = bytes_of(map.record()),
                         .strings = map.strings(),
                         .place = {"ClassToManagerMapping"},
                         .may_lack_texts = true}),
          db(database) {}

    void write() {
        out.stanza("ClassToManagerMapping", from.place);
        write_lines(*this, lines_of(SC_CLASS_TO_MANAGER_MAPPING));
    }

    static constexpr auto own_lines() {
        return std::to_array<own_line<map_writer>>({{offsetof(rsrc_cmmap_t, rcm_rm_ID), &map_writer::write_manager}});
    }

    source_writer &out;
    stanza_record from;

private:
    void write_manager() {
        out.line("ResourceManager", (*db.managers().begin()).name());
    }

    const cdb::database &db;
};

void write_map(source_writer &out, const cdb::database &db) {
    cdb::class_map map = *db.maps().begin();
    if (map.record().rcm_first_key > map.record().rcm_last_key)
        no_source("ClassToManagerMapping", "its first key is greater than its last");
    map_writer(out, db, map).write();
}

/* ---- The whole ------------------------------------------------------------------------------------------------- */

class_plans plans_of(const cdb::database &db, const cdb::ownership &owners) {
    require_settable(db);
    class_plans plans(db, owners);
    plans.each([](class_plan &plan) { plan_order(plan); });
    plan_ranges(plans);
    plan_variable_classes(plans, db);
    plan_locator(plans);
    if (plans.whole.ends_in_run)
        plans.whole.map_before = 0;
    plans.each([](class_plan &plan) { separate_runs(plan); });
    return plans;
}

/* Comment lines, however long the text is. */
void write_long_comment(source_writer &out, std::string_view text) {
    constexpr std::size_t WIDTH = 100;
    for (; !text.empty(); text.remove_prefix(std::min(WIDTH, text.size())))
        out.comment(text.substr(0, WIDTH));
}

/* The name of the classes without a Name line, which the compiler takes from the output file. No value if there are no
 * such classes. */
std::optional<std::string> default_name(class_plans &plans) {
    std::optional<std::string> output;
    plans.each([&](const class_plan &plan) {
        if (!can_be_named(plan.view))
            require_default_name(plan.view, output);
    });
    return output;
}

void write_heading(source_writer &out, const std::optional<std::string> &output) {
    out.comment(HEADING);
    if (output)
        write_long_comment(out, "The class is called after the output file, which has to be " +
                                    text::quoted_ascii(*output + std::string(SUFFIX)) + ".");
}

/* The stanzas of a class. The last class has the map among them. */
void write_stanzas(source_writer &out, const class_plan &plan, const cdb::database &db) {
    std::size_t end = plan.order.size();
    std::size_t map_before = plan.map_before().value_or(end);
    write_steps(out, plan, 0, map_before);
    if (plan.is_last)
        write_map(out, db);
    write_steps(out, plan, map_before, end);
}

} // namespace

std::vector<std::size_t> own_fields(stanza_id stanza) {
    if (stanza == SC_RESOURCE_CLASS)
        return own_fields_of<resource_class_writer>();
    if (stanza == SC_CLASS_TO_MANAGER_MAPPING)
        return own_fields_of<map_writer>();
    return sc_tables[stanza].sc_record == STAGED_SD_DEF ? own_element_fields() : own_attribute_fields(stanza);
}

proven_source::proven_source(const cdb::database &database, const cdb::ownership &owners)
    : db(database), plans(plans_of(db, owners)) {
    give_back_freed_memory(); /* that of planning lies between blocks that stay */
    output = default_name(plans);
    std::string file = output.value_or("Class") + std::string(SUFFIX);
    proof compiled(file, db, owners);
    compose([&](std::string_view part) { compiled.take(part); });
    compiled.require_equal();
}

void proven_source::compose(const part_taker &to) {
    source_writer out(to);
    write_heading(out, output);
    plans.each([&](const class_plan &plan) {
        write_control_definition(out, plan.view);
        resource_class_writer(out, plan).write();
        if (plan.position == 0)
            for (const cdb::variable_class &v : db.variable_classes())
                write_variable_class(out, v);
        write_stanzas(out, plan, db);
    });
    out.flush();
}

} // namespace cdef::source
