/* class.cpp: the walk over a class section: its tables and records. */

#include "reader/class.h"

#include "format/sections.h"
#include "reader/attributes.h"
#include "reader/tables.h"

namespace cdb {

namespace {

class class_walk {
public:
    class_walk(reporter &to, const location &class_at, const resource_class &walked, bool is_last,
               std::vector<var_id_t> &ids)
        : out(to), at(class_at), rc(walked.record()), section(walked.side_tables().section),
          references(to, class_at, walked.side_tables()), attributes(to, references, class_at, is_last, ids) {}

    void run();

private:
    void check_tables();
    void check_end(std::uint64_t strings_at);
    void walk_attributes();
    void walk_actions(const cdb_ref_t &table, std::size_t count, vx_uint32_t id);
    void walk_errors();
    void walk_depends();

    reporter &out;
    location at;
    const rsrc_class_t &rc;
    const bytes &section;
    reference_walk references;
    attribute_walk attributes;
};

/* The field of the class record that holds the offset of a table. */
const field &ref_field(const side_table &table) {
    static const rsrc_class_t record = {};
    const void *ref = &(record.*table.ref);
    return field_at(class_fields, static_cast<std::size_t>(static_cast<const std::byte *>(ref) -
                                                           reinterpret_cast<const std::byte *>(&record)));
}

/* Tables follow each other without gaps. */
void class_walk::check_tables() {
    std::uint64_t end = sizeof rc;
    for (const side_table &table : side_tables) {
        std::size_t offset = (rc.*table.ref).offset[0];
        bool unlocated = table.form == table_form::UNLOCATED && offset == 0;
        const field &f = ref_field(table);
        if (!unlocated && offset != end)
            out.report(check::TABLE_PLACE, at, f.name, at.offset + f.offset, offset, end);
        end += table.size_in(rc);
        if (end > section.size()) {
            out.report(check::TABLE_OUTSIDE, at, f.name, at.offset + f.offset, "ends at " + std::to_string(end),
                       "at most " + std::to_string(section.size()));
            return;
        }
    }
    check_end(end);
}

/* The strings end the section. strings_at: where they start. */
void class_walk::check_end(std::uint64_t strings_at) {
    if ((section.size() - strings_at) % extent::UNIT != 0)
        out.report(check::SECTION_LENGTH, at, field_of<rsrc_class_t>(offsetof(rsrc_class_t, u_rc_strings)),
                   std::to_string(section.size() - strings_at) + " bytes of strings", "a multiple of 8");
}

void class_walk::walk_attributes() {
    attributes.walk<rsrc_pattr_t>(rc.u_rc_pattrsC, rc.rc_num_pattrsC, "rsrc_pattr_t", CDB_ID_PATTR_C);
    attributes.walk<rsrc_dattr_t>(rc.u_rc_dattrsC, rc.rc_num_dattrsC, "rsrc_dattr_t", CDB_ID_DATTR_C);
    attributes.walk<rsrc_pattr_t>(rc.u_rc_pattrs, rc.rc_num_pattrs, "rsrc_pattr_t", CDB_ID_PATTR);
    attributes.walk<rsrc_dattr_t>(rc.u_rc_dattrs, rc.rc_num_dattrs, "rsrc_dattr_t", CDB_ID_DATTR);
}

void class_walk::walk_actions(const cdb_ref_t &table, std::size_t count, vx_uint32_t id) {
    std::size_t offset = table.offset[0];
    count = count_inside(section, offset, count, sizeof(rsrc_action_t));
    location place = {at.section, "rsrc_action_t", 0, at.offset + offset};
    for (; place.index < count; ++place.index, offset += sizeof(rsrc_action_t), place.offset += sizeof(rsrc_action_t)) {
        out.visit<rsrc_action_t>(place, section, offset);
        out.expect_id(place, fields_of<rsrc_action_t>.front().name, section.number<vx_uint32_t>(offset), id);
        references.follow(place, section, offset, leading_fields_of<rsrc_action_t>, VX_UNKNOWN);
    }
}

/* The compiler writes no such records, so their identifiers are not known. */
void class_walk::walk_errors() {
    std::size_t offset = rc.u_rc_errors.offset[0];
    std::size_t count = count_placed(section, rc.u_rc_errors, rc.rc_num_errors, sizeof(rsrc_error_t));
    location place = {at.section, "rsrc_error_t", 0, at.offset + offset};
    for (; place.index < count; ++place.index, offset += sizeof(rsrc_error_t), place.offset += sizeof(rsrc_error_t)) {
        out.visit<rsrc_error_t>(place, section, offset);
        references.follow(place, section, offset, leading_fields_of<rsrc_error_t>, VX_UNKNOWN);
    }
}

void class_walk::walk_depends() {
    std::size_t offset = rc.u_rc_depends.offset[0];
    std::size_t count = count_placed(section, rc.u_rc_depends, rc.rc_num_depends, sizeof(rsrc_depend_t));
    location place = {at.section, "rsrc_depend_t", 0, at.offset + offset};
    for (; place.index < count; ++place.index, offset += sizeof(rsrc_depend_t), place.offset += sizeof(rsrc_depend_t))
        out.visit<rsrc_depend_t>(place, section, offset);
}

/* References that may have no meaning are decided when everything with a certain owner has been claimed. */
void class_walk::run() {
    out.visit<rsrc_class_t>(at, section, 0);
    out.expect_id(at, fields_of<rsrc_class_t>.front().name, rc.rc_cb_ID, CDB_ID_CLASS);
    check_tables();
    walk_attributes();
    references.names_may_be_unset = true;
    references.follow(at, section, 0, leading_fields_of<rsrc_class_t>, VX_UNKNOWN);
    references.names_may_be_unset = false;
    walk_actions(rc.u_rc_actionsC, rc.rc_num_actionsC, CDB_ID_ACTION_C);
    walk_actions(rc.u_rc_actions, rc.rc_num_actions, CDB_ID_ACTION);
    walk_errors();
    walk_depends();
    references.texts.finish();
    attributes.decide_doubtful();
    references.values.finish_empty_binaries();
    references.report_unreached();
}

} // namespace

void walk_class(reporter &out, const location &at, const bytes &section, bool is_last,
                std::vector<var_id_t> &dynamic_ids) {
    resource_class walked(section);
    class_walk(out, at, walked, is_last, dynamic_ids).run();
}

} // namespace cdb
