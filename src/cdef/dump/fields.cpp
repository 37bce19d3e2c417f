/* fields.cpp: the places of fields, and of the lists that they lead to. */

#include "cdef/dump/dump.h"

namespace cdef::dump {

std::uint32_t number_in(const cdb::bytes &area, std::size_t at, const cdb::field &f) {
    bool is_short = f.width == sizeof(std::uint16_t);
    return is_short ? area.number<std::uint16_t>(at + f.offset) : area.number<std::uint32_t>(at + f.offset);
}

vx_data_type_t data_type_in(const cdb::record_format &format, const cdb::bytes &area, std::size_t at) {
    return format.type == nullptr ? VX_UNKNOWN : static_cast<vx_data_type_t>(number_in(area, at, *format.type));
}

const cdb::bytes &lists_of(const cdb::class_tables &tables, cdb::target to) {
    return to == cdb::target::variety_lists ? tables.variety_lists
           : to == cdb::target::valid_vals  ? tables.valid_vals
                                            : tables.sd_defs;
}

} // namespace cdef::dump
