/* view.h: the read-only view of a check that warnings and notes have. */
#ifndef CDGEN_CHECK_VIEW_H
#define CDGEN_CHECK_VIEW_H

#include "check/compilation.h"
#include "check/current_line.h"
#include "check/findings.h"
#include "check/known.h"

#include <algorithm>
#include <string>
#include <string_view>

namespace check {

struct view {
    /* ---- The attribute of the current line, once the compiler has taken it. */
    const table_attrs &attr() const {
        return *compiler.latest().attr;
    }
    place value_place() const {
        return part_of_value(0, compiler.latest().length);
    }
    place part_of_value(size_t offset, size_t length) const {
        return line.part_of(compiler.latest(), offset, length);
    }
    bool is_quoted() const {
        size_t begin = line.column_of(compiler.latest().value) - 1;
        return begin > 0 && line.raw[begin - 1] == '"';
    }
    std::string_view value() const {
        return line.raw.substr(line.column_of(compiler.latest().value) - 1, compiler.latest().length);
    }
    /* The text after the value, if it is a comment without a blank before it, which may have been meant as text. */
    std::string_view comment_at_value() const {
        place value = value_place();
        std::string_view rest = line.raw.substr(std::min(value.column - 1 + value.length, line.raw.size()));
        bool comment = rest.starts_with('#') || rest.starts_with("//") || rest.starts_with("/*");
        return comment ? rest.substr(0, rest.find_last_not_of(" \t\r") + 1) : std::string_view();
    }
    mention value_mention() const {
        return {value_place(), std::string(value()), std::string(line.raw)};
    }
    place name_place() const {
        return line.marked(mark_kind::name, compiler.latest());
    }
    place text_place() const {
        return line.marked(mark_kind::text, compiler.latest());
    }

    /* Reported so far. */
    size_t errors() const {
        return found.errors();
    }

    const compilation &compiler;
    const current_line &line;
    const knowledge &known;
    const findings &found;
};

} // namespace check

#endif
