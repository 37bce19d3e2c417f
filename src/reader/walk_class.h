/* walk_class.h: the walk over one class section. walk_class.cpp has its records and lists, walk_values.cpp
 * its values. */
#ifndef CDGEN_CDB_WALK_CLASS_H
#define CDGEN_CDB_WALK_CLASS_H

#include "reader/ownership.h"
#include "reader/walk.h"

namespace cdb {

/* A list table's entries. */
struct list_format {
    std::string_view record;
    std::string_view id_field;
    std::string_view count_field;
    vx_uint32_t id;
    std::size_t entry; /* bytes */
    std::span<const field> fields;
};

class class_walk {
public:
    class_walk(walker &w, const spot &class_at, const bytes &whole, bool last)
        : walk(w), at(class_at), section(whole), rc(whole.record<rsrc_class_t>(0)), is_last(last),
          strings(table(rc.u_rc_strings, SIZE_MAX)), valid_vals(table(rc.u_rc_valid_vals, rc.rc_valval_size)),
          variety_lists(table(rc.u_rc_variety_lists, rc.rc_varlist_size)),
          sd_defs(table(rc.u_rc_sd_defs, rc.rc_sd_size)) {}

    void run();

private:
    /* A reference to the first list of valid values that may mean that there is none: it is decided once all other
     * references are known. */
    struct doubtful_list {
        spot record_at;
        const field *what;
        vx_data_type_t type;    /* the attribute's */
        cdb_ref_t variety_list; /* the attribute's */
        std::uint32_t name;     /* offset in the strings */
    };

    /* A bound that may be a number of another type: it is followed once all genuine values have claimed their bytes. */
    struct doubtful_bound {
        spot record_at;
        const field *what;
        std::uint32_t word;
        vx_data_type_t type; /* the attribute's */
    };

    extent table(const cdb_ref_t &ref, std::size_t size) const {
        return {section.part(ref.offset[0], size), at.offset + ref.offset[0]};
    }

    class_tables tables() const {
        return {section, strings.area, valid_vals.area, variety_lists.area, sd_defs.area};
    }

    void check_tables();
    template <class Record>
    void walk_attributes(const cdb_ref_t &ref, std::size_t count, std::string_view record, vx_uint32_t id);
    template <class Record> void walk_attribute(const spot &place, std::size_t offset, vx_uint32_t id, bool last);
    template <class Record> void check_structure(const spot &place, const Record &record);
    void check_structure_value(const spot &place, const field &f, const sd_definition &definition, const value &cell);
    void walk_actions(const cdb_ref_t &ref, std::size_t count, vx_uint32_t id);
    void walk_errors();
    void walk_depends();
    template <class Record> void follow_attribute(const spot &place, std::size_t offset, vx_uint32_t id, bool last);
    std::optional<std::size_t> owner_of_doubtful_lists() const;
    void walk_doubtful_lists();
    void walk_doubtful_bounds();

    void expect_data_type(const spot &place, std::string_view field, std::size_t offset, vx_data_type_t type);
    void follow(const spot &place, const bytes &area, std::size_t offset, std::span<const field> fields,
                vx_data_type_t owner_type);
    void follow_field(const spot &place, const field &f, std::uint32_t word, vx_data_type_t type);
    void follow_reference(const spot &place, const field &f, std::uint32_t word, vx_data_type_t type);
    std::optional<std::size_t> claim_list(const spot &place, const field &ref, std::uint32_t offset, extent &lists,
                                          const list_format &format);
    void walk_varieties(const spot &place, const field &ref, std::uint32_t offset);
    void walk_valid_values(const spot &place, const field &ref, std::uint32_t offset, vx_data_type_t type);
    void walk_sd_definition(const spot &place, const field &ref, std::uint32_t offset);

    void walk_container(const spot &place, std::string_view field, std::size_t file_offset, std::uint32_t offset,
                        vx_data_type_t type);
    bool claim_value(const spot &place, std::string_view field, std::size_t file_offset, std::size_t offset,
                     std::size_t length);
    void walk_binary(const spot &place, std::string_view field, std::size_t file_offset, std::size_t offset);
    void walk_empty_binaries();
    void walk_handle(const spot &place, std::string_view field, std::size_t file_offset, std::size_t offset);
    void walk_array(const spot &place, std::string_view field, std::size_t file_offset, std::size_t offset,
                    vx_data_type_t type);
    void expect_no_bound(const spot &cell);
    void walk_structured_data(const spot &place, std::string_view field, std::size_t file_offset, std::size_t offset);
    void walk_filling(const spot &place, std::size_t end);
    void report_unreached(extent &lists, std::string_view name);

    walker &walk;
    spot at;
    bytes section;
    rsrc_class_t rc;
    bool is_last; /* no class follows */
    extent strings;
    extent valid_vals;
    extent variety_lists;
    extent sd_defs;
    unsigned nesting = 0;
    bool met_shared = false;                 /* the attribute being walked led to a list or a value of another owner */
    std::vector<std::size_t> empty_binaries; /* ends of their lengths' pieces, in the strings */
    first_list_evidence evidence;
    std::vector<doubtful_list> doubtful_lists;
    std::vector<doubtful_bound> doubtful_bounds;
};

} // namespace cdb

#endif
