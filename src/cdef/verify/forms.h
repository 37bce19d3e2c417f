/* forms.h: findings in databases, in the forms that people and other programs read. */
#ifndef CDGEN_CDEF_VERIFY_FORMS_H
#define CDGEN_CDEF_VERIFY_FORMS_H

#include "reader/diagnosis.h"

#include <memory>
#include <string>
#include <vector>

namespace cdef::verify {

/* Shows the findings in each database. */
class form {
public:
    form() = default;
    form(const form &) = delete;
    form &operator=(const form &) = delete;
    virtual ~form() = default;

    virtual void begin_file(const std::string &name, bool sound) = 0;
    virtual void add(const std::vector<cdb::diagnosed> &findings) = 0;
    /* Used instead if there are too many findings to look for causes: says so, and each finding is added separately. */
    virtual void begin_many(std::size_t count) = 0;
    virtual void add_one(const cdb::finding &found) = 0;
    virtual void end_file() = 0;
    virtual void add_unreadable(const std::string &name, const std::string &why) = 0;
    virtual void close() = 0;
};

/* All are written to standard output. JSON and SARIF are complete; in the others consequences are counted, unless all
 * findings are wanted. */
std::unique_ptr<form> text_form(bool with_consequences);
std::unique_ptr<form> json_form();
std::unique_ptr<form> sarif_form();
std::unique_ptr<form> github_form(bool with_consequences);
std::unique_ptr<form> gitlab_form(bool with_consequences);

} // namespace cdef::verify

#endif
