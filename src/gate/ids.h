/* ids.h: the file of all numbers that were ever in use (ids.lock), and whether a class contradicts it. */
#ifndef CDGEN_GATE_IDS_H
#define CDGEN_GATE_IDS_H

#include "cdb_view.h"
#include "check/check.h"
#include "compare/kinds.h"
#include "gate/places.h"

#include <map>
#include <stdexcept>
#include <string>
#include <string_view>
#include <tuple>
#include <vector>

namespace gate {

/* The use of a number: the attribute or action that programs know by it. */
struct numbered {
    std::string class_name;
    compare::node_kind kind;
    vx_int32_t number = 0;
    std::string name;
    std::string type; /* of an attribute's values; "-" for an action */

    friend bool operator==(const numbered &, const numbered &) = default;
};

/* All of a database, which is sound. */
std::vector<numbered> numbers_of(const cdb::database &db);

struct ids_rule {
    std::string_view code; /* permanent */
    std::string_view name; /* of a warning; empty for an error */
    std::string_view title;
    std::string_view cause;
    std::string_view cure;
};

/* Used again for another name, kind or type, and not recorded, which is a warning. */
enum class ids_breach : std::uint8_t { NAME, KIND, TYPE, UNRECORDED };
const ids_rule &rule_of(ids_breach b);
std::span<const ids_rule> ids_rules();

/* A line that is wrong; the text says which one. */
struct wrong_ids : std::runtime_error {
    using std::runtime_error::runtime_error;
};

class id_record {
public:
    id_record() = default;
    /* Reads a file. Throws wrong_ids. */
    explicit id_record(std::string_view text);

    /* The file: a line for each number, in a fixed order. */
    std::string text() const;

    /* How a database contradicts the file, as findings with places in its source. */
    std::vector<check::finding> judge(const std::vector<numbered> &of, const source_places &places) const;

    /* Records numbers; they replace what was recorded for the same numbers. */
    void accept(const std::vector<numbered> &of);

private:
    /* Persistent and dynamic attributes of resources share their numbers, and so do those of the class. */
    using key = std::tuple<std::string, compare::node_kind, vx_int32_t>;
    static key key_of(const numbered &of);
    void add(std::string_view line, std::size_t line_number);

    std::map<key, numbered> known;
};

} // namespace gate

#endif
