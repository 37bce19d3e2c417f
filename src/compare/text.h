/* text.h: texts and values as a person reads them. */
#ifndef CDGEN_COMPARE_TEXT_H
#define CDGEN_COMPARE_TEXT_H

#include "cdb_view.h"
#include "reader/ownership.h"

#include <stdexcept>

namespace compare {

/* Thrown for a database made by hand whose references lead to the same texts or values so often that writing them all
 * would fill the memory. */
struct too_entangled : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/* Writes values as a person reads them: 5, 0.1, 'text', 0x0102, [1, 2], {Int32 0}, nothing, misplaced 5.
 *
 * In a database that was compiled each value and each text has one owner, so all of them together are no larger than
 * the file. One made by hand may lead to the same ones again and again; a limit keeps that from filling the memory:
 * beyond it, every function throws too_entangled. */
class value_writer {
public:
    /* file_size: in bytes. */
    explicit value_writer(std::size_t file_size);

    /* strings: of the value's class. */
    std::string text_of(const cdb::value &value, const cdb::bytes &strings);
    std::string text_of(std::string_view text);
    /* is_own: the bound is the attribute's own. */
    std::string text_of_bound(const cdb::value &bound, bool is_own, const cdb::bytes &strings,
                              const cdb::ownership &owners);

private:
    void spend(std::size_t amount);
    std::string text_of_elements(const cdb::value &value, const cdb::bytes &strings);

    std::size_t left;
};

} // namespace compare

#endif
