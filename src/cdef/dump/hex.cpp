/* hex.cpp: every byte of a file and what it is. Nothing is taken for granted: the file may be damaged. Each
 * line costs no more than its bytes deserve, so that what comes out is in proportion to the file. */

#include "text/hex.h"
#include "cdef/dump/dump.h"
#include "cdef/support/output.h"
#include "reader/owners.h"
#include "reader/tables.h"
#include "text/append.h"
#include "text/shown.h"

#include <unordered_map>

namespace cdef::dump {

namespace {

constexpr std::size_t BYTES_A_LINE = 16;
constexpr std::size_t EXCERPT = 32; /* bytes of a text that a reference shows */

/* Whether a field's bytes say what the place of its record starts with. */
bool starts(const cdb::region &r, std::string_view record) {
    return r.what != nullptr && r.what->offset == 0 && r.record == record;
}

class hex_form {
public:
    explicit hex_form(const cdb::database &shown)
        : db(shown), owners(cdb::owners_in(shown)), sections(shown.section_count()) {}

    void show();

private:
    using types_by_place = std::unordered_map<std::size_t, vx_data_type_t>;

    void note_types(const cdb::region &r);
    void show(const cdb::region &r);
    std::string meaning_in(const cdb::region &r);
    std::string meaning_of_field(const cdb::region &r);
    std::string meaning_of_reference(const cdb::region &r);
    std::string meaning_of_value(const cdb::region &r, vx_data_type_t type);
    vx_data_type_t value_type(const cdb::region &r) const;

    const cdb::class_tables &tables(const cdb::region &r);
    std::size_t place_of(const cdb::bytes &area) const;
    std::string place_text(const cdb::bytes &area, std::size_t at) const;

