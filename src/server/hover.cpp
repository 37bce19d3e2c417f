/* hover.cpp: the meaning of the name or value at a place. */

#include "server/hover.h"

#include "language/fields.h"
#include "language/suggestions.h"
#include "server/bytes.h"
#include "server/documentation.h"
#include "server/places.h"
#include "text/hex.h"

#include <optional>

namespace lsp {

namespace {

struct shown {
    std::string text;
    stretch at;
};

/* The number of the stanza in the index. */
std::size_t number_of(const place_in_source &place) {
    return static_cast<std::size_t>(place.stanza - place.in.index().stanzas.data());
}

/* Where the stanza's record is in the database, if the source compiles to one. */
std::optional<std::size_t> offset_of_record(const place_in_source &place) {
    const compiled_source *made = place.in.compiled();
    return made == nullptr ? std::nullopt
                           : record_offset(place.text(), place.in.index(), number_of(place), made->image);
}

std::string at_offset(std::size_t offset) {
    return "offset " + text::hex(offset);
}

constexpr const char *IN_DATABASE = "\n- in the database: ";

/* part: of the image */
std::string shown_bytes(std::span<const std::byte> image, std::span<const std::byte> part) {
    return at_offset(static_cast<std::size_t>(part.data() - image.data())) + ", bytes `" + hexadecimal(part) + "`";
}

std::string record_place(const place_in_source &place) {
    std::optional<std::size_t> record = offset_of_record(place);
    if (!record)
        return {};
    return IN_DATABASE + ("at " + at_offset(*record)) + ", " +
           std::to_string(language::record_of(place.stanza->row()).size) + " bytes";
}

/* Name, offset and bytes of each field that the attribute fills, and of what it refers to. */
std::string bytes_of(const place_in_source &place) {
    if (place.attribute->known->ta_type == AT_SD_INDEX)
        return record_place(place);
    std::optional<std::size_t> record = offset_of_record(place);
    if (!record)
        return {};
    const cdb::record_format &format = language::record_of(place.stanza->row());
    std::span<const std::byte> image = place.in.compiled()->image;
    std::string text;
    for (std::size_t i = 0; i < format.facts.size(); ++i) {
        const cdb::field &field = format.fields[i];
        std::size_t begin = *record + field.offset;
        std::size_t size = std::size_t{field.width} * field.count;
        if (!language::fills(*place.attribute->known, format.facts[i]) || begin + size > image.size())
            continue;
        text += IN_DATABASE + language::quoted(field.name) + " at " + shown_bytes(image, image.subspan(begin, size));
        auto referred = referred_bytes(place.in.index(), number_of(place), image, *record, field);
        if (!referred.empty())
            text += IN_DATABASE + language::quoted(field.name) + " refers to " + shown_bytes(image, referred);
    }
    return text;
}

/* The item of a comma-separated list that contains an offset. */
stretch item_at(std::string_view source, const stretch &list, std::size_t offset) {
    stretch item = list;
    for (std::size_t at = list.begin; at < list.end; ++at)
        if (source[at] == ',') {
            if (at < offset)
                item.begin = at + 1;
            else if (item.end == list.end)
                item.end = at;
        }
    return item;
}

std::string name_text(const place_in_source &place) {
    const source_index::mention *mention = place.in.names().at(place.offset);
    return mention == nullptr ? std::string() : name_documentation(place.in, mention->name);
}

/* The text of a message number. */
std::string message_text(const session &now, const place_in_source &place) {
    const source_index::attribute &attribute = *place.attribute;
    if (!now.world.message_text || !is_message_number(place.stanza->row(), *attribute.known))
        return {};
    message_number number;
    number.uri = place.in.uri();
    number.number = attribute.parts.value.of(place.text());
    for (const source_index::stanza &each : place.in.index().stanzas)
        if (each.kind == SC_CLASS_TO_MANAGER_MAPPING) {
            number.catalog = each.value(place.text(), "MessageCatalog");
            number.set = each.value(place.text(), "DescriptiveMessageSet");
        }
    std::optional<std::string> text = now.world.message_text(number);
    return text ? "\n- text: " + *text : std::string();
}

/* For an attribute; with the cursor on its value, also for the value. */
shown attribute_shown(const session &now, const place_in_source &place) {
    const source_index::attribute &attribute = *place.attribute;
    std::string text =
        attribute_documentation(place.stanza->row(), *attribute.known) + bytes_of(place) + message_text(now, place);
    stretch value = attribute.parts.value;
    if (attribute.parts.name.touches(place.offset))
        return {text, attribute.parts.name};
    if (!value.touches(place.offset))
        return {text, attribute.parts.written}; /* on a quotation mark, or on a blank in front of it */
    stretch item = item_at(place.text(), value, place.offset);
    std::string about = value_documentation(*attribute.known, item.of(place.text()));
    if (about.empty()) {
        about = name_text(place);
        const source_index::mention *mention = place.in.names().at(place.offset);
        item = about.empty() ? value : mention->at;
    }
    return {about.empty() ? text : about + "\n\n" + text, item};
}

std::optional<shown> shown_at(const session &now, const place_in_source &place) {
    if (place.in_comment || place.stanza == nullptr || !place.stanza->is_known())
        return std::nullopt;
    if (place.stanza->header.touches(place.offset))
        return shown{stanza_documentation(place.stanza->row()) + record_place(place), place.stanza->header};
    if (!place.has_known_attribute())
        return std::nullopt;
    const source_index::attribute_parts &parts = place.attribute->parts;
    if (place.offset < parts.name.begin || place.offset > parts.written.end)
        return std::nullopt;
    return attribute_shown(now, place);
}

} // namespace

json hover(session &now, const json &params) {
    place_in_source place = place_in(now, params);
    std::optional<shown> found = shown_at(now, place);
    if (!found)
        return nullptr;
    return {{"contents", {{"kind", "markdown"}, {"value", found->text}}},
            {"range", to_json(place.in.positions(now.client.units).of(found->at))}};
}

} // namespace lsp
