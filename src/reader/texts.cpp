/* texts.cpp: the texts of a section, in the strings that references lead into. */

#include "reader/texts.h"

#include "format/records.h"

namespace cdb {

/* The reference to the name of the record at this location. No source gives an error its name, so it may be anything.
 */
static bool is_name(const location &at, const field &ref) {
    const record_format &record = format_of(at.record);
    return record.name != nullptr && record.name->offset == ref.offset && &record != &format_for<rsrc_error_t>;
}

void text_walk::visit(const location &at, const field &ref, std::uint32_t offset, bool may_be_unset) {
    std::size_t place = at.offset + ref.offset;
    if (offset == CDB_NONE) {
        if (!ref.optional)
            out.report(check::REFERENCE_NONE, at, ref.name, place, "none", "a text");
    } else if (offset == 0 && strings.area.size() == 0)
        out.report(check::TEXT_MISSING, at, ref.name, place, "0 in an empty table", "a text");
    else if (offset % extent::UNIT != 0)
        out.report(check::REFERENCE_UNALIGNED, at, ref.name, place, std::to_string(offset), "a multiple of 8");
    else if (offset >= strings.texts_end)
        out.report(check::TEXT_OUTSIDE, at, ref.name, place, std::to_string(offset),
                   "a text in " + std::to_string(strings.area.size()) + " bytes");
    else if (offset == 0 && (!is_name(at, ref) || may_be_unset))
        is_first_referred_to = true;
    else if (strings.is_text(offset))
        out.report(check::VALUE_SHARED, at, ref.name, place, std::to_string(offset), "a text of its own");
    else
        note(offset);
}

void text_walk::note(std::size_t offset) {
    if (out.excuse)
        claim(offset, strings.area.size());
    else
        strings.note_text(offset);
}

/* end: where the next text starts, or the table ends. */
void text_walk::claim(std::size_t start, std::size_t end) {
    auto [size, whole] = strings.claim_text(start, end);
    location text = {section, "text", 0, strings.offset + start};
    out.add_region(text, text.offset, size, stretch_kind::TEXT);
    if (!whole)
        return out.report(check::VALUE_SHARED, text, {}, text.offset, "a text that runs into something else",
                          "a place of its own");
    std::size_t filled = std::min(end, extent::rounded(start + size));
    std::size_t filling = filled - start - size;
    out.expect_zero(text, "filling", strings.area, start + size, filling, text.offset + size);
    out.add_region(text, text.offset + size, filling, stretch_kind::FILLING);
}

void text_walk::finish() {
    if (is_first_referred_to)
        strings.note_text(0);
    for (std::size_t start = strings.next_text(0); start < strings.area.size();) {
        std::size_t next = strings.next_text(start + 1);
        claim(start, next);
        start = next;
    }
}

} // namespace cdb
