/* dump.h: the parts that the forms of `cdef dump` share: the facts of a database, their texts, and the interface of a
 * form, which is a sink for facts. */
#ifndef CDGEN_CDEF_DUMP_H
#define CDGEN_CDEF_DUMP_H

#include "cdef/support/facts.h"
#include "cdef/support/input.h"
#include "format/records.h"

#include <array>

namespace cdef::dump {

/* ---- Facts ----------------------------------------------------------------------------------------------------- */

using facts::any_text;
using facts::binary;
using facts::bits;
using facts::checksum;
using facts::fact;
using facts::fact_of;
using facts::named;
using facts::named_bits;
using facts::none;
using facts::word;

/* The text of a fact in the listing: one line, without bytes that could control a terminal. */
void append(std::string &to, const fact &f);
std::string as_text(const fact &f);

/* ---- Fields ---------------------------------------------------------------------------------------------------- */

/* The number in a field of an area. */
std::uint32_t number_in(const cdb::bytes &area, std::size_t at, const cdb::field &f);

/* The data type that a record has for its values; VX_UNKNOWN if it has none. */
vx_data_type_t data_type_in(const cdb::record_format &format, const cdb::bytes &area, std::size_t at);

/* The list table that a reference leads into. The reference must not have another target. */
const cdb::bytes &lists_of(const cdb::class_tables &tables, cdb::target to);

/* ---- Forms ----------------------------------------------------------------------------------------------------- */

/* The names of a fact or of a group of facts. */
struct label {
    std::string_view key;   /* in JSON; not used in a list */
    std::string_view title; /* in the listing; empty: not shown there */
};

/* Receives the facts of a database in their order. Groups may be nested; the members of a list are facts or groups
 * without keys. */
class sink {
public:
    sink() = default;
    sink(const sink &) = delete;
    sink &operator=(const sink &) = delete;
    virtual ~sink() = default;

    virtual void open(const label &group) = 0;
    virtual void open_list(const label &list) = 0;
    virtual void close() = 0;
    virtual void add(const label &what, const fact &f) = 0;
};

/* Each shows a whole database on standard output; throws failure if that fails. */
void show_listing(const input &in, const readability &found, bool with_offsets, bool coloured);
void show_json(const input &in, const readability &found, bool with_offsets);
void show_hex(const input &in);

/* Passes all facts of a readable database to a sink. */
void walk(const cdb::database &db, const readability &found, sink &to, bool with_offsets);

} // namespace cdef::dump

#endif
