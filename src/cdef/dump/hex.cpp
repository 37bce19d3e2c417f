/* hex.cpp: shows every byte of a file and its meaning. The file may be damaged, so nothing is taken for granted. The
 * length of each line is limited, so that the size of the output is proportional to the file. */

#include "text/hex.h"
#include "cdef/dump/dump.h"
#include "cdef/support/output.h"
#include "reader/owners.h"
#include "reader/tables.h"
#include "text/append.h"
#include "text/shown.h"

#include <array>
#include <charconv>
#include <cstdint>

namespace cdef::dump {

namespace {

using namespace std::string_view_literals;

constexpr std::size_t BYTES_A_LINE = 16;
constexpr std::size_t EXCERPT = 32; /* bytes of a text that a reference shows */

/* The types of values that are stored at places in the file: of lists of valid values, or of the elements of arrays.
 * They are noted in any order and looked up in the order of the file. The first note of a place counts. */
class types_by_place {
public:
    void note(std::size_t place, vx_data_type_t type) {
        notes.push_back(std::uint64_t{place} << TYPE_BITS | static_cast<std::uint8_t>(type));
    }
    void sort() {
        std::stable_sort(notes.begin(), notes.end(),
                         [](std::uint64_t a, std::uint64_t b) { return a >> TYPE_BITS < b >> TYPE_BITS; });
    }
    /* VX_UNKNOWN if there is no note. */
    vx_data_type_t at(std::size_t place) const {
        std::uint64_t wanted = std::uint64_t{place} << TYPE_BITS;
        auto found = std::lower_bound(notes.begin(), notes.end(), wanted,
                                      [](std::uint64_t a, std::uint64_t b) { return a >> TYPE_BITS < b >> TYPE_BITS; });
        bool is_noted = found != notes.end() && *found >> TYPE_BITS == place;
        return is_noted ? static_cast<vx_data_type_t>(*found & 0xFF) : VX_UNKNOWN;
    }

private:
    static constexpr int TYPE_BITS = 8;

    std::vector<std::uint64_t> notes; /* place and type */
};

class hex_form {
public:
    explicit hex_form(const cdb::database &shown) : db(shown), owners(cdb::owners_in(shown)) {}

    void show();

private:
    void note_types(const cdb::region &r);
    void show(const cdb::region &r);
    void show_line(const cdb::region &r, std::size_t at);
    void append_name(const cdb::region &r);
    /* Each of these functions appends ": " and the meaning of the bytes, or nothing. */
    void append_meaning(const cdb::region &r);
    void append_field(const cdb::region &r);
    void append_reference(const cdb::region &r);
    void append_value(const cdb::region &r, vx_data_type_t type);
    vx_data_type_t value_type(const cdb::region &r) const;

    std::string &meaning() {
        return out.text += ": "sv;
    }
    void append_place(const cdb::bytes &area, std::size_t at);
    void append_excerpt(const cdb::bytes &strings, std::size_t at);

    const cdb::record_format &format(const cdb::region &r);
    cdb::meaning meaning_of(const cdb::region &r);
    const cdb::class_tables &tables(const cdb::region &r);
    std::size_t place_of(const cdb::bytes &area) const;

