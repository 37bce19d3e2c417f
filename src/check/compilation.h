/* compilation.h: the compiler as a check drives it, and which of its stanzas are broken. */
#ifndef CDGEN_CHECK_COMPILATION_H
#define CDGEN_CHECK_COMPILATION_H

#include "check/known.h"
#include "compiler/stepwise.h"
#include "language/suggestions.h"

#include <string>

namespace check {

/* The words of an error, as the compiler prints them. */
std::string text_of(const fatal_exit &failure);

class compilation : private line_observer, public stepwise_compiler {
public:
    /* The names must outlive this object. output: the name after which a class without a Name is named; null if it is
     * not known and any name will do. */
    compilation(const char *source, const char *output)
        : stepwise_compiler(source, output == nullptr ? CLASS_NAME : output, *this), source_name(source),
          output_name(output) {}

    const char *name() const {
        return source_name;
    }
    const char *output() const {
        return output_name;
    }

    /* Takes an attribute line. Throws fatal_exit. */
    void take_attribute(const attr_text &text) {
        attribute = {};
        take_line(text);
    }
    /* The attribute of the latest line, if the compiler came so far. */
    const attr_place &latest() const {
        return attribute;
    }

    /* ---- The latest stanza of a kind */

    /* Required attributes that it has not given. */
    language::name_list missing(int kind) const;
    bool is_complete(int kind) const {
        return required_seen(kind) == table_of(kind).req_mask_cmplt;
    }
    /* That is an element. */
    bool has_index(int kind) const;

    /* An error of it has been reported, so nothing is reported as missing in it. */
    bool is_broken(int kind) const {
        return broken.test(index_of(kind));
    }
    bool any_broken() const {
        return broken.any();
    }
    void set_broken(int kind, bool is = true) {
        broken.set(index_of(kind), is);
    }

private:
    static constexpr const char *CLASS_NAME = "class.cdef";

    void attribute_read(const table_attrs &attr, std::string_view value) override {
        attribute = {&attr, value.data(), value.size()};
    }
    bool excuses_missing(int kind) const override {
        return is_broken(kind);
    }

    const char *source_name;
    const char *output_name;
    attr_place attribute;
    kind_set broken;
};

} // namespace check

#endif
