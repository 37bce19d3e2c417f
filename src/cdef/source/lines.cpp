/* lines.cpp: the lines of a stanza, made from the catalogue's attributes and the facts about the fields that they fill.
 */

#include "cdef/source/lines.h"

#include "cdef/source/error.h"
#include "format/names.h"
#include "language/fields.h"
#include "language/names.h"
#include "text/number.h"

#include <algorithm>
#include <array>

namespace cdef::source {

namespace {

using enum cdb::meaning;

constexpr std::string_view NO_PERMISSION = "-"; /* stands for no permission letter */

bool is_text(const stanza_line &line) {
    return line.field->kind == cdb::field_kind::reference;
}

std::string_view text_in(const stanza_line &line, const stanza_record &from) {
    return from.strings.text(cdb_ref_t{{from.record.number<vx_uint32_t>(line.field->offset), 0}});
}

std::uint32_t number_in(const stanza_line &line, const stanza_record &from) {
    bool is_short = line.field->width == sizeof(std::uint16_t);
    return is_short ? from.record.number<std::uint16_t>(line.field->offset)
                    : from.record.number<std::uint32_t>(line.field->offset);
}

/* The number in the field if there is no line for it. */
std::uint32_t number_without_line(cdb::meaning as, bool is_completed) {
    switch (as) {
    case NONE_IS_255:
    case NONE_IS_65535:
        return is_completed ? *cdb::none_of(as) : 0;
    case PERMISSIONS:
        return DEFAULT_PERMISSION;
    default:
        return 0;
    }
}

std::string permission_text(std::uint32_t mask, const record_name &place) {
    if (mask == 0)
        return std::string(NO_PERMISSION);
    char letter = permission_letter(mask);
    if (letter == '\0')
        no_source(place, "no permission letter has the value " + std::to_string(mask));
    return {letter};
}

std::string number_text(std::uint32_t number, cdb::meaning as, const record_name &place) {
    switch (as) {
    case SIGNED:
        return std::to_string(static_cast<std::int32_t>(number));
    case DATA_TYPE:
        return std::string(cdb::name_of(static_cast<vx_data_type_t>(number)));
    case VARIABLE_TYPE:
        return vxVarStr[number];
    case VERSION:
        return text::dotted(number);
    case PERMISSIONS:
        return permission_text(number, place);
    case CLASS_PROPERTIES:
    case PERSISTENT_PROPERTIES:
    case DYNAMIC_PROPERTIES:
    case ACTION_PROPERTIES:
        return properties_text(number, cdb::properties_of(as), place);
    default:
        return std::to_string(number);
    }
}

/* A number that a line without a special function can give. */
bool is_plain_number(cdb::meaning as) {
    switch (as) {
    case PLAIN:
    case SIGNED:
    case NONE_IS_0:
    case NONE_IS_255:
    case NONE_IS_65535:
    case CLASS_PROPERTIES:
    case PERSISTENT_PROPERTIES:
    case DYNAMIC_PROPERTIES:
    case ACTION_PROPERTIES:
    case PERMISSIONS:
    case DATA_TYPE:
    case VARIABLE_TYPE:
    case VERSION:
        return true;
    case BITS:
    case MARK:
    case TIME:
    case CHECKSUM:
    case SECTION_TYPE:
    case LOCATOR:
    case MANAGER:
    case BOUND:
    case OFFSET:
    case UNUSED:
        break;
    }
    return false;
}

/* True for a required line that the stanza did not have. */
bool is_missing(const stanza_line &line, const stanza_record &from) {
    if (is_text(line))
        return from.may_lack_texts && text_in(line, from).empty();
    return line.fact->as == DATA_TYPE && number_in(line, from) == VX_UNKNOWN;
}

} // namespace

std::vector<stanza_line> lines_of(std::span<const table_attrs> attributes, const cdb::record_format &format,
                                  std::size_t start) {
    std::vector<stanza_line> lines;
    for (const table_attrs &attribute : attributes) {
        std::size_t offset = static_cast<std::size_t>(attribute.ta_offset) - start;
        auto field = std::find_if(format.fields.begin(), format.fields.end(),
                                  [offset](const cdb::field &f) { return f.offset == offset; });
        const cdb::field_fact &fact = format.fact_of(*field);
        lines.push_back({&attribute, &*field, &fact, language::fills(attribute, fact)});
    }
    std::sort(lines.begin(), lines.end(), [](const stanza_line &a, const stanza_line &b) {
        return language::comes_before(*a.attribute, *b.attribute);
    });
    return lines;
}

const std::vector<stanza_line> &lines_of(stanza_id stanza) {
    static const std::array<std::vector<stanza_line>, SC_COUNT> all = [] {
        std::array<std::vector<stanza_line>, SC_COUNT> made;
        for (std::size_t i = 0; i < SC_COUNT; ++i)
            made[i] = lines_of(sc_tables[i].sc_attrs, language::record_of(sc_tables[i]),
                               language::record_start(sc_tables[i]));
        return made;
    }();
    return all[stanza];
}

bool is_plain(const stanza_line &line) {
    if (line.fact->always || !line.fills)
        return false;
    if (is_text(line))
        return line.field->to == cdb::target::strings && line.fact->as == PLAIN;
    return line.field->kind == cdb::field_kind::number && is_plain_number(line.fact->as);
}

bool is_default(const stanza_line &line, const stanza_record &from) {
    if (is_text(line))
        return text_in(line, from).empty();
    return number_in(line, from) == number_without_line(line.fact->as, from.is_completed);
}

std::optional<std::string> plain_text(const stanza_line &line, const stanza_record &from) {
    if (line.is_required() ? is_missing(line, from) : is_default(line, from))
        return std::nullopt;
    if (!line.is_required() && !from.no_optional_lines.empty())
        no_source(from.place, from.no_optional_lines);
    if (is_text(line))
        return std::string(text_in(line, from));
    return number_text(number_in(line, from), line.fact->as, from.place);
}

std::string properties_text(std::uint32_t bits, std::span<const props_t> known, const record_name &place) {
    std::string names;
    std::uint32_t unknown =
        take_properties(bits, known, [&](const char *name) { names.append(names.empty() ? "" : ",").append(name); });
    if (unknown != 0)
        no_source(place, "its properties contain an unknown bit: " + std::to_string(unknown));
    return names;
}

void write_plain_line(source_writer &out, const stanza_line &line, const stanza_record &from) {
    if (!line.fills)
        return;
    if (!is_plain(line))
        no_source(from.place, "no line can give its " + std::string(line.attribute->ta_name));
    if (std::optional<std::string> text = plain_text(line, from))
        out.line(line.attribute->ta_name, *text);
}

} // namespace cdef::source
