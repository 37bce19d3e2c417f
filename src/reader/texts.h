/* texts.h: the texts of a section, in the strings that references lead into. */
#ifndef CDGEN_READER_TEXTS_H
#define CDGEN_READER_TEXTS_H

#include "reader/extent.h"
#include "reader/report.h"

namespace cdb {

class text_walk {
public:
    text_walk(reporter &to, const location &section_at, const bytes &strings_area, std::size_t file_offset)
        : strings(strings_area, file_offset), out(to), section(section_at.section) {}

    /* Visits the text that a record's reference leads to. may_be_unset: true if the source may not have given the name,
     * so that its reference is 0; for other texts this is always possible. Such a reference does not own the text that
     * is stored at 0. */
    void visit(const location &at, const field &ref, std::uint32_t offset, bool may_be_unset);
    /* Notes a text at a multiple of extent::UNIT inside the strings. While errors are excused, the text is claimed at
     * once, because all other texts are known by then and it may begin in the middle of one. */
    void note(std::size_t offset);
    /* Claims all noted texts. A text ends at its zero byte but may not run into the next text, so all starts are
     * collected before any text is claimed. */
    void finish();

    extent strings;

private:
    void claim(std::size_t start, std::size_t end);

    reporter &out;
    std::optional<std::size_t> section;
    bool is_first_referred_to = false; /* by a reference that may also mean "none" */
};

} // namespace cdb

#endif
