/* proof.h: proves that a source gives the database that it was made from. */
#ifndef CDGEN_CDEF_SOURCE_PROOF_H
#define CDGEN_CDEF_SOURCE_PROOF_H

#include "compiler/stepwise.h"
#include "reader/ownership.h"

#include <memory>
#include <optional>
#include <string>
#include <string_view>

namespace cdef::source {

/* Compiles a source in memory, part by part, and compares the result with the database. */
class proof {
public:
    /* named_after: the output file, after which a class without a Name is named. The name, the database and its owners
     * must stay as long as the proof. */
    proof(const std::string &named_after, const cdb::database &database, const cdb::ownership &ownership);

    /* The next part of the source, which consists of whole lines. */
    void take(std::string_view lines);
    /* After the last part. Throws no_source_error if the source does not compile, or if the result has another meaning
     * than the database. */
    void require_equal();

private:
    template <class Step> void attempt(Step step);
    void require_same_meaning(std::span<const std::byte> image) const;

    const cdb::database &db;
    const cdb::ownership &owners;
    no_observer observer;
    std::unique_ptr<stepwise_compiler> compiler;
    std::optional<std::string> failure; /* the compiler's message; nothing is compiled after it */
};

} // namespace cdef::source

#endif
