/* writer.h: the text of a source in the making. */
#ifndef CDGEN_CDEF_SOURCE_WRITER_H
#define CDGEN_CDEF_SOURCE_WRITER_H

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace cdef::source {

/* What no line can say throws no_source_error. */
class source_writer {
public:
    /* Each line of the text becomes a comment. Lines are not broken: they must be short. */
    void comment(std::string_view text);
    void blank_line();
    /* place: what messages about its lines name. */
    void stanza(std::string_view kind, std::string place);
    void line(std::string_view name, std::string_view value);
    void line(std::string_view name, std::int64_t number);
    /* No line for the number that the compiler gives without one. */
    void optional_line(std::string_view name, std::int64_t number, std::int64_t without);
    /* Writes the first of several texts for which there is a line. */
    void line_of_any(std::string_view name, const std::vector<std::string> &values);

    std::string text;

private:
    std::string current; /* place of the stanza */
};

} // namespace cdef::source

#endif
