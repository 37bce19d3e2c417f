/* proof.cpp: proves that a source gives the database that it was made from. */

#include "cdef/source/proof.h"

#include "build/image.h"
#include "cdef/source/error.h"
#include "compare/compare.h"
#include "compare/writer.h"
#include "compiler/stepwise.h"
#include "reader/owners.h"
#include "text/shown.h"

#include <memory>
#include <vector>

namespace cdef::source {

namespace {

using compare::change;
using compare::difference;
using compare::node;

std::string words_of_failure(const fatal_exit &failure) {
    std::string words = failure.line == 0 ? "" : "line " + std::to_string(failure.line) + ": ";
    for (const char *part : words_of(failure))
        words += part;
    return text::escaped(words);
}

/* The details of a failure may belong to the compiler, so they are read while it exists. */
std::vector<std::byte> compiled(std::string_view text, const std::string &output) {
    no_observer observer;
    auto compiler = std::make_unique<stepwise_compiler>("source", output.c_str(), observer);
    try {
        compiler->take_source(text);
        return compiler->image();
    } catch (const fatal_exit &failure) {
        no_source("database", "its source would not compile: " + words_of_failure(failure));
    }
}

/* "DynamicResourceAttribute 'A'": the innermost record or list entry that a difference is about. */
std::string place_of(const difference &d) {
    const node &innermost = *d.path.back();
    return std::string(innermost.label()).append(has_name(innermost) ? " " : "").append(name_of(innermost));
}

std::string why_of(const difference &d) {
    if (d.what == change::REMOVED || d.what == change::RENAMED)
        return "compiled again, it would be gone";
    if (d.what == change::ADDED)
        return "compiled again, it would be new";
    return "compiled again, its " + std::string(d.before->what->label()) + " would be " + text_of(*d.after) + ", not " +
           text_of(*d.before);
}

/* The first difference ends the comparison. Most databases come back byte for byte, which is quickly seen. */
void require_same_meaning(const std::vector<std::byte> &image, const cdb::database &db, const cdb::ownership &owners) {
    if (build::is_same_but_time(image, db.file().raw()))
        return;
    cdb::database again(image);
    cdb::ownership owners_again = cdb::owners_in(again);
    compare::compare({db, owners}, {again, owners_again},
                     [](const difference &d) { no_source(place_of(d), why_of(d)); });
}

} // namespace

void require_equal(std::string_view text, const std::string &output, const cdb::database &db,
                   const cdb::ownership &owners) {
    require_same_meaning(compiled(text, output), db, owners);
}

} // namespace cdef::source