    const cdb::database &db;
    cdb::ownership owners;
    std::optional<std::size_t> known_section; /* the one that known_tables are of */
    cdb::class_tables known_tables;
    const cdb::record_format *known_format = &cdb::format_for<void>;
    types_by_place lists;
    types_by_place arrays;
    vx_data_type_t list_type = VX_UNKNOWN;  /* of the list that the regions are in */
    vx_data_type_t array_type = VX_UNKNOWN; /* of the array, likewise */
    output out;
};

/* The offset of a record in the file. */
std::size_t start_of(const cdb::region &r) {
    return r.offset - r.what->offset;
}

/* Regions of one record follow each other. */
const cdb::record_format &hex_form::format(const cdb::region &r) {
    if (known_format->record.data() != r.record.data())
        known_format = &cdb::format_of(r.record);
    return *known_format;
}

/* Each field has its row at its own position. */
cdb::meaning hex_form::meaning_of(const cdb::region &r) {
    const cdb::record_format &of = format(r);
    return of.facts[static_cast<std::size_t>(r.what - of.fields.data())].as;
}

/* For a region in a section. Values and references are stored nowhere else. */
const cdb::class_tables &hex_form::tables(const cdb::region &r) {
    if (known_section != r.section) {
        known_tables = cdb::tables_of(db, r.section.value());
        known_section = r.section;
    }
    return known_tables;
}

/* area: of the file, and not empty. */
std::size_t hex_form::place_of(const cdb::bytes &area) const {
    return static_cast<std::size_t>(area.raw().data() - db.file().raw().data());
}

void append_number(std::string &to, std::uint64_t number) {
    std::array<char, 24> digits;
    to.append(digits.data(), std::to_chars(digits.data(), digits.data() + digits.size(), number).ptr);
}

/* At least eight digits. */
void append_offset(std::string &to, std::uint64_t offset) {
    constexpr int DIGIT = 4;
    int shift = 28;
    while (shift < 60 && offset >> (shift + DIGIT) != 0)
        shift += DIGIT;
    for (; shift >= 0; shift -= DIGIT)
        to += text::HEX_DIGITS[offset >> shift & 0xF];
}

/* Shows an offset into an area, and the corresponding offset in the file. */
void hex_form::append_place(const cdb::bytes &area, std::size_t at) {
    append_number(out.text, at);
    if (at < area.size())
        append_offset(out.text += " at "sv, place_of(area) + at);
}

/* Lists of valid values and arrays do not name the types of their values; the record that owns them does. */
void hex_form::note_types(const cdb::region &r) {
    if (r.what == nullptr || !r.section)
        return;
    bool is_value = r.what->kind == cdb::field_kind::value;
    if ((!is_value && r.what->to != cdb::target::valid_vals) || !owners.is_own(r.offset))
        return;
    auto word = db.file().number<std::uint32_t>(r.offset);
    if (is_value) {
        vx_data_type_t type = value_type(r);
        const cdb::bytes &strings = tables(r).strings;
        if (cdb::is_array(type) && word < strings.size())
            arrays.note(place_of(strings) + word, cdb::element_type(type));
    } else {
        const cdb::bytes &table = tables(r).valid_vals;
        vx_data_type_t type = data_type_in(format(r), db.file(), start_of(r));
        if (word < table.size())
            lists.note(place_of(table) + word, cdb::is_data_type(type) ? cdb::element_type(type) : VX_UNKNOWN);
    }
}

vx_data_type_t hex_form::value_type(const cdb::region &r) const {
    return r.what->type_at == cdb::TYPE_OF_OWNER ? list_type
                                                 : db.file().number<vx_data_type_t>(start_of(r) + r.what->type_at);
}

/* The beginning of a text. */
void hex_form::append_excerpt(const cdb::bytes &strings, std::size_t at) {
    std::string_view text = strings.part(at, EXCERPT + 1).text(std::size_t{0});
    text::append_quoted(out.text += ' ', text.substr(0, EXCERPT));
    out.text += text.size() > EXCERPT ? "..." : "";
}

vx_resource_handle_t handle_at(const cdb::bytes &file, std::size_t at) {
    auto word = [&](std::size_t i) { return file.number<std::uint32_t>(at + i * sizeof(std::uint32_t)); };
    return {word(0), {word(1), word(2), word(3), word(4)}};
}

void hex_form::append_value(const cdb::region &r, vx_data_type_t type) {
    const cdb::bytes &strings = tables(r).strings;
    cdb::value value(db.file(), r.offset, type, strings);
    if (!cdb::is_out_of_line(type)) {
        if (value.present())
            append(meaning(), fact_of(value));
        return;
    }
    auto word = db.file().number<std::uint32_t>(r.offset);
    meaning();
    if (word == CDB_NONE) {
        out.text += "none"sv;
        return;
    }
    append_place(strings, word);
    if (type == VX_CHAR_PTR && value.present())
        append_excerpt(strings, word);
}

void hex_form::append_reference(const cdb::region &r) {
    auto word = db.file().number<std::uint32_t>(r.offset);
    if (r.what->count > 1)
        return;
    meaning();
    if (word == CDB_NONE)
        out.text += "none"sv;
    else if (r.what->to == cdb::target::none || meaning_of(r) == cdb::meaning::UNUSED)
        append_number(out.text, word);
    else if (r.what->to == cdb::target::section)
        append_place(tables(r).section, word);
    else if (r.what->to != cdb::target::strings)
        append_place(lists_of(tables(r), r.what->to), word);
    else {
        append_place(tables(r).strings, word);
        if (word < tables(r).strings.size())
            append_excerpt(tables(r).strings, word);
    }
}

void hex_form::append_field(const cdb::region &r) {
    switch (r.what->kind) {
    case cdb::field_kind::number: {
        cdb::meaning as = meaning_of(r);
        std::uint32_t number = number_in(db.file(), start_of(r), *r.what);
        meaning();
        if (as == cdb::meaning::OFFSET)
            append_place(db.file(), number);
        else
            append(out.text, fact_of(as, number));
        return;
    }
    case cdb::field_kind::reference:
        return append_reference(r);
    case cdb::field_kind::value:
        return append_value(r, value_type(r));
    case cdb::field_kind::reserved:
    case cdb::field_kind::entries:
        break;
    }
}

void hex_form::append_meaning(const cdb::region &r) {
    if (r.what != nullptr)
        append_field(r);
    else if (r.record == "vx_value_t")
        append_value(r, array_type);
    else if (r.record == "text")
        text::append_quoted(meaning(), db.file().part(r.offset, r.size).text(std::size_t{0}));
    else if (r.record == "handle")
        append(meaning(), handle_at(db.file(), r.offset));
    else if (r.record == "length" || r.record == "var_id_t")
        append_number(meaning(), db.file().number<std::uint32_t>(r.offset));
}

/* "section 2, rsrc_pattr_t 5, ra_props", as cdef verify calls it. Only records are counted. */
void hex_form::append_name(const cdb::region &r) {
    if (r.section) {
        append_number(out.text += "section "sv, *r.section);
        out.text += ", "sv;
    }
    out.text += r.record;
    if (r.what != nullptr || r.record == "vx_value_t" || r.record == "var_id_t")
        append_number(out.text += ' ', r.index);
    if (r.what != nullptr)
        out.text.append(", "sv).append(r.what->name);
}

void hex_form::show_line(const cdb::region &r, std::size_t at) {
    append_offset(out.text, r.offset + at);
    std::array<char, 1 + BYTES_A_LINE * 3 + 2> column; /* the bytes, and blanks around them */
    column.fill(' ');
    char *end = column.data() + 1;
    for (std::byte b : db.file().part(r.offset + at, std::min(BYTES_A_LINE, r.size - at)).raw()) {
        end[1] = text::HEX_DIGITS[std::to_integer<unsigned>(b) >> 4];
        end[2] = text::HEX_DIGITS[std::to_integer<unsigned>(b) & 0xF];
        end += 3;
    }
    out.text.append(column.data(), at == 0 ? column.data() + column.size() : end);
    if (at == 0) {
        append_name(r);
        append_meaning(r);
    }
    out.text += '\n';
    out.flush_if_full();
}

void hex_form::show(const cdb::region &r) {
    bool begins_record = r.what != nullptr && r.what->offset == 0;
    if (begins_record && &format(r) == &cdb::format_for<valid_values_t>)
        list_type = lists.at(r.offset);
    if (begins_record && &format(r) == &cdb::format_for<vx_array_t>)
        array_type = arrays.at(r.offset);
    for (std::size_t at = 0; at < r.size; at += BYTES_A_LINE)
        show_line(r, at);
}

/* In a damaged file, a type may be needed before its list has been shown. */
void hex_form::show() {
    cdb::regions(db, [this](const cdb::region &r) { note_types(r); });
    lists.sort();
    arrays.sort();
    cdb::regions(db, [this](const cdb::region &r) { show(r); });
    out.flush();
}

} // namespace

void show_hex(const input &in) {
    hex_form(in.db).show();
}

} // namespace cdef::dump
