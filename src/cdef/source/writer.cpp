/* writer.cpp: writes the text of a source. */

#include "cdef/source/writer.h"

#include "cdef/source/error.h"
#include "cdef/source/text.h"
#include "text/shown.h"

namespace cdef::source {

void source_writer::comment(std::string_view lines) {
    for (std::size_t end = 0; end != std::string_view::npos;) {
        end = lines.find('\n');
        text += "# " + std::string(lines.substr(0, end)) + "\n";
        lines.remove_prefix(end == std::string_view::npos ? lines.size() : end + 1);
    }
}

void source_writer::stanza(std::string_view kind, const record_name &place) {
    flush_if_full();
    text.append("\n").append(kind).append("\n");
    current = place;
}

void source_writer::flush_if_full() {
    if (parts && text.size() >= FULL)
        flush();
}

void source_writer::flush() {
    parts(text);
    text.clear();
}

void source_writer::line(std::string_view name, std::string_view value) {
    if (!append_attribute_line(text, name, value))
        refuse(name, value);
}

void source_writer::line(std::string_view name, std::int64_t number) {
    line(name, std::to_string(number));
}

void source_writer::optional_line(std::string_view name, std::int64_t number, std::int64_t without) {
    if (number != without)
        line(name, number);
}

void source_writer::line_of_any(std::string_view name, const std::vector<std::string> &values) {
    flush_if_full();
    for (const std::string &value : values)
        if (append_attribute_line(text, name, value))
            return;
    refuse(name, values.empty() ? std::nullopt : std::optional<std::string_view>(values.front()));
}

void source_writer::refuse(std::string_view name, std::optional<std::string_view> value) const {
    no_source(current, "no line can give its " + std::string(name) + " (" +
                           (value ? text::quoted_ascii(*value) : "a value without a text") + ")");
}

} // namespace cdef::source
