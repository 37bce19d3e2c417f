/* walk.cpp: the walk over the facts of a database, in the order of the file. Each form shows them in its own way. */

#include "cdef/dump/dump.h"
#include "reader/ownership.h"
#include "reader/tables.h"

#include "format/sections.h"
#include "text/shown.h"

#include <unordered_map>

namespace cdef::dump {

namespace {

/* A record in an area, and what its references lead into. */
struct record_at {
    const cdb::record_format &format;
    cdb::bytes area;
    std::size_t at;
    const cdb::class_tables &tables;
    vx_data_type_t type = VX_UNKNOWN; /* the type of its values, if the record itself does not have it */
};

constexpr cdb::class_tables NO_TABLES = {};

using named_by_number = std::unordered_map<std::uint32_t, named>;

named found_in(const named_by_number &known, std::uint32_t number) {
    auto found = known.find(number);
    return found == known.end() ? named{number, {}, {}} : found->second;
}

class walker {
public:
    walker(const cdb::database &walked, const readability &found, sink &to, bool offsets)
        : db(walked), out(to), with_offsets(offsets), owners(found.owners) {
        if (std::optional<cdb::finding> wrong = found.first_of(cdb::CODE_CHECKSUM))
            sum = {wrong->found, wrong->expected};
    }

    void show_file();

private:
    void show_section(std::size_t index);
    void show_root(std::size_t index, const cdb::section_kind &kind);
    void show_class_tables(const cdb::resource_class &rc);
    void show_variables(const cdb::variable_class &vc);
    void show_hash_blocks(const cdb::bytes &section);

    void open(const record_at &r, std::string_view key, std::string_view title);
    void show_record(const record_at &r, std::string_view key, std::string_view title);
    void show_fields(const record_at &r);
    void show_number(const record_at &r, const cdb::field &f, cdb::meaning as);
    void show_reference(const record_at &r, const cdb::field &f, cdb::meaning as);
    void show_reserved(const record_at &r, const cdb::field &f);
    void show_place(const record_at &r, const cdb::field &f);
    void show_list(const record_at &r, const cdb::field &f);
    void show_value(const label &what, const cdb::value &value, std::size_t cell, std::size_t strings);
    void show_element(vx_data_type_t container, const cdb::value &element, std::size_t cell, std::size_t strings);

    named locator(const cdb::class_tables &tables, std::uint32_t number) const;
    void collect_named();
    std::size_t place_of(const cdb::bytes &area) const;

