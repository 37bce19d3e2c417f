/* lines.cpp: the lines of a source and their parts, as the compiler reads them. */

#include "formatter/lines.h"

#include "compiler/cdgen_source.h"
#include "language/limits.h"

#include <algorithm>
#include <memory>

namespace formatter {

namespace {

constexpr std::string_view BLANKS = " \t";

/* The compiler's reader, for one line at a time. */
class line_reader {
public:
    /* The compiler's view of a short line: where its text begins and ends; nothing if it has no text. */
    std::string_view text_of(std::string_view whole) {
        auto end = std::copy(whole.begin(), whole.end(), buffer.begin());
        std::fill(end, end + SCAN_BLOCK, '\0');
        *end = '\n';
        places.scan(buffer.data(), whole.size() + 1);
        char *begin = buffer.data();
        attr_text text = ::text_of({.begin = begin,
                                    .end = begin + whole.size(),
                                    .read_end = begin + whole.size() + 1,
                                    .mark = begin + places.marks.distance_from(0),
                                    .marks = &places.marks,
                                    .place = 0});
        if (text.end == nullptr)
            return {};
        return whole.substr(static_cast<std::size_t>(text.name - begin),
                            static_cast<std::size_t>(text.end - text.name));
    }

private:
    std::array<char, LINE_MAX_CHARS + SCAN_BLOCK> buffer = {};
    scanned_places places;
};

std::string_view leading_blanks(std::string_view bytes) {
    return bytes.substr(0, std::min(bytes.find_first_not_of(BLANKS), bytes.size()));
}

std::string_view without_trailing_blanks(std::string_view bytes) {
    return bytes.substr(0, bytes.find_last_not_of(BLANKS) + 1);
}

bool begins_comment(std::string_view bytes) {
    return bytes.starts_with('#') || bytes.starts_with("//") || bytes.starts_with("/*");
}

line without_text(std::string_view whole) {
    std::string_view indent = leading_blanks(whole);
    std::string_view rest = whole.substr(indent.size());
    if (rest.empty())
        return {.whole = whole, .kind = line_kind::empty, .indent = indent};
    if (!begins_comment(rest))
        return {.whole = whole};
    return {.whole = whole, .kind = line_kind::comment, .indent = indent, .comment = without_trailing_blanks(rest)};
}

/* Without the blanks at its end, the line would end with a carriage return, like those of files from other systems. */
bool hides_return(std::string_view whole) {
    return !whole.ends_with('\r') && without_trailing_blanks(whole).ends_with('\r');
}

line line_of(std::string_view whole, line_reader &reader) {
    if (!is_short(whole) || whole.find('\0') != std::string_view::npos || hides_return(whole))
        return {.whole = whole};
    std::string_view text = reader.text_of(whole);
    if (text.empty())
        return without_text(whole);
    std::string_view indent = leading_blanks(whole);
    std::string_view rest = without_trailing_blanks(whole).substr(indent.size() + text.size());
    std::string_view gap = leading_blanks(rest);
    return {.whole = whole,
            .kind = indent.empty() ? line_kind::header : line_kind::attribute,
            .indent = indent,
            .text = text,
            .gap = gap,
            .comment = rest.substr(gap.size())};
}

} // namespace

bool is_short(std::string_view whole) {
    return whole.size() < LINE_MAX_CHARS;
}

std::vector<line> lines_of(std::string_view source) {
    auto reader = std::make_unique<line_reader>(); /* large */
    std::vector<line> lines;
    while (!source.empty()) {
        std::size_t length = std::min(source.find('\n'), source.size());
        lines.push_back(line_of(source.substr(0, length), *reader));
        source.remove_prefix(std::min(length + 1, source.size()));
    }
    return lines;
}

} // namespace formatter
