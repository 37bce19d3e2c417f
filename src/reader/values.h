/* values.h: the walk over the values that a class stores among its strings. */
#ifndef CDGEN_READER_VALUES_H
#define CDGEN_READER_VALUES_H

#include "reader/texts.h"

namespace cdb {

/* A value cell: the field that findings name, and where it is in the file. */
struct cell_location {
    const location &record;
    std::string_view field;
    std::size_t offset; /* of the cell, in the file */
};

class value_walk {
public:
    value_walk(reporter &to, text_walk &class_texts, const location &class_at)
        : out(to), texts(class_texts), strings(class_texts.strings), section(class_at.section) {}

    /* Follows a cell of an out-of-line type. offset: the cell's first word. */
    void walk(const cell_location &cell, std::uint32_t offset, vx_data_type_t type);

    /* Some binaries without bytes have a second piece nevertheless, of zeros. Claims those pieces that nothing else has
     * claimed, so call it last. */
    void finish_empty_binaries();

    bool found_shared = false; /* true: a value was met that another record had claimed; the caller resets it */

private:
    bool claim(const cell_location &cell, std::size_t offset, std::uint64_t length);
    void walk_text(const cell_location &cell, std::size_t offset);
    void walk_binary(const cell_location &cell, std::size_t offset);
    void walk_handle(const cell_location &cell, std::size_t offset);
    void walk_array(const cell_location &cell, std::size_t offset, vx_data_type_t type);
    void walk_element(const location &element, std::uint32_t offset, vx_data_type_t type);
    void walk_structured_data(const cell_location &cell, std::size_t offset);
    void walk_filling(const location &place, std::size_t end);

    reporter &out;
    text_walk &texts;
    extent &strings;
    std::optional<std::size_t> section;
    unsigned nesting = 0;
    std::vector<std::size_t> empty_binaries; /* where their second pieces would start, in the strings */
};

} // namespace cdb

#endif
