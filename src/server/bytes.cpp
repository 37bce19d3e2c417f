/* bytes.cpp: where in a database the record of a stanza is, and what it refers to. */

#include "server/bytes.h"

#include "cdb_view.h"
#include "text/hex.h"

#include <algorithm>
#include <iterator>

namespace lsp {

namespace {

using source_index::index;
using source_index::stanza;

/* The number of stanzas of the same kind before this one. in_class: only those of the same class count; maps and
 * variable classes do not belong to one class. */
std::size_t ordinal_of(const index &of, std::size_t number, bool in_class) {
    const stanza &wanted = of.stanzas[number];
    auto end = of.stanzas.begin() + static_cast<std::ptrdiff_t>(number);
    return static_cast<std::size_t>(std::count_if(of.stanzas.begin(), end, [&](const stanza &each) {
        return each.kind == wanted.kind && (!in_class || each.class_number == wanted.class_number);
    }));
}

/* The offset of a section. position: its number among the sections of its type, from 0. */
std::optional<std::size_t> section_offset(const cdb::database &db, cdb_dsect_type_t type, std::size_t position) {
    for (std::size_t at = 0; at < db.section_count(); ++at)
        if (db.anchor(at).cda_type == type && position-- == 0)
            return db.anchor(at).cda_offset;
    return std::nullopt;
}

struct class_place {
    cdb::resource_class view;
    std::size_t offset;
};

std::optional<class_place> class_of(const cdb::database &db, const stanza &of) {
    if (of.class_number == 0)
        return std::nullopt;
    auto position = static_cast<std::size_t>(of.class_number) - 1;
    std::optional<std::size_t> offset = section_offset(db, CDB_DSECT_CLASS, position);
    if (!offset)
        return std::nullopt;
    auto found = db.classes().begin();
    std::advance(found, position);
    return class_place{*found, *offset};
}

/* The offset of a record in its class. Nothing unless it has the stanza's name, since it may belong to another stanza.
 */
template <class List>
std::optional<std::size_t> in_table(const List &records, std::size_t table, std::size_t ordinal, std::string_view name,
                                    std::size_t record_size) {
    if (ordinal >= records.size() || records[ordinal].name() != name)
        return std::nullopt;
    return table + ordinal * record_size;
}

std::optional<std::size_t> attribute_offset(const cdb::resource_class &in, int kind, std::size_t ordinal,
                                            std::string_view name) {
    const rsrc_class_t &fields = in.record();
    using cdb::level;
    switch (kind) {
    case SC_PERSISTENT_RESOURCE_ATTRIBUTE:
        return in_table(in.persistent_attributes(level::of_resource), fields.u_rc_pattrs.offset[0], ordinal, name,
                        sizeof(rsrc_pattr_t));
    case SC_PERSISTENT_CLASS_ATTRIBUTE:
        return in_table(in.persistent_attributes(level::of_class), fields.u_rc_pattrsC.offset[0], ordinal, name,
                        sizeof(rsrc_pattr_t));
    case SC_DYNAMIC_RESOURCE_ATTRIBUTE:
        return in_table(in.dynamic_attributes(level::of_resource), fields.u_rc_dattrs.offset[0], ordinal, name,
                        sizeof(rsrc_dattr_t));
    case SC_DYNAMIC_CLASS_ATTRIBUTE:
        return in_table(in.dynamic_attributes(level::of_class), fields.u_rc_dattrsC.offset[0], ordinal, name,
                        sizeof(rsrc_dattr_t));
    case SC_RESOURCE_ACTION:
        return in_table(in.actions(level::of_resource), fields.u_rc_actions.offset[0], ordinal, name,
                        sizeof(rsrc_action_t));
    case SC_CLASS_ACTION:
        return in_table(in.actions(level::of_class), fields.u_rc_actionsC.offset[0], ordinal, name,
                        sizeof(rsrc_action_t));
    default:
        return std::nullopt;
    }
}

/* The reference to an element's run. owner: the offset of the attribute's or action's record in the class. */
cdb_ref_t run_of(const class_place &in, const cdb::bytes &section, const stanza &element, int owner_kind,
                 std::size_t owner) {
    const sd_owner &who = *element.row().sc_sd_owner;
    if (who.of_class != nullptr)
        return in.view.record().*who.of_class;
    if (who.of_action != nullptr)
        return section.record<rsrc_action_t>(owner).*who.of_action;
    bool persistent = owner_kind == SC_PERSISTENT_RESOURCE_ATTRIBUTE || owner_kind == SC_PERSISTENT_CLASS_ATTRIBUTE;
    return persistent ? section.record<rsrc_pattr_t>(owner).u_ra_sd : section.record<rsrc_dattr_t>(owner).u_ra_sd;
}

std::optional<std::size_t> offset_in_class(std::string_view source, const index &of, std::size_t number,
                                           const class_place &in) {
    const stanza &wanted = of.stanzas[number];
    return attribute_offset(in.view, wanted.kind, ordinal_of(of, number, true), wanted.value(source, "Name"));
}

std::optional<std::size_t> element_offset(std::string_view source, const index &of, std::size_t number,
                                          const class_place &in, const cdb::bytes &section) {
    const stanza &element = of.stanzas[number];
    bool of_class = element.row().sc_sd_owner->of_class != nullptr;
    if (!of_class && element.owner == source_index::NONE)
        return std::nullopt;
    std::optional<std::size_t> owner = of_class ? 0 : offset_in_class(source, of, element.owner, in);
    if (!owner)
        return std::nullopt;
    int owner_kind = of_class ? source_index::UNKNOWN_KIND : of.stanzas[element.owner].kind;
    cdb_ref_t run = run_of(in, section, element, owner_kind, *owner);
    cdb::sd_definition fields = cdb::sd_definition_at(in.view.side_tables(), run);
    std::size_t table = in.view.record().u_rc_sd_defs.offset[0] + run.offset[0] + offsetof(sd_def_t, sd_fields);
    return in_table(fields, table, number - element.run, element.value(source, "ElementName"), sizeof(sd_field_t));
}

/* The strings that the record of a stanza refers to. */
cdb::bytes strings_of(const cdb::database &db, const index &of, std::size_t number) {
    const stanza &wanted = of.stanzas[number];
    if (wanted.kind == SC_CLASS_TO_MANAGER_MAPPING)
        return (*db.maps().begin()).strings();
    if (wanted.kind == SC_RESOURCE_VARIABLE_CLASS) {
        auto found = db.variable_classes().begin();
        std::advance(found, ordinal_of(of, number, false));
        return (*found).strings();
    }
    std::optional<class_place> in = class_of(db, wanted);
    return in ? in->view.side_tables().strings : cdb::bytes();
}

/* The size of a value that is stored outside of its record, in bytes. */
std::size_t size_of(const cdb::value &stored) {
    switch (stored.type()) {
    case VX_CHAR_PTR:
        return stored.text().size() + 1;
    case VX_BINARY_PTR:
        return cdb::value::BINARY_BYTES + stored.binary().size();
    case VX_RSRC_HANDLE_PTR:
        return sizeof(vx_resource_handle_t);
    case VX_SD_PTR:
        return cdb::value::ELEMENTS + stored.elements().size() * sizeof(vx_structured_data_element_t);
    default:
        return cdb::value::ELEMENTS + stored.elements().size() * sizeof(vx_value_t);
    }
}

} // namespace

std::span<const std::byte> referred_bytes(const index &of, std::size_t number, std::span<const std::byte> image,
                                          std::size_t record, const cdb::field &field) {
    cdb::database db(image);
    cdb::bytes file = db.file();
    cdb::bytes strings = strings_of(db, of, number);
    if (field.kind == cdb::field_kind::reference && field.to == cdb::target::strings) {
        auto offset = file.number<std::uint32_t>(record + field.offset);
        return offset == CDB_NONE ? std::span<const std::byte>()
                                  : strings.part(offset, strings.text(std::uint64_t{offset}).size() + 1).raw();
    }
    if (field.kind != cdb::field_kind::value || field.type_at == cdb::TYPE_OF_OWNER)
        return {};
    cdb::value stored(file, record + field.offset, file.number<vx_data_type_t>(record + field.type_at), strings);
    return stored.place() ? strings.part(*stored.place(), size_of(stored)).raw() : std::span<const std::byte>();
}

std::optional<std::size_t> record_offset(std::string_view source, const index &of, std::size_t number,
                                         std::span<const std::byte> image) {
    const stanza &wanted = of.stanzas[number];
    cdb::database db(image);
    if (wanted.kind == SC_CLASS_TO_MANAGER_MAPPING)
        return section_offset(db, CDB_DSECT_CMMAP, 0);
    if (wanted.kind == SC_RESOURCE_VARIABLE_CLASS)
        return section_offset(db, CDB_DSECT_VAR_CLASS, ordinal_of(of, number, false));
    std::optional<class_place> in = class_of(db, wanted);
    if (!in || !wanted.is_known())
        return std::nullopt;
    if (wanted.kind == SC_CONTROL_DEFINITION || wanted.kind == SC_RESOURCE_CLASS)
        return in->offset;
    std::optional<std::size_t> found = wanted.is_element()
                                           ? element_offset(source, of, number, *in, db.file().part(in->offset))
                                           : offset_in_class(source, of, number, *in);
    return found ? std::optional(in->offset + *found) : std::nullopt;
}

std::string hexadecimal(std::span<const std::byte> bytes) {
    constexpr std::size_t SHOWN_MAX = 16;
    std::string shown;
    for (std::size_t at = 0; at < std::min(bytes.size(), SHOWN_MAX); ++at)
        shown.append(at == 0 ? "" : " ").append(text::hex_of(bytes.subspan(at, 1)));
    return bytes.size() > SHOWN_MAX ? shown + " ..." : shown;
}

} // namespace lsp
