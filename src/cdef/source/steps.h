/* steps.h: the stanzas of a class as steps, and the plan that is made before they are written. */
#ifndef CDGEN_CDEF_SOURCE_STEPS_H
#define CDGEN_CDEF_SOURCE_STEPS_H

#include "cdb_view.h"
#include "format/sections.h"
#include "language/catalogue.h"
#include "reader/ownership.h"

#include <array>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace cdef::source {

/* The tables of a class that have a stanza for each record, in the order of cdb::side_tables; those of attributes
 * first. */
enum class table : std::uint8_t {
    persistent_class_attributes,
    dynamic_class_attributes,
    persistent_attributes,
    dynamic_attributes,
    class_actions,
    actions,
    inputs /* not a table: the class record's five inputs */
};
inline constexpr std::size_t RECORD_TABLES = 6;

/* table: not inputs */
constexpr const cdb::side_table &side_table_of(table t) {
    return cdb::side_tables[static_cast<std::size_t>(t)];
}
static_assert(side_table_of(table::persistent_class_attributes).stanza == "PersistentClassAttribute");
static_assert(side_table_of(table::dynamic_class_attributes).stanza == "DynamicClassAttribute");
static_assert(side_table_of(table::persistent_attributes).stanza == "PersistentResourceAttribute");
static_assert(side_table_of(table::dynamic_attributes).stanza == "DynamicResourceAttribute");
static_assert(side_table_of(table::class_actions).stanza == "ClassAction");
static_assert(side_table_of(table::actions).stanza == "ResourceAction");

/* table: not inputs */
constexpr stanza_id stanza_of(table t) {
    constexpr std::array<stanza_id, RECORD_TABLES> stanzas = {SC_PERSISTENT_CLASS_ATTRIBUTE,
                                                              SC_DYNAMIC_CLASS_ATTRIBUTE,
                                                              SC_PERSISTENT_RESOURCE_ATTRIBUTE,
                                                              SC_DYNAMIC_RESOURCE_ATTRIBUTE,
                                                              SC_CLASS_ACTION,
                                                              SC_RESOURCE_ACTION};
    return stanzas[static_cast<std::size_t>(t)];
}

constexpr cdb::level level_of(table t) {
    return t == table::persistent_class_attributes || t == table::dynamic_class_attributes || t == table::class_actions
               ? cdb::level::of_class
               : cdb::level::of_resource;
}

constexpr bool is_dynamic(table t) {
    return t == table::dynamic_class_attributes || t == table::dynamic_attributes;
}

/* The stanza of a record, or a run of SD stanzas for an input of the class. */
struct step {
    table from;
    std::size_t index;

    bool operator==(const step &) const = default;
};

/* The inputs of a class, by their index in steps. */
struct class_input {
    std::size_t offset; /* of the reference in the class record */
    cdb_ref_t rsrc_class_t::*reference;

    constexpr std::string_view stanza() const {
        return cdb::format_for<rsrc_class_t>.fact_at(offset).lines;
    }
};
inline constexpr std::array<class_input, 5> class_inputs = {{
    {offsetof(rsrc_class_t, u_rc_def_input), &rsrc_class_t::u_rc_def_input},
    {offsetof(rsrc_class_t, u_rc_undef_input), &rsrc_class_t::u_rc_undef_input},
    {offsetof(rsrc_class_t, u_rc_online_input), &rsrc_class_t::u_rc_online_input},
    {offsetof(rsrc_class_t, u_rc_offline_input), &rsrc_class_t::u_rc_offline_input},
    {offsetof(rsrc_class_t, u_rc_reset_input), &rsrc_class_t::u_rc_reset_input},
}};

/* What must be known about a dynamic attribute before its stanza is written. */
struct dynamic_plan {
    std::string variable_class; /* empty: none */
    std::string range;          /* the value of a Range line; empty: no line */
};

/* What is planned for one class. A database may have many classes, so this must be small. */
struct class_decisions {
    std::vector<step> order;
    std::array<std::vector<dynamic_plan>, 2> dynamic; /* by level */

    std::vector<dynamic_plan> &of(cdb::level level) {
        return dynamic[static_cast<std::size_t>(level)];
    }
};

/* What is planned once for a whole source. */
struct source_decisions {
    bool ends_in_run = false;              /* the last step's run of SD stanzas ends the file */
    std::optional<std::size_t> map_before; /* index of the last class's step that the map precedes; none: at the end */
    std::optional<std::size_t> locator_in; /* position of the class with the Locator line; none: no line */
    std::string locator;                   /* its value */
};

/* A class, with what is planned for it. It is made when it is needed, because views are large. */
struct class_plan {
    cdb::resource_class view;
    const cdb::ownership &owners;
    std::size_t position; /* among the classes */
    bool is_last;         /* no class follows */
    source_decisions &whole;
    std::vector<step> &order;
    class_decisions &decided;

    bool ends_in_run() const {
        return is_last && whole.ends_in_run;
    }
    std::optional<std::size_t> map_before() const {
        return is_last ? whole.map_before : std::nullopt;
    }
    std::vector<dynamic_plan> &of(cdb::level level) const {
        return decided.of(level);
    }
    std::size_t count(table of_records) const {
        return view.record().*side_table_of(of_records).count;
    }
    /* True if a field of a record leads to something that the record owns. */
    bool owns(const step &record, std::size_t field_offset) const {
        const cdb::side_table &t = side_table_of(record.from);
        std::size_t at = (view.record().*t.ref).offset[0] + record.index * t.record->size;
        return owners.is_own(view.side_tables().section, at + field_offset);
    }
    /* A class that follows in the source ends this one while the last attribute of each kind is still open: the
     * compiler writes that attribute as it is, without the checks and defaults of its completion. */
    bool is_cut_short(const step &s) const {
        return !is_last && s.from < table::class_actions && s.index + 1 == count(s.from);
    }
};

/* The plans of all classes. */
class class_plans {
public:
    /* The database and its owners must stay as long as the plans. */
    class_plans(const cdb::database &database, const cdb::ownership &ownership) : db(database), owners(ownership) {
        cdb::sections_of<cdb::resource_class> classes = db.classes();
        decisions.resize(static_cast<std::size_t>(std::distance(classes.begin(), classes.end())));
    }

    std::size_t size() const {
        return decisions.size();
    }
    /* Calls a function with each class, in the order of the file. */
    template <class Visit> void each(Visit visit) {
        std::size_t position = 0;
        for (const cdb::resource_class &c : db.classes()) {
            class_decisions &of = decisions[position];
            class_plan plan = {c, owners, position, position + 1 == size(), whole, of.order, of};
            visit(plan);
            ++position;
        }
    }
    class_decisions &operator[](std::size_t position) {
        return decisions[position];
    }

    source_decisions whole;

private:
    const cdb::database &db;
    const cdb::ownership &owners;
    std::vector<class_decisions> decisions;
};

/* True if all required lines can be given. Only then may optional ones follow. */
template <class Record> bool is_complete(const cdb::attribute<Record> &attr) {
    return attr.type() != VX_UNKNOWN && !attr.varieties().empty();
}

} // namespace cdef::source

#endif
