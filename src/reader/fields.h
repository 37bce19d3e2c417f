/* fields.h: those fields of a record that the walk visits, picked from its table while compiling. */
#ifndef CDGEN_READER_FIELDS_H
#define CDGEN_READER_FIELDS_H

#include "cdb_view.h"

namespace cdb {

/* The field that starts at this offset; one must. */
constexpr const field &field_at(std::span<const field> fields, std::size_t offset) {
    return *std::find_if(fields.begin(), fields.end(), [offset](const field &f) { return f.offset == offset; });
}

template <class Record> constexpr const field &field_of(std::size_t offset) {
    return field_at(fields_of<Record>, offset);
}

/* The fields of a record that meet a condition. */
template <class Record, auto Condition> struct picked_fields {
    static constexpr std::size_t count =
        static_cast<std::size_t>(std::count_if(fields_of<Record>.begin(), fields_of<Record>.end(), Condition));
    static constexpr std::array<field, count> fields = [] {
        std::array<field, count> picked = {};
        std::copy_if(fields_of<Record>.begin(), fields_of<Record>.end(), picked.begin(), Condition);
        return picked;
    }();
};

template <class Record>
inline constexpr std::span<const field> reserved_fields_of =
    picked_fields<Record, [](const field &f) { return f.kind == field_kind::reserved; }>::fields;

/* The fields that lead to a text, a list or a value. */
template <class Record>
inline constexpr std::span<const field> leading_fields_of = picked_fields<Record, [](const field &f) {
    return f.kind == field_kind::value ||
           (f.kind == field_kind::reference && f.to != target::none && f.to != target::section);
}>::fields;

} // namespace cdb

#endif
