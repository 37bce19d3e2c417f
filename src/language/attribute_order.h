/* attribute_order.h: guesses which attribute a line gives. Stanzas of a kind mostly give their attributes in the same
 * order, so a line is first compared with the attribute that came next in the previous stanza. */
#ifndef CDGEN_LANGUAGE_ATTRIBUTE_ORDER_H
#define CDGEN_LANGUAGE_ATTRIBUTE_ORDER_H

#include "language/catalogue.h"

#include <array>

namespace language {

/* The order in which the stanzas of one kind have given their attributes. */
class attribute_order {
public:
    /* A stanza begins. */
    void restart() {
        latest = BEGINNING;
    }

    /* The attribute that came next in the previous stanza, if the line begins with its name and an equals sign; it is
     * then noted as this stanza's latest attribute. Otherwise null. name_pattern::WIDTH bytes of the line are read. */
    const table_attrs *expected(const srtable_ctrl &kind, const char *line) {
        std::uint8_t position = next[latest];
        const table_attrs &attr = kind.sc_attrs[position];
        if (!attr.ta_pattern.begins(line))
            return nullptr;
        latest = position;
        return &attr;
    }

    /* Notes the attribute of the line if it was not the expected one. */
    void took(const srtable_ctrl &kind, const table_attrs &attr) {
        next[latest] = static_cast<std::uint8_t>(&attr - kind.sc_attrs.data());
        latest = next[latest];
    }

private:
    static constexpr std::uint8_t BEGINNING = name_index::MOST_NAMES;

    std::array<std::uint8_t, BEGINNING + 1> next = {}; /* by attribute, and at the beginning: positions in sc_attrs */
    std::uint8_t latest = BEGINNING;
};

} // namespace language

#endif
