/* lines.h: the lines of a stanza, made from the catalogue's attributes and the facts about the fields that they fill. A
 * new attribute whose line has the same text as its field needs no code here. */
#ifndef CDGEN_CDEF_SOURCE_LINES_H
#define CDGEN_CDEF_SOURCE_LINES_H

#include "cdb_view.h"
#include "cdef/source/writer.h"
#include "format/records.h"
#include "language/catalogue.h"

#include <algorithm>
#include <array>
#include <optional>
#include <utility>

namespace cdef::source {

/* An attribute of a stanza, and the field that it names. */
struct stanza_line {
    const table_attrs *attribute;
    const cdb::field *field;
    const cdb::field_fact *fact;
    bool fills; /* the attribute's lines fill the field */

    bool is_required() const {
        return (attribute->req_bit & OPTIONAL) == 0;
    }
};

/* In the order in which a stanza has them: required ones first, because the compiler accepts optional ones only after
 * them. format: of the record that the stanza fills. start: its offset in the staged record. */
std::vector<stanza_line> lines_of(std::span<const table_attrs> attributes, const cdb::record_format &format,
                                  std::size_t start = 0);
/* The lines of a stanza in the catalogue. */
const std::vector<stanza_line> &lines_of(stanza_id stanza);

/* True if the line is a number, a text, or a word that stands for a number, as in the field. Any other line needs a
 * special function. */
bool is_plain(const stanza_line &line);

/* The record that a stanza is written from. */
struct stanza_record {
    cdb::bytes record; /* in the byte order of this machine */
    cdb::bytes strings;
    record_name place;                  /* for messages */
    bool is_completed = true;           /* the compiler gave defaults to fields that no line fills */
    bool may_lack_texts = false;        /* a required text may be missing */
    std::string no_optional_lines = {}; /* why no optional line can follow; empty: they can */
};

template <class Record> cdb::bytes bytes_of(const Record &record) {
    return {std::as_bytes(std::span(&record, 1)), std::endian::native};
}

/* True if the field has the value that it has without the line. The line must be plain. */
bool is_default(const stanza_line &line, const stanza_record &from);

/* The value of a plain line; no value if the stanza does not need the line. Throws no_source_error if it needs one, but
 * no line can give the field its value. */
std::optional<std::string> plain_text(const stanza_line &line, const stanza_record &from);

/* The names of the bits, as they are written in a Properties line. Throws no_source_error for a bit without a name. */
std::string properties_text(std::uint32_t bits, std::span<const props_t> known, const record_name &place);

/* A field for whose lines there is a special function. */
template <class Writer> struct own_line {
    std::size_t offset; /* of the field in the record */
    void (Writer::*write)();
};

/* Writes a line for which there is no special function. */
void write_plain_line(source_writer &out, const stanza_line &line, const stanza_record &from);

/* Writes lines in their order. Writer must have out, from and own_lines(). A function that writes the lines of several
 * fields is called once, for the first of them. */
template <class Writer> void write_lines(Writer &writer, std::span<const stanza_line> lines) {
    constexpr auto own = Writer::own_lines();
    std::array<bool, own.size()> done = {};
    for (const stanza_line &line : lines) {
        auto found = std::find_if(own.begin(), own.end(),
                                  [&](const own_line<Writer> &o) { return o.offset == line.field->offset; });
        if (found == own.end()) {
            write_plain_line(writer.out, line, writer.from);
            continue;
        }
        auto same =
            std::find_if(own.begin(), own.end(), [&](const own_line<Writer> &o) { return o.write == found->write; });
        if (!std::exchange(done[static_cast<std::size_t>(same - own.begin())], true))
            (writer.*found->write)();
    }
}

/* The offsets of the fields that have own lines. */
template <class Writer> std::vector<std::size_t> own_fields_of() {
    std::vector<std::size_t> offsets;
    for (const own_line<Writer> &own : Writer::own_lines())
        offsets.push_back(own.offset);
    return offsets;
}

} // namespace cdef::source

#endif
