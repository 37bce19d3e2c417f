/* structure.cpp: the runs of SD stanzas. */

#include "cdef/source/structure.h"

#include "cdef/source/error.h"
#include "cdef/source/lines.h"
#include "cdef/source/lists.h"
#include "cdef/source/runs.h"
#include "format/constants.h"
#include "text/shown.h"

namespace cdef::source {

namespace {

/* Both must have the same number of elements. */
bool same_types(const std::vector<vx_data_type_t> &types, const cdb::sd_definition &definition) {
    for (std::size_t i = 0; i < types.size(); ++i)
        if (types[i] != definition[i].type())
            return false;
    return true;
}

/* Structured data cannot contain structured data. Elements that become part of a value must have a type with a default.
 */
void require_types(const cdb::sd_definition &definition, bool makes_value, const record_name &place) {
    for (const cdb::sd_element &e : definition) {
        if (cdb::element_type(e.type()) == VX_SD_PTR || (makes_value && !has_default(e.type())))
            no_source(place, "it has an element of type " + std::string(cdb::name_of(e.type())));
    }
}

/* The stanza of one element. */
class element_writer {
public:
    /* index: of ElementIndex; nothing: no such line. */
    element_writer(source_writer &to, std::string_view name, const sd_field_t &record,
                   const cdb::valid_value_list &valid_values, std::optional<std::size_t> index)
        : out(to), from({.record = bytes_of(record), .strings = {}, .place = {}}), element_name(name),
          type(record.sd_field_type), values(valid_values), element_index(index) {}

    /* place: of the run. */
    void write(std::string_view stanza, const record_name &place) {
        from.place = place.with_element(element_name);
        out.stanza(stanza, from.place);
        write_lines(*this, lines_of(SC_PATTR_SD_DEFINITION)); /* all kinds of elements have the same lines */
    }

    static constexpr auto own_lines() {
        using w = element_writer;
        return std::to_array<own_line<w>>({{offsetof(sd_field_t, u_sd_field_name), &w::write_name},
                                           {offsetof(sd_field_t, sd_field_type), &w::write_type},
                                           {offsetof(sd_field_t, u_sd_valid_vals), &w::write_values},
                                           {offsetof(sd_field_t, sd_reserved), &w::write_index}});
    }

    source_writer &out;
    stanza_record from;

private:
    void write_name() {
        out.line("ElementName", element_name);
    }
    void write_type() {
        out.line("DataType", cdb::name_of(type));
    }
    void write_values() {
        write_valid_values(out, "ValidValue", values);
    }
    /* The compiler checks the index and stores nothing. */
    void write_index() {
        if (element_index)
            out.line("ElementIndex", static_cast<std::int64_t>(*element_index));
    }

    std::string_view element_name;
    vx_data_type_t type;
    const cdb::valid_value_list &values;
    std::optional<std::size_t> element_index;
};

void write_indexed_run(source_writer &out, std::string_view stanza, const cdb::sd_definition &definition,
                       const std::vector<bool> &indexed, const record_name &place) {
    std::size_t index = 0;
    for (std::size_t i = 0; i < definition.size(); ++i) {
        cdb::sd_element e = definition[i];
        cdb::valid_value_list values = e.valid_values();
        if (stanza == "ActionOutSDDefinition" && !values.empty())
            no_source(place, "it has valid values, which an element of a response cannot have");
        std::optional<std::size_t> given = indexed[i] ? std::optional(index++) : std::nullopt;
        element_writer(out, e.name(), e.record(), values, given).write(stanza, place);
    }
}

/* A run that the next one replaced; only its value is left in the database. */
void write_replaced_run(source_writer &out, const attribute_structure &s, const element_types &value, std::size_t given,
                        const record_name &place) {
    out.comment("The next run replaces this one, but for the value.");
    for (std::size_t i = 0; i < value.types.size(); ++i) {
        sd_field_t element = {};
        element.sd_field_type = value.types[i];
        std::optional<std::size_t> index = i < given ? std::optional(i) : std::nullopt;
        element_writer(out, "Replaced", element, {}, index).write(s.other_stanza, place);
    }
}

std::size_t require_indices(std::size_t elements, std::uint16_t highest, const record_name &place) {
    std::optional<std::size_t> given = indices_given(elements, highest);
    if (!given)
        no_source(place, "it has fewer elements than its highest ElementIndex says");
    return *given;
}

/* The value comes from the definition's run, or from a run of the same length that it replaced. */
void write_own_run(source_writer &out, const attribute_structure &s, const element_types &value,
                   const record_name &place) {
    if (!same_types(value.types, s.definition))
        write_replaced_run(out, s, value, value.types.size(), place);
    std::size_t given = require_indices(s.definition.size(), s.highest_index, place);
    write_indexed_run(out, s.stanza, s.definition, indexed_elements(with_valid_values(s.definition), given), place);
}

/* The value, if there is one, and the highest index come from an earlier run. */
void write_late_run(source_writer &out, const attribute_structure &s, const element_types &value,
                    const record_name &place) {
    if (value.found)
        write_replaced_run(out, s, value, require_indices(value.types.size(), s.highest_index, place), place);
    else if (s.highest_index != NO_SD_INDEX)
        no_source(place, "it has a highest ElementIndex, but no value");
    out.comment("The run ends the file: it comes too late for the value of its attribute.");
    write_run(out, s.stanza, s.definition, place);
}

} // namespace

std::vector<std::size_t> own_element_fields() {
    return own_fields_of<element_writer>();
}

void write_run(source_writer &out, std::string_view stanza, const cdb::sd_definition &definition,
               const record_name &place) {
    require_types(definition, false, place);
    write_indexed_run(out, stanza, definition, std::vector<bool>(definition.size(), true), place);
}

void write_structure(source_writer &out, const attribute_structure &s, const record_name &place) {
    require_types(s.definition, true, place);
    element_types value = types_of(s.value);
    if (!value.defaults)
        no_source(place, "its structure has values, which no line can set");
    if (s.definition.empty() && (value.found || s.highest_index != NO_SD_INDEX))
        no_source(place, "it has a structure's value, but no definition");
    if (s.definition.empty())
        return;
    if (fits_definition(s.definition, value, s.highest_index))
        write_own_run(out, s, value, place);
    else if (s.ends_file)
        write_late_run(out, s, value, place);
    else
        no_source(place, "its value does not match its definition");
}

} // namespace cdef::source
