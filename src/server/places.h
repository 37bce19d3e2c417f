/* places.h: the place in a document that a request is about, and what is there. */
#ifndef CDGEN_SERVER_PLACES_H
#define CDGEN_SERVER_PLACES_H

#include "server/session.h"

namespace lsp {

struct place_in_source {
    document &in;
    std::size_t offset;
    std::size_t line;                         /* in index::lines; 0 in an empty source */
    const source_index::stanza *stanza;       /* null: before the first header */
    const source_index::attribute *attribute; /* null: the line has none */
    bool in_comment;                          /* on a line without a text, or after the text */

    /* Whether stanzas of this kind have the attribute. */
    bool has_known_attribute() const {
        return attribute != nullptr && attribute->known != nullptr;
    }
    const std::string &text() const {
        return in.text();
    }
};

place_in_source place_at(document &in, std::size_t offset);

/* The place given by the parameters of a request, a document and a position. */
place_in_source place_in(session &now, const json &params);

/* The definition of a name as Markdown; empty if the name is not defined. */
std::string name_documentation(document &in, std::size_t name);

/* A part of a document as the protocol's Location. */
json location_of(const session &now, document &in, const stretch &part);

/* A workspace edit with these edits of one document. */
json workspace_edit(const session &now, const document &of, json edits);
/* An edit of bytes. A position cannot be between a carriage return and a newline: where the bytes begin or end there,
 * the edit covers both. */
json byte_edit(const document &in, encoding units, stretch part, std::string by);
json text_edit(position_maker &positions, const stretch &part, std::string_view by);

} // namespace lsp

#endif
