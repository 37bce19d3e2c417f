/* json_writer.h: writes JSON piece by piece, so that a long document need not be in memory as a whole. */
#ifndef CDGEN_REPORT_JSON_WRITER_H
#define CDGEN_REPORT_JSON_WRITER_H

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace report {

/* Receives the text that is to be shown. */
using output = std::function<void(std::string_view)>;

/* Appends a text as a JSON string, in ASCII only. Bytes that are not UTF-8 (a file's name may have some) become U+FFFD.
 */
void append_json(std::string &to, std::string_view text);

/* Writes indented JSON, with a newline at the end of the document. Everything is in an object or a list; the first one
 * is the document. In a list, keys are ignored. */
class json_writer {
public:
    explicit json_writer(output written_to) : to(std::move(written_to)) {}

    void open_object(std::string_view key = {}) {
        open(key, '{', '}');
    }
    void open_list(std::string_view key = {}) {
        open(key, '[', ']');
    }
    /* Closes the innermost object or list. */
    void close();

    void add_text(std::string_view key, std::string_view text);
    void add_number(std::string_view key, std::uint64_t number);
    void add_truth(std::string_view key, bool is);
    void add_null(std::string_view key);
    /* Adds a value that already is JSON. */
    void add_json(std::string_view key, std::string_view value);

    /* Adds either all of these members or none: if an exception ends the function, what it has added is removed. */
    void add_whole(const std::function<void()> &members);

    /* Adds the members that say which schema a document follows: a file that is installed, and its version. */
    void add_schema(std::string_view file, unsigned version);

private:
    struct level {
        char end;
        bool is_empty = true;
    };

    void open(std::string_view key, char start, char end);
    /* Where the next member of the innermost level goes. */
    void next(std::string_view key);
    void new_line();

    void write_out();

    output to;
    std::string text; /* not yet written */
    std::vector<level> levels;
    bool is_held = false; /* true: nothing is written out, because it may have to be removed */
};

} // namespace report

#endif
