/* check.cpp: refuses what cannot be written as a source: unusual values in fields that no line sets, and sections that
 * the compiler does not make. */

#include "cdef/source/check.h"

#include "cdef/source/error.h"
#include "cdef/source/steps.h"
#include "text/shown.h"

#include <optional>
#include <vector>

namespace cdef::source {

namespace {

std::uint32_t number_at(const std::byte *from, std::size_t width) {
    std::uint16_t half = 0;
    std::uint32_t whole = 0;
    std::memcpy(&half, from, sizeof half);
    if (width != sizeof half)
        std::memcpy(&whole, from, sizeof whole);
    return width == sizeof half ? half : whole;
}

/* The value that the compiler gives a field in every file; no value if lines fill it, or if it is layout. */
std::optional<std::uint32_t> constant_in(const cdb::field_fact &fact) {
    if (fact.is == cdb::role::LAYOUT || (!fact.always && !fact.lines.empty()))
        return std::nullopt;
    return fact.always.value_or(0);
}

/* A field that has the same value in every file. */
struct constant_field {
    const cdb::field *field;
    std::uint32_t value;
};

template <class Record> std::vector<constant_field> find_constants() {
    std::vector<constant_field> found;
    for (const cdb::field &f : cdb::fields_of<Record>) {
        if (f.kind != cdb::field_kind::number && f.kind != cdb::field_kind::reference)
            continue;
        if (std::optional<std::uint32_t> value = constant_in(cdb::format_for<Record>.fact_of(f)))
            found.push_back({&f, *value});
    }
    return found;
}

/* Checks that every field that no line fills has the value that the compiler gives it. */
template <class Record> void require_plain(const Record &record, const record_name &place) {
    static const std::vector<constant_field> constants = find_constants<Record>();
    const auto *bytes = reinterpret_cast<const std::byte *>(&record);
    for (const constant_field &constant : constants) {
        std::uint32_t found = number_at(bytes + constant.field->offset, constant.field->width);
        if (found != constant.value)
            no_source(place, "no line sets " + std::string(constant.field->name) + " to " + std::to_string(found));
    }
}

void require_plain_definition(const cdb::sd_definition &definition, const record_name &place) {
    for (const cdb::sd_element &e : definition)
        require_plain(e.record(), place.with_element(e.name()));
}

template <class List> void require_plain_attributes(const List &list, table from) {
    for (const auto &attr : list) {
        record_name place = place_of(side_table_of(from).stanza, attr.name());
        require_plain(attr.record(), place);
        require_plain_definition(attr.structure(), place);
    }
}

void require_plain_actions(const cdb::resource_class &c, table from) {
    for (const cdb::action &action : c.actions(level_of(from))) {
        record_name place = place_of(side_table_of(from).stanza, action.name());
        require_plain(action.record(), place);
        require_plain_definition(action.input(), place);
        require_plain_definition(action.response(), place);
    }
}

void require_plain_class(const cdb::resource_class &c) {
    using enum cdb::level;
    record_name place = place_of("ResourceClass", c.name());
    require_plain(c.record(), place);
    for (const class_input &input : class_inputs)
        require_plain_definition(c.sd_input(input.reference), place);
    require_plain_attributes(c.persistent_attributes(of_resource), table::persistent_attributes);
    require_plain_attributes(c.persistent_attributes(of_class), table::persistent_class_attributes);
    require_plain_attributes(c.dynamic_attributes(of_resource), table::dynamic_attributes);
    require_plain_attributes(c.dynamic_attributes(of_class), table::dynamic_class_attributes);
    require_plain_actions(c, table::actions);
    require_plain_actions(c, table::class_actions);
}

bool is_made(cdb_dsect_type_t type) {
    return type >= CDB_DSECT_RSRC_MGR && type <= CDB_DSECT_CMMAP;
}

void require_sections(const cdb::database &db) {
    std::array<std::size_t, CDB_DSECT_CMMAP + 1> counts = {};
    for (std::size_t i = 0; i < db.section_count(); ++i) {
        cdb_dsect_anchor_t anchor = db.anchor(i);
        if (!is_made(anchor.cda_type))
            no_source("section " + std::to_string(i),
                      "no source compiles to a section of type " + std::to_string(anchor.cda_type));
        if (anchor.cda_revision != 0)
            no_source("section " + std::to_string(i), "it has a revision, which no source can set");
        ++counts[anchor.cda_type];
    }
    if (counts[CDB_DSECT_CLASS] == 0)
        no_source("database", "it has no class");
    if (counts[CDB_DSECT_RSRC_MGR] != 1)
        no_source("database",
                  "a source has one manager, but this database has " + std::to_string(counts[CDB_DSECT_RSRC_MGR]));
    if (counts[CDB_DSECT_CMMAP] != 1)
        no_source("database", "a source has one ClassToManagerMapping, but this database has " +
                                  std::to_string(counts[CDB_DSECT_CMMAP]));
}

} // namespace

void require_settable(const cdb::database &db) {
    require_plain(db.header(), {"database"});
    require_sections(db);
    for (const cdb::resource_class &c : db.classes())
        require_plain_class(c);
    for (const cdb::manager &m : db.managers())
        require_plain(m.record(), place_of("ResourceManager", m.name()));
    for (const cdb::class_map &m : db.maps())
        require_plain(m.record(), {"ClassToManagerMapping"});
    for (const cdb::variable_class &v : db.variable_classes())
        require_plain(v.record(), place_of("ResourceVariableClass", v.name()));
}

} // namespace cdef::source
