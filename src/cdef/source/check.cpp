/* check.cpp: what no source can say: fields that no line sets, sections that are not made. */

#include "cdef/source/source.h"
#include "cdef/support/trouble.h"
#include "format/records.h"
#include "text/shown.h"

namespace cdef {

namespace {

std::uint32_t number_at(const std::byte *from, std::size_t width) {
    std::uint16_t half = 0;
    std::uint32_t whole = 0;
    std::memcpy(&half, from, sizeof half);
    if (width != sizeof half)
        std::memcpy(&whole, from, sizeof whole);
    return width == sizeof half ? half : whole;
}

/* True if the field holds whatever the source's lines, or their number and order, lead to. */
bool depends_on_source(const cdb::field_fact &what) {
    return what.is == cdb::role::LAYOUT || (!what.lines.empty() && !what.always);
}

/* Every other field has the one value that the compiler gives it. */
template <class Record> void require_plain(const Record &record, const std::string &place) {
    const auto *bytes = reinterpret_cast<const std::byte *>(&record);
    const cdb::record_format &format = cdb::format_for<Record>;
    for (std::size_t i = 0; i < format.fields.size(); ++i) {
        const cdb::field &f = format.fields[i];
        bool is_number = f.kind == cdb::field_kind::number || f.kind == cdb::field_kind::reference;
        if (!is_number || depends_on_source(format.facts[i]))
            continue;
        std::uint32_t found = number_at(bytes + f.offset, f.width);
        if (found != format.facts[i].always.value_or(0))
            no_source(place, "no line sets " + std::string(f.name) + " to " + std::to_string(found));
    }
}

void require_plain_definition(const cdb::sd_definition &definition, const std::string &place) {
    for (const cdb::sd_element &e : definition)
        require_plain(e.record(), place + ", element " + text::quoted_ascii(e.name()));
}

template <class List> void require_plain_attributes(const List &list, std::string_view kind) {
    for (const auto &attr : list) {
        std::string place = place_of(kind, attr.name());
        require_plain(attr.record(), place);
        require_plain_definition(attr.structure(), place);
    }
}

void require_plain_actions(const cdb::resource_class &c, cdb::level level, std::string_view kind) {
    for (const cdb::action &action : c.actions(level)) {
        std::string place = place_of(kind, action.name());
        require_plain(action.record(), place);
        require_plain_definition(action.input(), place);
        require_plain_definition(action.response(), place);
    }
}

void require_plain_class(const cdb::resource_class &c) {
    using enum cdb::level;
    std::string place = place_of("ResourceClass", c.name());
    require_plain(c.record(), place);
    for (const class_input &input : class_inputs)
        require_plain_definition(c.sd_input(input.reference), place);
    require_plain_attributes(c.persistent_attributes(of_resource), "PersistentResourceAttribute");
    require_plain_attributes(c.persistent_attributes(of_class), "PersistentClassAttribute");
    require_plain_attributes(c.dynamic_attributes(of_resource), "DynamicResourceAttribute");
    require_plain_attributes(c.dynamic_attributes(of_class), "DynamicClassAttribute");
    require_plain_actions(c, of_resource, "ResourceAction");
    require_plain_actions(c, of_class, "ClassAction");
}

bool is_made(cdb_dsect_type_t type) {
    return type >= CDB_DSECT_RSRC_MGR && type <= CDB_DSECT_CMMAP;
}

void require_sections(const cdb::database &db) {
    std::array<std::size_t, CDB_DSECT_CMMAP + 1> counts = {};
    for (std::size_t i = 0; i < db.section_count(); ++i) {
        cdb_dsect_anchor_t anchor = db.anchor(i);
        if (!is_made(anchor.cda_type))
            no_source("section " + std::to_string(i), "no source makes one of type " + std::to_string(anchor.cda_type));
        if (anchor.cda_revision != 0)
            no_source("section " + std::to_string(i), "no source gives it a revision");
        ++counts[anchor.cda_type];
    }
    if (counts[CDB_DSECT_CLASS] == 0)
        no_source("database", "it has no class");
    if (counts[CDB_DSECT_RSRC_MGR] != 1)
        no_source("database", "a source has one manager, this has " + std::to_string(counts[CDB_DSECT_RSRC_MGR]));
    if (counts[CDB_DSECT_CMMAP] != 1)
        no_source("database",
                  "a source has one ClassToManagerMapping, this has " + std::to_string(counts[CDB_DSECT_CMMAP]));
}

} // namespace

void no_source(const std::string &what, const std::string &why) {
    throw trouble("no source: " + what + ": " + why);
}

std::string place_of(std::string_view kind, std::string_view name) {
    return std::string(kind) + " " + text::quoted_ascii(name.substr(0, 100));
}

void require_settable(const cdb::database &db) {
    require_plain(db.header(), "database");
    require_sections(db);
    for (const cdb::resource_class &c : db.classes())
        require_plain_class(c);
    for (const cdb::manager &m : db.managers())
        require_plain(m.record(), place_of("ResourceManager", m.name()));
    for (const cdb::class_map &m : db.maps())
        require_plain(m.record(), "ClassToManagerMapping");
    for (const cdb::variable_class &v : db.variable_classes())
        require_plain(v.record(), place_of("ResourceVariableClass", v.name()));
}

} // namespace cdef
