/* typed.h: names, facts and values of compared databases as JSON, in the forms that docs/dump.md lists. */
#ifndef CDGEN_CDEF_DIFF_TYPED_H
#define CDGEN_CDEF_DIFF_TYPED_H

#include "cdef/support/facts.h"
#include "compare/writer.h"

namespace cdef::diff {

/* Each function returns a JSON value on one line, and throws compare::too_entangled when compare::writer does. */
class typed_values {
public:
    /* size: of the databases together, in bytes. */
    explicit typed_values(std::size_t size) : left(size) {}

    std::string of_fact(const compare::fact &f);
    /* The name of a record, or what identifies an entry of a list; null for a record without a name. */
    std::string of_name(const compare::node &n);

private:
    void append(const facts::fact &f);
    void append_text(std::string_view text);
    void append_value(const compare::owned_value &value);
    void append_elements(const compare::owned_value &value, std::size_t count);
    void append_element_of_structure(const compare::owned_value &element);
    void append_pair(const compare::owned_value &low, const compare::owned_value &high);
    void append_name(const compare::node &n);

    compare::allowance left;
    std::string made;
};

/* The data type of a fact that is a value; no value for any other fact. */
std::optional<std::string_view> type_of(const compare::fact &f);

} // namespace cdef::diff

#endif
