/* writer.h: writes names, facts and values for people. */
#ifndef CDGEN_COMPARE_WRITER_H
#define CDGEN_COMPARE_WRITER_H

#include "compare/node.h"

#include <cstdint>
#include <functional>
#include <stdexcept>
#include <string>

namespace compare {

/* Thrown for forged databases in which so many references lead to the same texts that the output would be far larger
 * than the databases. */
struct too_entangled : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/* How much may be written about databases.
 *
 * In a database that was compiled each long text has one owner, so all of them together are no larger than the file. In
 * a forged one, many references may lead to one text, and a record with a long name may have many parts. */
class allowance {
public:
    /* size: of the databases together, in bytes. */
    explicit allowance(std::size_t size);

    /* Counts a long text. Throws too_entangled if it exceeds the rest of the allowance. length: in bytes. */
    void spend(std::size_t length);

private:
    std::uint64_t left; /* on 32-bit machines too */
};

/* Writes values for people: 5, 0.1, 'text', 0x0102, [1, 2], {Int32 0}, nothing, misplaced 5. Its functions throw
 * too_entangled if the allowance is exceeded. */
class writer {
public:
    using taker = std::function<void(std::string_view)>;

    /* size: of the databases together, in bytes. The output is passed to `to` in pieces. */
    writer(std::size_t size, taker to);

    void write(std::string_view plain) const {
        take(plain);
    }
    void write_value(const owned_value &value);
    void write_fact(const fact &f);
    /* Writes the name of a record, or what identifies an entry of a list. Writes nothing for a record without a name.
     */
    void write_name(const node &n);

private:
    void write_text(std::string_view text);
    void write_bytes(std::string_view bytes);
    void write_elements(const owned_value &value, std::size_t count);
    void write_valid_value(const node &n);

    allowance left;
    taker take;
};

std::string text_of(const fact &f);
std::string name_of(const node &n);
bool has_name(const node &n);

} // namespace compare

#endif
