/* dump.h: what the forms of `cdef dump` share: the facts that a database states, how they read as text, and the
 * sink that a form is. */
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

/* As the listing shows it, on one line and free of bytes that a terminal would act upon. */
void append(std::string &to, const fact &f);
std::string as_text(const fact &f);

/* ---- Fields ---------------------------------------------------------------------------------------------------- */

/* The number in a field of an area. */
std::uint32_t number_in(const cdb::bytes &area, std::size_t at, const cdb::field &f);

/* The data type that a record names for its values; VX_UNKNOWN if it names none. */
vx_data_type_t data_type_in(const cdb::record_format &format, const cdb::bytes &area, std::size_t at);

/* Of the list table that a reference leads into; not for other targets. */
const cdb::bytes &lists_of(const cdb::class_tables &tables, cdb::target to);

/* ---- Forms ----------------------------------------------------------------------------------------------------- */

/* How a fact or a group of them is called. */
struct label {
    std::string_view key;   /* in JSON; of no account in a list */
    std::string_view title; /* in the listing; empty: not shown there */
};

/* Takes the facts of a database in their order. Groups nest; a list's members are facts or groups without keys. */
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

/* Tells a sink all facts of a readable database. */
void walk(const cdb::database &db, const readability &found, sink &to, bool with_offsets);

} // namespace cdef::dump

#endif