    const cdb::database &db;
    cdb::ownership owners;
    std::vector<std::optional<cdb::class_tables>> sections; /* as far as they have been asked for */
    types_by_place lists;                                   /* of valid values, by where they stand in the file */
    types_by_place arrays;                                  /* of their elements, likewise */
    vx_data_type_t list_type = VX_UNKNOWN;                  /* of the list that the regions are in */
    vx_data_type_t array_type = VX_UNKNOWN;                 /* of the array, likewise */
    output out;
};

vx_data_type_t type_at(const std::unordered_map<std::size_t, vx_data_type_t> &types, std::size_t place) {
    auto found = types.find(place);
    return found == types.end() ? VX_UNKNOWN : found->second;
}

/* What the field of a region means. */
const cdb::field_fact &fact_row(const cdb::region &r) {
    return cdb::format_of(r.record).fact_of(*r.what);
}

/* Where a record begins in the file. */
std::size_t start_of(const cdb::region &r) {
    return r.offset - r.what->offset;
}

/* Of a region in a section: values and references stand nowhere else. */
const cdb::class_tables &hex_form::tables(const cdb::region &r) {
    std::size_t section = r.section.value();
    std::optional<cdb::class_tables> &known = sections.at(section);
    if (!known)
        known = cdb::tables_of(db, section);
    return *known;
}

/* area: of the file, and not empty. */
std::size_t hex_form::place_of(const cdb::bytes &area) const {
    return static_cast<std::size_t>(area.raw().data() - db.file().raw().data());
}

/* An offset into an area, and where that is in the file. */
std::string hex_form::place_text(const cdb::bytes &area, std::size_t at) const {
    std::string shown = std::to_string(at);
    if (at < area.size())
        text::appendf(shown, " at %08zx", place_of(area) + at);
    return shown;
}

/* Lists of valid values and arrays do not name the types of their values; the record that owns them does. */
void hex_form::note_types(const cdb::region &r) {
    if (r.what == nullptr || !r.section || !owners.is_own(r.offset))
        return;
    auto word = db.file().number<std::uint32_t>(r.offset);
    if (r.what->kind == cdb::field_kind::value) {
        vx_data_type_t type = value_type(r);
        const cdb::bytes &strings = tables(r).strings;
        if (cdb::is_array(type) && word < strings.size())
            arrays.try_emplace(place_of(strings) + word, cdb::element_type(type));
    } else if (r.what->to == cdb::target::valid_vals) {
        const cdb::bytes &table = tables(r).valid_vals;
        vx_data_type_t type = data_type_in(cdb::format_of(r.record), db.file(), start_of(r));
        if (word < table.size())
            lists.try_emplace(place_of(table) + word, cdb::element_type(type));
    }
}

vx_data_type_t hex_form::value_type(const cdb::region &r) const {
    return r.what->type_at == cdb::TYPE_OF_OWNER ? list_type
                                                 : db.file().number<vx_data_type_t>(start_of(r) + r.what->type_at);
}

/* The beginning of a text. */
std::string excerpt(const cdb::bytes &strings, std::size_t at) {
    std::string_view text = strings.part(at, EXCERPT + 1).text(std::size_t{0});
    return text::quoted(text.substr(0, EXCERPT)) + (text.size() > EXCERPT ? "..." : "");
}

vx_resource_handle_t handle_at(const cdb::bytes &file, std::size_t at) {
    auto word = [&](std::size_t i) { return file.number<std::uint32_t>(at + i * sizeof(std::uint32_t)); };
    return {word(0), {word(1), word(2), word(3), word(4)}};
}

std::string hex_form::meaning_of_value(const cdb::region &r, vx_data_type_t type) {
    const cdb::bytes &strings = tables(r).strings;
    cdb::value value(db.file(), r.offset, type, strings);
    if (!cdb::is_out_of_line(type) && !value.present())
        return "";
    if (!cdb::is_out_of_line(type))
        return as_text(fact_of(value));
    auto word = db.file().number<std::uint32_t>(r.offset);
    if (word == CDB_NONE)
        return "none";
    std::string shown = place_text(strings, word);
    if (type == VX_CHAR_PTR && value.present())
        shown += " " + excerpt(strings, word);
    return shown;
}

std::string hex_form::meaning_of_reference(const cdb::region &r) {
    auto word = db.file().number<std::uint32_t>(r.offset);
    if (r.what->count > 1)
        return "";
    if (word == CDB_NONE)
        return "none";
    if (r.what->to == cdb::target::none || fact_row(r).as == cdb::meaning::UNUSED)
        return std::to_string(word);
    const cdb::class_tables &into = tables(r);
    if (r.what->to == cdb::target::section)
        return place_text(into.section, word);
    if (r.what->to != cdb::target::strings)
        return place_text(lists_of(into, r.what->to), word);
    std::string shown = place_text(into.strings, word);
    if (word < into.strings.size())
        shown += " " + excerpt(into.strings, word);
    return shown;
}

std::string hex_form::meaning_of_field(const cdb::region &r) {
    switch (r.what->kind) {
    case cdb::field_kind::number: {
        cdb::meaning as = fact_row(r).as;
        std::uint32_t number = number_in(db.file(), start_of(r), *r.what);
        if (as == cdb::meaning::OFFSET)
            return place_text(db.file(), number);
        return as_text(fact_of(as, number));
    }
    case cdb::field_kind::reference:
        return meaning_of_reference(r);
    case cdb::field_kind::value:
        return meaning_of_value(r, value_type(r));
    case cdb::field_kind::reserved:
    case cdb::field_kind::entries:
        break;
    }
    return "";
}

std::string hex_form::meaning_in(const cdb::region &r) {
    if (r.what != nullptr)
        return meaning_of_field(r);
    if (r.record == "vx_value_t")
        return meaning_of_value(r, array_type);
    if (r.record == "text")
        return text::quoted(db.file().part(r.offset, r.size).text(std::size_t{0}));
    if (r.record == "handle")
        return as_text(handle_at(db.file(), r.offset));
    if (r.record == "length" || r.record == "var_id_t")
        return std::to_string(db.file().number<std::uint32_t>(r.offset));
    return "";
}

/* "section 2, rsrc_pattr_t 5, ra_props", as cdef verify calls it. Only records are counted. */
std::string name_of(const cdb::region &r) {
    std::string name;
    if (r.section)
        name += "section " + std::to_string(*r.section) + ", ";
    name += r.record;
    if (r.what != nullptr || r.record == "vx_value_t" || r.record == "var_id_t")
        name += " " + std::to_string(r.index);
    if (r.what != nullptr)
        name += ", " + std::string(r.what->name);
    return name;
}

void hex_form::show(const cdb::region &r) {
    if (starts(r, "valid_values_t"))
        list_type = type_at(lists, r.offset);
    if (starts(r, "vx_array_t"))
        array_type = type_at(arrays, r.offset);
    std::string meaning = meaning_in(r);
    for (std::size_t at = 0; at < r.size; at += BYTES_A_LINE) {
        text::appendf(out.text, "%08zx ", r.offset + at);
        std::size_t start = out.text.size();
        auto line = db.file().part(r.offset + at, std::min(BYTES_A_LINE, r.size - at)).raw();
        for (std::size_t i = 0; i < line.size(); ++i)
            out.text += " " + text::hex_of(line.subspan(i, 1));
        if (at == 0) {
            out.text.resize(start + BYTES_A_LINE * 3, ' ');
            out.text += "  " + name_of(r) + (meaning.empty() ? "" : ": ") + meaning;
        }
        out.text += '\n';
        out.flush_if_full();
    }
}

void hex_form::show() {
    std::vector<cdb::region> regions = cdb::regions(db);
    for (const cdb::region &r : regions)
        note_types(r);
    for (const cdb::region &r : regions)
        show(r);
    out.flush();
}

} // namespace

void show_hex(const input &in) {
    hex_form(in.db).show();
}

} // namespace cdef::dump
