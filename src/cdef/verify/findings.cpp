/* findings.cpp: findings as text and as JSON. */

#include "cdef/verify/findings.h"

#include "text/append.h"
#include "text/shown.h"

#include <charconv>
#include <cstdint>
#include <string_view>
#include <utility>

namespace cdef::verify {

static const char *name_of(cdb::severity level) {
    return level == cdb::severity::error ? "error" : "warning";
}

std::string place_of(const cdb::finding &f) {
    std::string place = "file";
    if (f.section)
        place = "section " + std::to_string(*f.section);
    if (!f.record.empty())
        place += ", " + std::string(f.record) + " " + std::to_string(f.index);
    if (!f.field.empty())
        place += ", " + std::string(f.field);
    return place;
}

std::string sentence_of(const cdb::finding &f) {
    std::string text = place_of(f);
    text::appendf(text, " at offset %zu: %s: found %s, expected %s", f.offset, std::string(f.broken->title).c_str(),
                  f.found.c_str(), f.expected.c_str());
    return text;
}

std::string line_of(const std::string &file, const cdb::finding &f) {
    return text::escaped(file) + ": " + name_of(f.broken->level) + ": " + sentence_of(f) + " [" +
           std::string(f.broken->code) + "]\n";
}

std::string json_value(const std::string &shown) {
    bool hexadecimal = shown.starts_with("0x");
    std::string_view digits = std::string_view(shown).substr(hexadecimal ? 2 : 0);
    std::uint64_t number = 0;
    auto [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), number, hexadecimal ? 16 : 10);
    if (error == std::errc() && end == digits.data() + digits.size())
        return std::to_string(number);
    std::string value;
    report::append_json(value, shown);
    return value;
}

std::vector<cdb::diagnosed> errors_of(std::vector<cdb::diagnosed> &&all) {
    std::vector<std::size_t> place(all.size());
    std::vector<cdb::diagnosed> errors;
    for (std::size_t i = 0; i < all.size(); ++i) {
        if (all[i].found.broken->level == cdb::severity::warning)
            continue;
        place[i] = errors.size();
        std::size_t cause = all[all[i].cause].found.broken->level == cdb::severity::error ? all[i].cause : i;
        errors.push_back({std::move(all[i].found), place[cause]});
    }
    return errors;
}

std::size_t consequences_of(const std::vector<cdb::diagnosed> &all, std::size_t cause) {
    std::size_t next = cause + 1;
    while (next < all.size() && all[next].cause != next)
        ++next;
    return next - cause - 1;
}

std::string count_of(std::size_t consequences) {
    return consequences == 1 ? "1 finding follows from this one"
                             : std::to_string(consequences) + " findings follow from this one";
}

std::string note_of(const std::string &file, std::size_t consequences) {
    return text::escaped(file) + ": note: " + count_of(consequences) + "; --all shows " +
           (consequences == 1 ? "it\n" : "them\n");
}

std::string note_of_many(const std::string &file, std::size_t count) {
    return text::escaped(file) + ": note: " + std::to_string(count) +
           " findings, too many to say which follow from which others\n";
}

void add_finding(report::json_writer &to, const cdb::diagnosed &each, std::size_t at) {
    const cdb::finding &f = each.found;
    to.open_object();
    to.add_text("code", f.broken->code);
    to.add_text("severity", name_of(f.broken->level));
    to.add_text("title", f.broken->title);
    if (f.section)
        to.add_number("section", *f.section);
    else
        to.add_null("section");
    to.add_text("record", f.record);
    to.add_number("index", f.index);
    to.add_text("field", f.field);
    to.add_number("offset", f.offset);
    to.add_json("found", json_value(f.found));
    to.add_json("expected", json_value(f.expected));
    if (each.cause == at)
        to.add_null("cause");
    else
        to.add_number("cause", each.cause);
    to.close();
}

} // namespace cdef::verify
