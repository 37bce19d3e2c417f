/* attributes.h: the walk over the attributes of a class. */
#ifndef CDGEN_READER_ATTRIBUTES_H
#define CDGEN_READER_ATTRIBUTES_H

#include "reader/references.h"

namespace cdb {

class attribute_walk {
public:
    /* is_last: no class follows this one in the file, so none of its attributes was cut short. dynamic_ids: receives
     * the variable IDs of the dynamic attributes. */
    attribute_walk(reporter &to, reference_walk &following, const location &class_at, bool is_last,
                   std::vector<var_id_t> &ids)
        : out(to), references(following), tables(following.tables), at(class_at), is_last_class(is_last),
          dynamic_ids(ids) {}

    /* Walks a table of persistent (rsrc_pattr_t) or dynamic (rsrc_dattr_t) attributes whose records have this
     * identifier. */
    template <class Record>
    void walk(const cdb_ref_t &table, std::size_t count, std::string_view record, vx_uint32_t id);

    /* Decides who owns the first list of valid values and the bounds in doubt. Call it when all other references have
     * been followed and all texts claimed. */
    void decide_doubtful();

private:
    /* A reference to the first list of valid values that may actually mean "none". */
    struct doubtful_list {
        location attribute_at;
        const field *what;
        vx_data_type_t type;    /* the attribute's */
        cdb_ref_t variety_list; /* the attribute's */
        std::uint32_t name;     /* offset in the strings */
    };

    /* A bound that may be a number of another type. */
    struct doubtful_bound {
        location attribute_at;
        const field *what;
        std::uint32_t word;
        vx_data_type_t type; /* the attribute's */
    };

    template <class Record>
    void walk_attribute(const location &place, std::size_t offset, vx_uint32_t id, bool is_last_of_table);
    template <class Record>
    void follow(const location &place, std::size_t offset, const Record &record, vx_uint32_t id, bool may_be_cut_short);
    template <class Record> void check_structure(const location &place, const Record &record);
    void check_structure_value(const location &place, const field &f, const sd_definition &definition,
                               const value &cell);
    std::optional<std::size_t> owner_of_doubtful_lists() const;
    void decide_lists();
    void decide_bounds();

    reporter &out;
    reference_walk &references;
    const class_tables &tables;
    location at; /* of the class */
    bool is_last_class;
    std::vector<var_id_t> &dynamic_ids;
    std::vector<doubtful_list> doubtful_lists;
    std::vector<doubtful_bound> doubtful_bounds;
};

} // namespace cdb

#endif
