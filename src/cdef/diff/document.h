/* document.h: differences as JSON. docs/diff.md has the members. */
#ifndef CDGEN_CDEF_DIFF_DOCUMENT_H
#define CDGEN_CDEF_DIFF_DOCUMENT_H

#include "cdef/diff/typed.h"
#include "compare/compare.h"
#include "report/json_writer.h"

namespace cdef::diff {

using reasons = std::vector<const compare::breach_rule *>;

class document {
public:
    /* size: of both databases, in bytes. */
    document(report::output out, std::size_t size) : to(std::move(out)), values(size) {}

    /* The names of the databases as given on the command line. */
    void begin(const std::string &before, const std::string &after);
    /* why: empty if reasons are not shown. */
    void add(const compare::difference &d, const reasons &why);
    /* A class of the second database has a lower version. */
    void mention_version(const compare::difference &d);
    void mention_order(std::endian before, std::endian after);
    void end();

private:
    void add_path(const compare::difference &d);
    void add_change(const compare::difference &d);
    void add_reasons(const reasons &why);

    report::json_writer to;
    typed_values values;
    std::vector<std::string> mentions; /* each an object */
};

} // namespace cdef::diff

#endif
