/* stanzas.h: the stanzas of a source and their attributes. In a source with errors, as many as can be
 * recognised. */
#ifndef CDGEN_INDEX_STANZAS_H
#define CDGEN_INDEX_STANZAS_H

#include "index/lines.h"
#include "language/catalogue.h"

#include <optional>
#include <string_view>
#include <vector>

namespace source_index {

constexpr int UNKNOWN_KIND = -1;
constexpr std::size_t NONE = static_cast<std::size_t>(-1);

struct attribute {
    const table_attrs *known = nullptr; /* null: the stanza's kind has none of this name */
    std::size_t line = 0;               /* in index::lines */
    attribute_parts parts;
};

struct stanza {
    int kind = UNKNOWN_KIND;
    std::size_t first_line = 0; /* that of its header, in index::lines; */
    std::size_t last_line = 0;  /* the last one with a text */
    span header;
    std::vector<attribute> attributes;
    int class_number = 0;     /* how many ControlDefinitions there are up to this stanza */
    std::size_t run = NONE;   /* of an element: the first stanza of its run; */
    std::size_t owner = NONE; /* and the attribute or action that the run describes. NONE: none, or the class */

    bool is_known() const {
        return kind != UNKNOWN_KIND;
    }
    /* The kind must be known. */
    const srtable_ctrl &row() const {
        return sc_tables[static_cast<std::size_t>(kind)];
    }
    bool is_element() const {
        return is_known() && row().sc_sd_owner != nullptr;
    }
    /* The first line that gives an attribute; null if there is none. */
    const attribute *find(std::string_view name) const;
    /* The value of an attribute; empty without one. */
    std::string_view value(std::string_view source, std::string_view name) const;
    /* The required attributes that it has given, as a mask. */
    vx_uint32_t required_seen() const;
};

/* The index of a source. It contains no text, so its functions need the source again. */
struct index {
    std::vector<line> lines;
    std::vector<stanza> stanzas;

    /* The line that contains an offset. */
    std::size_t line_at(std::size_t offset) const;
    /* The stanza that a line belongs to; NONE before the first header. */
    std::size_t stanza_at(std::size_t line) const;
    /* The attribute of a line; null: it has none. */
    const attribute *attribute_at(std::size_t line) const;
    /* All of a stanza, from its header to the end of its last line. */
    span extent_of(const stanza &of) const;
    /* The number after the highest one in use by stanzas of this kind in the class or, if that is the largest of all,
     * the lowest free one. Persistent and dynamic attributes of a level share their numbers. An element's number is its
     * place in its run, counted from 0. */
    std::optional<long long> next_id(std::string_view source, const stanza &of) const;
    /* Whether a stanza's Id is a number that no other stanza has. */
    bool is_free_id(std::string_view source, const stanza &of) const;
};

index index_of(std::string_view source);

} // namespace source_index

#endif
