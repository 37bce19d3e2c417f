/* references.h: the walk over everything that a class's records refer to: texts, values and the lists of its side
 * tables. */
#ifndef CDGEN_READER_REFERENCES_H
#define CDGEN_READER_REFERENCES_H

#include "reader/ownership.h"
#include "reader/values.h"

namespace cdb {

struct list_kind;

class reference_walk {
public:
    reference_walk(reporter &to, const location &class_at, const class_tables &of);
    reference_walk(const reference_walk &) = delete;
    reference_walk &operator=(const reference_walk &) = delete;

    /* Follows the references and values of a record at an offset of an area. owner_type: the type of its values, if the
     * record itself does not name it. */
    void follow(const location &place, const bytes &area, std::size_t offset, std::span<const field> fields,
                vx_data_type_t owner_type);
    void follow_field(const location &place, const field &f, std::uint32_t word, vx_data_type_t type);
    void walk_valid_values(const location &place, const field &ref, std::uint32_t offset, vx_data_type_t type);
    void expect_data_type(const location &place, const field &f, vx_data_type_t type);

    /* Reports the bytes in list tables that nothing refers to. A source can leave such lists. */
    void report_unreached();

    /* True if, since the last call, a reference led to a list or a value that an earlier record had claimed. */
    bool take_found_shared();

    const class_tables &tables;
    text_walk texts;
    value_walk values;
    bool names_may_be_unset = true; /* of the records that are being followed */
    first_list_evidence evidence;

private:
    void follow_reference(const location &place, const field &f, std::uint32_t word, vx_data_type_t type);
    std::optional<std::size_t> find_list(const location &place, const field &ref, std::uint32_t offset, extent &lists,
                                         const list_kind &kind);
    bool claim_list(const location &list_at, std::size_t count, extent &lists, const list_kind &kind);
    void walk_varieties(const location &place, const field &ref, std::uint32_t offset);
    void walk_sd_definition(const location &place, const field &ref, std::uint32_t offset);
    void report_unreached(const extent &lists, std::string_view name);

    reporter &out;
    std::optional<std::size_t> section;
    extent valid_vals;
    extent variety_lists;
    extent sd_defs;
    bool found_shared_list = false;
};

} // namespace cdb

#endif