    const cdb::database &db;
    sink &out;
    bool with_offsets;
    checksum sum;
    const cdb::ownership &owners;
    /* If several have the same number, the first one counts. */
    named_by_number variables; /* dynamic attributes, by variable ID */
    named_by_number managers;
    std::string heading; /* of the record that is being opened */
};

/* The name of the field where a list's entries begin. */
std::string_view entries_of(const cdb::record_format &list) {
    return list.fields.back().name;
}

label same(std::string_view name) {
    return {name, name};
}

/* ---- What numbers stand for ------------------------------------------------------------------------------------ */

named walker::locator(const cdb::class_tables &tables, std::uint32_t number) const {
    constexpr std::uint32_t CUT = 0xFFFF; /* what a locator keeps of an ID */
    for (const cdb::persistent_attribute &attr :
         cdb::resource_class(tables.section).persistent_attributes(cdb::level::of_resource))
        if ((static_cast<std::uint32_t>(attr.id()) & CUT) == number)
            return {number, "persistent resource attribute", attr.name()};
    return {number, {}, {}};
}

void walker::collect_named() {
    auto collect = [this](const auto &attributes, std::uint32_t mark, std::string_view kind) {
        for (const cdb::dynamic_attribute &attr : attributes) {
            std::uint32_t id = static_cast<std::uint32_t>(attr.id()) | mark;
            variables.try_emplace(id, named{id, kind, attr.name()});
        }
    };
    for (const cdb::resource_class &rc : db.classes()) {
        collect(rc.dynamic_attributes(cdb::level::of_class), VAR_ID_CLASS_ATTR, "dynamic class attribute");
        collect(rc.dynamic_attributes(cdb::level::of_resource), 0, "dynamic resource attribute");
    }
    for (const cdb::manager &m : db.managers())
        managers.try_emplace(m.record().rm_id, named{m.record().rm_id, "manager", m.name()});
}

/* Of an area in the file. */
std::size_t walker::place_of(const cdb::bytes &area) const {
    return area.size() == 0 ? 0 : static_cast<std::size_t>(area.raw().data() - db.file().raw().data());
}

/* ---- Values ---------------------------------------------------------------------------------------------------- */

/* The elements of an array have one type, so they are shown without it; those of structured data are shown with their
 * types. */
void walker::show_element(vx_data_type_t container, const cdb::value &element, std::size_t cell, std::size_t strings) {
    std::string_view type = cdb::name_of(element.type());
    if (container != VX_SD_PTR)
        return show_value({{}, type}, element, cell, strings);
    out.open({{}, {}});
    out.add({"data_type", {}}, word{std::string(type)});
    show_value({"value", type}, element, cell + offsetof(vx_structured_data_element_t, value), strings);
    out.close();
}

/* cell, strings: where in the file the value's cell is, and the strings that it may lead into. */
void walker::show_value(const label &what, const cdb::value &value, std::size_t cell, std::size_t strings) {
    bool holds_elements = value.type() == VX_SD_PTR || cdb::is_array(value.type());
    if (!owners.is_own(cell))
        return out.add(what, none{});
    if (!holds_elements || !value.present())
        return out.add(what, fact_of(value));
    std::string_view type = cdb::name_of(value.type());
    cdb::value_list elements = value.elements();
    std::string title(what.title);
    if (title != type)
        title.append(": ").append(type);
    title += elements.empty() ? ", empty" : "";
    out.open_list({what.key, title});
    std::size_t element_size = value.type() == VX_SD_PTR ? sizeof(vx_structured_data_element_t) : sizeof(vx_value_t);
    std::size_t element_at = strings + *value.place() + cdb::value::ELEMENTS;
    for (std::size_t i = 0; i < elements.size(); ++i)
        show_element(value.type(), elements[i], element_at + i * element_size, strings);
    out.close();
}

/* ---- Records --------------------------------------------------------------------------------------------------- */

void walker::open(const record_at &r, std::string_view key, std::string_view title) {
    heading = title;
    if (const cdb::field *name = r.format.name) {
        auto place = r.area.number<std::uint32_t>(r.at + name->offset);
        if (place != CDB_NONE)
            text::append_quoted(heading += ' ', r.tables.strings.text(std::size_t{place}));
    }
    if (!with_offsets)
        return out.open({key, heading});
    std::size_t at = place_of(r.area) + r.at;
    heading.append(" at ").append(std::to_string(at));
    out.open({key, heading});
    out.add({"at", {}}, std::uint64_t{at});
}

void walker::show_record(const record_at &r, std::string_view key, std::string_view title) {
    open(r, key, title);
    show_fields(r);
    out.close();
}

/* The row with a field's meaning is at the same position as the field. */
void walker::show_fields(const record_at &r) {
    for (std::size_t i = 0; i < r.format.fields.size(); ++i) {
        const cdb::field &f = r.format.fields[i];
        switch (f.kind) {
        case cdb::field_kind::number:
            show_number(r, f, r.format.facts[i].as);
            break;
        case cdb::field_kind::reference:
            show_reference(r, f, r.format.facts[i].as);
            break;
        case cdb::field_kind::value: {
            auto type = f.type_at == cdb::TYPE_OF_OWNER ? r.type : r.area.number<vx_data_type_t>(r.at + f.type_at);
            show_value(same(f.name), {r.area, r.at + f.offset, type, r.tables.strings},
                       place_of(r.area) + r.at + f.offset, place_of(r.tables.strings));
            break;
        }
        case cdb::field_kind::reserved:
            show_reserved(r, f);
            break;
        case cdb::field_kind::entries:
            break;
        }
    }
}

void walker::show_reserved(const record_at &r, const cdb::field &f) {
    auto raw = r.area.part(r.at + f.offset, std::size_t{f.width} * f.count).raw();
    if (std::any_of(raw.begin(), raw.end(), [](std::byte b) { return b != std::byte{0}; }))
        out.add(same(f.name), binary{raw});
}

void walker::show_number(const record_at &r, const cdb::field &f, cdb::meaning as) {
    std::uint32_t number = number_in(r.area, r.at, f);
    if (as == cdb::meaning::CHECKSUM)
        return out.add(same(f.name), sum);
    if (as == cdb::meaning::OFFSET && !with_offsets)
        return;
    if (as == cdb::meaning::LOCATOR && number != cdb::none_of(as))
        return out.add(same(f.name), locator(r.tables, number));
    if (as == cdb::meaning::MANAGER)
        return out.add(same(f.name), found_in(managers, number));
    out.add(same(f.name), fact_of(as, number));
}

void walker::show_reference(const record_at &r, const cdb::field &f, cdb::meaning as) {
    auto place = r.area.number<std::uint32_t>(r.at + f.offset);
    if (as == cdb::meaning::OFFSET || as == cdb::meaning::UNUSED) {
        if (with_offsets || (as == cdb::meaning::UNUSED && place != 0))
            show_place(r, f);
    } else if (f.to != cdb::target::strings)
        show_list(r, f);
    else if (place == CDB_NONE || place >= r.tables.strings.size())
        out.add(same(f.name), none{});
    else
        out.add(same(f.name), any_text{r.tables.strings.text(std::size_t{place})});
}

/* A reference shown as a number, or an array of references. */
void walker::show_place(const record_at &r, const cdb::field &f) {
    auto add = [&](const label &what, std::size_t i) {
        auto place = r.area.number<std::uint32_t>(r.at + f.offset + i * f.width);
        out.add(what, place == CDB_NONE ? fact(none{}) : fact(std::uint64_t{place}));
    };
    if (f.count == 1)
        return add(same(f.name), 0);
    out.open_list(same(f.name));
    for (std::size_t i = 0; i < f.count; ++i) {
        std::string position = std::to_string(i);
        add({{}, position}, i);
    }
    out.close();
}

/* Many references may lead to something that another record owns, so it is shown with its owner only. */
void walker::show_list(const record_at &r, const cdb::field &f) {
    const cdb::list_kind &kind = cdb::list_kind_of(f.to);
    const cdb::bytes &lists = lists_of(r.tables, f.to);
    std::size_t at = r.area.number<std::uint32_t>(r.at + f.offset);
    if (at == CDB_NONE || lists.number<std::uint32_t>(at) != kind.id || !owners.is_own(r.area, r.at + f.offset))
        return out.add(same(f.name), none{});
    record_at list = {*kind.head, lists, at, r.tables};
    open(list, f.name, f.name);
    show_fields(list);
    vx_data_type_t type = cdb::element_type(data_type_in(r.format, r.area, r.at));
    record_at entry = {*kind.entry, lists, at + cdb::LIST_HEAD, r.tables, type};
    std::size_t count =
        cdb::count_inside(lists, entry.at, lists.number<std::uint32_t>(at + cdb::LIST_COUNT), entry.format.size);
    out.open_list({entries_of(*kind.head), {}});
    for (std::size_t i = 0; i < count; ++i, entry.at += entry.format.size)
        show_record(entry, {}, kind.title);
    out.close();
    out.close();
}

/* ---- Sections -------------------------------------------------------------------------------------------------- */

void walker::show_class_tables(const cdb::resource_class &rc) {
    const rsrc_class_t &record = rc.record();
    const cdb::bytes &section = rc.side_tables().section;
    for (const cdb::side_table &table : std::span(cdb::side_tables).first(cdb::TABLES_OF_RECORDS)) {
        std::size_t at = (record.*table.ref).offset[0];
        record_at entry = {*table.record, section, at, rc.side_tables()};
        std::size_t count = cdb::count_placed(section, record.*table.ref, record.*table.count, entry.format.size);
        out.open_list({table.key, {}});
        for (std::size_t i = 0; i < count; ++i, entry.at += entry.format.size)
            show_record(entry, {}, table.title);
        out.close();
    }
}

void walker::show_variables(const cdb::variable_class &vc) {
    out.open_list({"variables", {}});
    for (const cdb::variable_id &id : vc.variable_ids())
        out.add({{}, "variable"}, found_in(variables, id.number));
    out.close();
}

void walker::show_hash_blocks(const cdb::bytes &section) {
    record_at block = {cdb::format_for<rc_hash_block_t>, section, offsetof(rsrc_class_hash_t, rc_hash_blocks),
                       NO_TABLES};
    auto recorded = section.number<std::uint32_t>(offsetof(rsrc_class_hash_t, rch_num_hash_blocks));
    std::size_t count = cdb::count_inside(section, block.at, recorded, block.format.size);
    out.open_list({entries_of(cdb::format_for<rsrc_class_hash_t>), {}});
    for (std::size_t i = 0; i < count; ++i, block.at += block.format.size)
        show_record(block, {}, "block");
    out.close();
}

void walker::show_root(std::size_t index, const cdb::section_kind &kind) {
    cdb::class_tables tables = cdb::tables_of(db, index);
    record_at root = {*kind.root, db.section(index), 0, tables};
    open(root, kind.key, kind.title);
    show_fields(root);
    if (kind.type == CDB_DSECT_CLASS)
        show_class_tables(cdb::resource_class(root.area));
    if (kind.type == CDB_DSECT_VAR_CLASS)
        show_variables(cdb::variable_class(root.area));
    if (kind.type == CDB_DSECT_CLASS_HASH)
        show_hash_blocks(root.area);
    out.close();
}

void walker::show_section(std::size_t index) {
    out.open({{}, "section"});
    std::size_t anchor_at = sizeof(orb_cdb_header_t) + index * sizeof(cdb_dsect_anchor_t);
    show_fields({cdb::format_for<cdb_dsect_anchor_t>, db.file(), anchor_at, NO_TABLES});
    if (const cdb::section_kind *kind = cdb::kind_of(db.anchor(index).cda_type))
        show_root(index, *kind);
    out.close();
}

void walker::show_file() {
    collect_named();
    out.open({{}, {}});
    out.add({"byte_order", "byte order"}, word{db.order() == std::endian::big ? "big-endian" : "little-endian"});
    out.add({"size", "size"}, std::uint64_t{db.file().size()});
    show_record({cdb::format_for<orb_cdb_header_t>, db.file(), 0, NO_TABLES}, "header", "header");
    out.open_list({"sections", {}});
    for (std::size_t i = 0; i < db.section_count(); ++i)
        show_section(i);
    out.close();
    out.close();
}

} // namespace

void walk(const cdb::database &db, const readability &found, sink &to, bool with_offsets) {
    walker(db, found, to, with_offsets).show_file();
}

} // namespace cdef::dump
