/* mutate_image.cpp: changes to a database, by its sections and by the fields of its records. */

#include "format/sections.h"
#include "fuzz.h"
#include "image_parts.h"
#include "mutate.h"

#include <algorithm>
#include <array>
#include <optional>
#include <utility>

namespace fuzz {

namespace {

using cdb::field_kind;

/* A database, the regions of its records' fields, and the numbers that begin what is stored among strings. */
struct mapped {
    explicit mapped(std::span<const std::byte> image) : db(image), fields(cdb::regions(db)) {
        std::erase_if(fields, [](const cdb::region &r) {
            return r.what == nullptr && r.record != "length" && r.record != "vx_value_t" && r.record != "var_id_t";
        });
    }

    cdb::database db;
    std::vector<cdb::region> fields;
};

std::uint32_t number_in(const mapped &m, const cdb::region &r) {
    return r.size == 2 ? m.db.file().number<std::uint16_t>(r.offset) : m.db.file().number<std::uint32_t>(r.offset);
}

/* ---- Tables ----------------------------------------------------------------------------------------------------- */

/* Where a stretch of the database begins in it, and how long it is. */
struct stretch {
    std::size_t start;
    std::size_t size;

    bool holds(std::size_t offset) const {
        return offset >= start && offset - start < size;
    }
};

stretch stretch_of(const mapped &m, const cdb::bytes &area) {
    std::size_t start = area.size() == 0 ? 0 : static_cast<std::size_t>(area.raw().data() - m.db.file().raw().data());
    return {start, area.size()};
}

std::optional<cdb::class_tables> class_of(const mapped &m, const cdb::region &r) {
    if (!r.section || m.db.anchor(*r.section).cda_type != CDB_DSECT_CLASS)
        return std::nullopt;
    return cdb::resource_class(m.db.section(*r.section)).side_tables();
}

/* The table that a reference leads into; of other fields, their section, or the file. */
stretch table_of(const mapped &m, const cdb::region &r) {
    std::optional<cdb::class_tables> tables = class_of(m, r);
    if (!tables || r.what == nullptr || r.what->kind == field_kind::value)
        return stretch_of(m, tables ? tables->strings : r.section ? m.db.section(*r.section) : m.db.file());
    switch (r.what->to) {
    case cdb::target::strings:
        return stretch_of(m, tables->strings);
    case cdb::target::variety_lists:
        return stretch_of(m, tables->variety_lists);
    case cdb::target::valid_vals:
        return stretch_of(m, tables->valid_vals);
    case cdb::target::sd_defs:
        return stretch_of(m, tables->sd_defs);
    default:
        return stretch_of(m, tables->section);
    }
}

/* The bytes from a field to the end of the table that it is in. */
std::size_t bytes_after(const mapped &m, const cdb::region &r) {
    std::size_t from = r.offset + r.size;
    if (std::optional<cdb::class_tables> tables = class_of(m, r))
        for (const cdb::bytes &area : {tables->strings, tables->valid_vals, tables->variety_lists, tables->sd_defs})
            if (stretch table = stretch_of(m, area); table.holds(r.offset))
                return table.start + table.size - from;
    stretch whole = stretch_of(m, r.section ? m.db.section(*r.section) : m.db.file());
    return whole.start + whole.size - std::min(from, whole.start + whole.size);
}

/* ---- Numbers ---------------------------------------------------------------------------------------------------- */

/* The table's start and end, just before and past it; what another field of its kind leads to, or the place next to
 * it; the field itself, and the record that it is in. */
std::uint32_t some_offset(const mapped &m, const cdb::region &r, chance &random) {
    stretch table = table_of(m, r);
    std::uint32_t other = number_in(m, one_of(m.fields, random));
    std::size_t here = r.offset - table.start, record = here - (r.what != nullptr ? r.what->offset : 0);
    std::size_t inside = below(table.size + 1, random) & ~std::size_t{7};
    const std::array<std::size_t, 16> offsets = {
        0,      CDB_NONE, table.size, table.size - 8, inside,     table.size + 8, table.size - 1, table.size - 4,
        inside, other,    other + 8,  other - 8,      here & ~7U, record & ~7U,   here,           0xFFFFFFF8};
    return static_cast<std::uint32_t>(one_of(offsets, random));
}

/* The size of what a count counts; 1 for what is measured in bytes. */
std::size_t counted_size(const cdb::region &r) {
    for (const cdb::list_kind &kind : cdb::list_kinds)
        if (r.record == kind.head->record)
            return kind.entry->size;
    if (r.record == "vx_array_t")
        return sizeof(vx_value_t);
    if (r.record == "vx_structured_data_t")
        return sizeof(vx_structured_data_element_t);
    if (r.record == "rsrc_variable_class_t")
        return sizeof(var_id_t);
    for (const cdb::side_table &table : cdb::side_tables)
        if (r.record == "rsrc_class_t" && table.count != nullptr && r.size == sizeof(cdb_uint16_t))
            return table.record->size;
    return 1;
}

/* Counts to try: 0, 1, as many as there is room for and one more, one more or fewer than now, and numbers whose
 * multiples overflow to small numbers in 32 bits. */
std::uint32_t some_count(const mapped &m, const cdb::region &r, chance &random) {
    std::uint32_t now = number_in(m, r);
    auto most = static_cast<std::uint32_t>(bytes_after(m, r) / counted_size(r));
    const std::array<std::uint32_t, 14> counts = {0,       1,          most,       most + 1,  most - 1,
                                                  now + 1, now - 1,    now * 2,    now / 2,   0xFFFF,
                                                  0x10000, 0xFFFFFFFF, 0x20000000, 0x10000001};
    return one_of(counts, random);
}

std::uint32_t some_type(chance &random) {
    constexpr std::size_t TYPES = 25; /* and a few that are none */
    return static_cast<std::uint32_t>(below(TYPES, random));
}

bool leads_somewhere(const cdb::region &r) {
    return r.what == nullptr ? r.record == "vx_value_t"
                             : r.what->kind == field_kind::reference || r.what->kind == field_kind::value;
}

std::uint32_t some_number(const mapped &m, const cdb::region &r, chance &random) {
    if (leads_somewhere(r))
        return some_offset(m, r, random);
    if (r.what != nullptr && cdb::format_of(r.record).fact_of(*r.what).as == cdb::meaning::DATA_TYPE)
        return some_type(random);
    return some_count(m, r, random);
}

/* ---- Changes of fields ------------------------------------------------------------------------------------------ */

/* A field; one that leads somewhere or says where, how many or of which type, more often than others. */
const cdb::region &some_field(const mapped &m, chance &random) {
    constexpr int TRIES = 6;
    for (int i = 0; i < TRIES; ++i) {
        const cdb::region &r = one_of(m.fields, random);
        if (r.what == nullptr || leads_somewhere(r))
            return r;
        const cdb::field_fact &fact = cdb::format_of(r.record).fact_of(*r.what);
        if (fact.as == cdb::meaning::DATA_TYPE || (fact.is == cdb::role::LAYOUT && r.section))
            return r;
    }
    return one_of(m.fields, random);
}

std::span<std::byte> bytes_of(image_bytes &image, const cdb::region &r) {
    return std::span(image).subspan(r.offset, r.size);
}

void set_number(image_bytes &image, const mapped &m, chance &random) {
    const cdb::region &r = some_field(m, random);
    put_number(bytes_of(image, r), some_number(m, r, random), m.db.order());
}

void set_some_byte(image_bytes &image, const mapped &m, chance &random) {
    std::span<std::byte> field = bytes_of(image, some_field(m, random));
    one_of(field, random) = static_cast<std::byte>(below(256, random));
}

/* A field becomes like another one of the same name, of a database of the same byte order. */
void copy_field(image_bytes &image, const mapped &to, const mapped &from, chance &random) {
    const cdb::region &r = some_field(to, random);
    std::vector<cdb::region> same;
    std::copy_if(from.fields.begin(), from.fields.end(), std::back_inserter(same),
                 [&](const cdb::region &each) { return each.what == r.what && each.size == r.size; });
    if (same.empty())
        return;
    auto source = from.db.file().part(one_of(same, random).offset, r.size).raw();
    std::copy(source.begin(), source.end(), bytes_of(image, r).begin());
}

/* ---- Changes of a class's tables -------------------------------------------------------------------------------- */

/* The class record's field for a reference or a number. */
template <class Member> std::span<std::byte> class_field(section_part &section, Member rsrc_class_t::*member) {
    static const rsrc_class_t record = {};
    auto at = reinterpret_cast<const std::byte *>(&(record.*member)) - reinterpret_cast<const std::byte *>(&record);
    return std::span(section.contents).subspan(static_cast<std::size_t>(at), sizeof(Member));
}

/* Says that the tables after this one begin later, by a number of bytes. */
void move_tables(section_part &section, const rsrc_class_t &rc, std::size_t after, std::uint32_t bytes,
                 std::endian order) {
    for (std::size_t i = after + 1; i < std::size(cdb::side_tables); ++i)
        if (std::uint32_t offset = (rc.*cdb::side_tables[i].ref).offset[0]; offset != 0)
            put_number(class_field(section, cdb::side_tables[i].ref), offset + bytes, order);
}

/* A class section with its record in this machine's order; no value if there is no class. */
struct open_class {
    section_part &section;
    rsrc_class_t record;
};

std::optional<open_class> some_class(image_parts &parts, chance &random) {
    constexpr int TRIES = 4;
    for (int i = 0; i < TRIES && !parts.sections.empty(); ++i)
        if (section_part &section = one_of(parts.sections, random);
            section.anchor.cda_type == CDB_DSECT_CLASS && section.contents.size() >= sizeof(rsrc_class_t))
            return open_class{section, cdb::bytes(section.contents, parts.order).record<rsrc_class_t>(0)};
    return std::nullopt;
}

/* Where a table of the class begins and ends, if it lies in the section. */
std::optional<stretch> table_in(const open_class &c, const cdb::side_table &table) {
    std::size_t start = (c.record.*table.ref).offset[0], size = c.section.contents.size();
    if (start < sizeof(rsrc_class_t) || start > size)
        return std::nullopt;
    bool is_last = table.count == nullptr && table.bytes == nullptr;
    std::uint64_t told = is_last ? size - start : table.size_in(c.record);
    return stretch{start, static_cast<std::size_t>(std::min<std::uint64_t>(told, size - start))};
}

/* Copies one of a table's records, or takes it away, and moves the tables after it. */
void change_records(image_parts &parts, chance &random) {
    std::optional<open_class> c = some_class(parts, random);
    std::size_t index = below(cdb::TABLES_OF_RECORDS, random);
    const cdb::side_table &table = cdb::side_tables[index];
    std::optional<stretch> place = c ? table_in(*c, table) : std::nullopt;
    if (!place || place->size < table.record->size)
        return;
    auto size = static_cast<std::ptrdiff_t>(table.record->size);
    std::size_t count = place->size / table.record->size;
    image_bytes &contents = c->section.contents;
    auto at = contents.begin() + static_cast<std::ptrdiff_t>(place->start) +
              size * static_cast<std::ptrdiff_t>(below(count, random));
    image_bytes copied(at, at + size);
    bool adds = below(3, random) > 0;
    if (adds)
        contents.insert(at, copied.begin(), copied.end());
    else
        contents.erase(at, at + size);
    auto now = static_cast<std::uint32_t>(adds ? count + 1 : count - 1);
    put_number(class_field(c->section, table.count), now, parts.order);
    move_tables(c->section, c->record, index, static_cast<std::uint32_t>(adds ? size : -size), parts.order);
}

/* Makes a table of lists, or the strings, longer by a copy of some of its bytes, or shorter. */
void change_table(image_parts &parts, chance &random) {
    std::optional<open_class> c = some_class(parts, random);
    std::size_t index = cdb::TABLES_OF_RECORDS + below(std::size(cdb::side_tables) - cdb::TABLES_OF_RECORDS, random);
    const cdb::side_table &table = cdb::side_tables[index];
    std::optional<stretch> place = c ? table_in(*c, table) : std::nullopt;
    if (!place || place->size == 0)
        return;
    std::size_t from = below(place->size, random) & ~std::size_t{7};
    std::size_t size = std::min(place->size - from, 8 * (1 + below(6, random)));
    auto begin = c->section.contents.begin() + static_cast<std::ptrdiff_t>(place->start);
    image_bytes copied(begin + static_cast<std::ptrdiff_t>(from), begin + static_cast<std::ptrdiff_t>(from + size));
    auto end = begin + static_cast<std::ptrdiff_t>(place->size);
    bool adds = below(3, random) > 0;
    if (adds)
        c->section.contents.insert(end, copied.begin(), copied.end());
    else
        c->section.contents.erase(end - static_cast<std::ptrdiff_t>(size), end);
    auto added = static_cast<std::uint32_t>(adds ? size : -size);
    if (table.bytes != nullptr)
        put_number(class_field(c->section, table.bytes), c->record.*table.bytes + added, parts.order);
    move_tables(c->section, c->record, index, added, parts.order);
}

/* ---- Changes of sections ---------------------------------------------------------------------------------------- */

void change_sections(image_parts &parts, chance &random) {
    if (parts.sections.empty())
        return;
    auto place = [&] { return static_cast<std::ptrdiff_t>(below(parts.sections.size(), random)); };
    section_part some = *(parts.sections.begin() + place());
    switch (below(4, random)) {
    case 0:
        std::iter_swap(parts.sections.begin() + place(), parts.sections.begin() + place());
        break;
    case 1:
        parts.sections.insert(parts.sections.begin() + place(), some);
        break;
    case 2:
        parts.sections.erase(parts.sections.begin() + place());
        break;
    default:
        one_of(parts.sections, random).anchor.cda_type = static_cast<cdb_dsect_type_t>(below(10, random));
    }
}

image_bytes in_order(std::span<const std::byte> image, std::endian order) {
    image_bytes copy(image.begin(), image.end());
    if (cdb::database(image).order() != order)
        turn_fields(copy);
    return copy;
}

/* Takes one section of the other database, or all after a place. */
void take_sections(image_parts &parts, const image_parts &other, chance &random) {
    if (other.sections.empty())
        return;
    auto from = other.sections.begin() + static_cast<std::ptrdiff_t>(below(other.sections.size(), random));
    auto to = parts.sections.begin() + static_cast<std::ptrdiff_t>(below(parts.sections.size() + 1, random));
    bool all = below(4, random) == 0;
    if (all || (to != parts.sections.end() && below(2, random) == 0))
        to = parts.sections.erase(to, all ? parts.sections.end() : to + 1);
    parts.sections.insert(to, from, all ? other.sections.end() : from + 1);
}

bool is_database(std::span<const std::byte> image) {
    return image.size() >= sizeof(orb_cdb_header_t) && cdb::database(image).recognised();
}

/* ---- All changes ------------------------------------------------------------------------------------------------ */

void change_fields(image_bytes &image, chance &random) {
    constexpr std::size_t MOST = 4;
    mapped m(image);
    image_bytes changed = image;
    for (std::size_t left = 1 + below(MOST, random); left > 0 && !m.fields.empty(); --left)
        switch (below(8, random)) {
        case 0:
            set_some_byte(changed, m, random);
            break;
        case 1:
        case 2:
            copy_field(changed, m, m, random);
            break;
        default:
            set_number(changed, m, random);
        }
    image = std::move(changed);
}

using parts_change = void (*)(image_parts &, chance &);

void change_parts(image_bytes &image, parts_change change, chance &random) {
    image_parts parts = parts_of(cdb::database(image));
    change(parts, random);
    image = joined(parts);
}

} // namespace

image_bytes changed_image(std::span<const std::byte> image, chance &random) {
    image_bytes changed(image.begin(), image.end());
    if (!is_database(image))
        return changed;
    switch (below(16, random)) {
    case 0:
        turn_fields(changed);
        break;
    case 1:
        change_parts(changed, change_sections, random);
        break;
    case 2:
    case 3:
        change_parts(changed, change_records, random);
        break;
    case 4:
    case 5:
        change_parts(changed, change_table, random);
        break;
    default:
        change_fields(changed, random);
    }
    make_whole(changed, cdb::database(changed).order());
    return changed;
}

image_bytes crossed_image(std::span<const std::byte> image, std::span<const std::byte> other, chance &random) {
    image_bytes crossed(image.begin(), image.end());
    if (!is_database(image) || !is_database(other))
        return crossed;
    std::endian order = cdb::database(image).order();
    image_bytes turned = in_order(other, order);
    if (below(2, random) == 0) {
        image_parts parts = parts_of(cdb::database(image));
        take_sections(parts, parts_of(cdb::database(turned)), random);
        crossed = joined(parts);
    } else if (mapped to(image), from(turned); !to.fields.empty()) {
        copy_field(crossed, to, from, random);
    }
    make_whole(crossed, order);
    return crossed;
}

} // namespace fuzz
