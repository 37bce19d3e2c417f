/* source.h: from a database back to a source. In four steps: what no source can say is refused (check), lines and
 * values are given a text that reads back (text), the order of stanzas and what hangs on it is worked out (plan), and
 * the stanzas are written. */
#ifndef CDGEN_CDEF_SOURCE_H
#define CDGEN_CDEF_SOURCE_H

#include "compare/compare.h"

#include <array>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace cdef {

/* ---- Check (check.cpp) ----------------------------------------------------------------------------- */

/* Throws trouble: what cannot be written, and why. */
[[noreturn]] void no_source(const std::string &what, const std::string &why);

/* Throws trouble unless the database has the sections, and each record of them only the plain fields, that a source
 * can make. */
void require_settable(const cdb::database &db);

/* "DynamicClassAttribute 'X'", for messages. */
std::string place_of(std::string_view kind, std::string_view name);

/* ---- Text (text.cpp) ------------------------------------------------------------------------------- */

/* The line that gives an attribute a value, without its newline; nothing if no line does. */
std::optional<std::string> attribute_line(std::string_view name, std::string_view value);

/* The texts of a value that are worth trying, the best one first; none if it has no text. Their values are the same,
 * but one may fit into a line where another does not. in_pair: nothing in the text may be a comma. */
std::vector<std::string> texts_of(const cdb::value &value, bool in_pair);

/* What the compiler gives an attribute of the value's type without a line that says otherwise. */
bool is_default(const cdb::value &value);

/* Source text in the making. */
class source_writer {
public:
    /* Each line of the text becomes a comment. Short words only: a line is not broken. */
    void comment(std::string_view text);
    void blank_line();
    /* place: for messages. */
    void stanza(std::string_view kind, std::string place);
    void line(std::string_view name, std::string_view value);
    void line(std::string_view name, std::int64_t number);
    void optional_line(std::string_view name, std::int64_t number, std::int64_t without);
    /* The first of several texts for which there is a line. */
    void line_of_any(std::string_view name, const std::vector<std::string> &values);

    std::string text;

private:
    std::string current; /* place of the stanza */
};

/* ---- Plan ------------------------------------------------------------------------------------------------------ */

/* The stanza of a record, or a run of SD stanzas for an input of the class. */
struct step {
    table from;
    std::size_t index;

    bool operator==(const step &) const = default;
};

/* The inputs of a class, by their index in steps. */
struct class_input {
    std::string_view stanza;
    cdb_ref_t rsrc_class_t::*reference;
};
extern const std::array<class_input, 5> class_inputs;

/* What has to be known of a dynamic attribute before its stanza is written. */
struct dynamic_plan {
    std::string variable_class; /* empty: none */
    std::string range;          /* the value of a Range line; empty: no line */
};

struct class_plan {
    class_plan(const cdb::resource_class &of, const cdb::ownership &ownership) : view(of), owners(&ownership) {}

    cdb::resource_class view;
    const cdb::ownership *owners;
    bool is_last = false;
    std::vector<step> order;
    bool ends_in_run = false;                         /* the last step's run of SD stanzas ends the file */
    std::array<std::vector<dynamic_plan>, 2> dynamic; /* by level */

    std::vector<dynamic_plan> &of(cdb::level level) {
        return dynamic[static_cast<std::size_t>(level)];
    }
    const std::vector<dynamic_plan> &of(cdb::level level) const {
        return dynamic[static_cast<std::size_t>(level)];
    }
    std::size_t count(table of_records) const;
    /* Whether a field of an attribute leads to what is the attribute's own. */
    bool owns(const step &attribute, std::size_t field_offset) const;
    /* A class that follows in the source ends this one while the last attribute of each kind is still open: it is
     * written as it is, without the checks and defaults of its completion. */
    bool is_cut_short(const step &s) const {
        return !is_last && s.from < table::class_actions && s.index + 1 == count(s.from);
    }
};

/* The order of the stanzas: that of the source the database was made from, as far as it shows. (order.cpp)
 */
void plan_order(class_plan &plan);

/* Range lines that leave every dynamic attribute with its bounds. Throws trouble if there are none.
 * (range.cpp) */
void plan_ranges(std::vector<class_plan> &classes);

/* The variable class that each dynamic attribute names. Throws trouble if the lists of IDs cannot be had that way.
 * (groups.cpp) */
void plan_variable_classes(std::vector<class_plan> &classes, const cdb::database &db);

/* ---- Stanzas (stanza.cpp, structure.cpp) ------------------------------------------------ */

/* All required lines can be given. Only then may optional ones follow. */
template <class Record> bool is_complete(const cdb::attribute<Record> &attr) {
    return attr.type() != VX_UNKNOWN && !attr.varieties().empty();
}

void write_steps(source_writer &out, const class_plan &plan);

/* The runs of SD stanzas of an attribute. */
struct attribute_structure {
    std::string_view stanza;       /* of the run */
    std::string_view other_stanza; /* of a run that it replaces */
    cdb::sd_definition definition;
    cdb::value value;
    std::uint16_t highest_index;
    bool ends_file;
};
void write_structure(source_writer &out, const attribute_structure &s, const std::string &place);
/* A run of SD stanzas, for an action or the class. */
void write_run(source_writer &out, std::string_view stanza, const cdb::sd_definition &definition,
               const std::string &place);
void write_valid_values(source_writer &out, std::string_view name, const cdb::valid_value_list &values);
/* Whether a value can only come from a run that ends the file. */
bool comes_too_late(const cdb::sd_definition &definition, const cdb::value &value, std::uint16_t highest_index);

} // namespace cdef

#endif
