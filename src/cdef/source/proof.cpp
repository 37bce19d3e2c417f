/* proof.cpp: proves that a source gives the database that it was made from. */

#include "cdef/source/proof.h"

#include "build/image.h"
#include "cdef/source/error.h"
#include "compare/compare.h"
#include "compare/writer.h"
#include "reader/owners.h"
#include "text/shown.h"

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

} // namespace

proof::proof(const std::string &named_after, const cdb::database &database, const cdb::ownership &ownership)
    : db(database), owners(ownership),
      compiler(std::make_unique<stepwise_compiler>("source", named_after.c_str(), observer)) {}

/* The details of a failure may belong to the compiler, so its words are kept. */
template <class Step> void proof::attempt(Step step) {
    try {
        if (!failure)
            step();
    } catch (const fatal_exit &exit) {
        failure = words_of_failure(exit);
    }
}

void proof::take(std::string_view lines) {
    attempt([&] { compiler->take_lines(lines); });
}

/* The image is in memory that takes pages only as they are written, while the compiler gives back its tables. */
void proof::require_equal() {
    std::unique_ptr<std::byte, free_memory> memory;
    std::span<std::byte> image;
    attempt([&] {
        compiler->take_end();
        std::size_t size = compiler->size_image();
        memory.reset(static_cast<std::byte *>(cfg_malloc(size)));
        image = compiler->image_in({memory.get(), size});
    });
    if (failure)
        no_source("database", "its source would not compile: " + *failure);
    require_same_meaning(image);
}

/* The first difference ends the comparison. Most databases come back byte for byte, which is quickly seen. */
void proof::require_same_meaning(std::span<const std::byte> image) const {
    if (build::is_same_but_time(image, db.file().raw()))
        return;
    cdb::database again(image);
    cdb::ownership owners_again = cdb::owners_in(again);
    compare::compare({db, owners}, {again, owners_again},
                     [](const difference &d) { no_source(place_of(d), why_of(d)); });
}

} // namespace cdef::source
