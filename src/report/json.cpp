/* json.cpp: findings as JSON. docs/check.md describes it, and schema/cdef-check.schema.json is its schema. */

#include "report/places.h"
#include "report/report.h"

namespace report {

namespace {

using check::place;

void add_number_or_null(json_writer &to, std::string_view key, size_t number) {
    if (number == 0)
        to.add_null(key);
    else
        to.add_number(key, number);
}

/* Adds the place in the file if it differs from the compiler's line and column. */
void add_physical(json_writer &to, const place &at) {
    if (line_in_file(at) == static_cast<size_t>(at.line))
        return;
    to.add_number("physical_line", line_in_file(at));
    if (at.column == 0)
        to.add_null("physical_column");
    else
        to.add_number("physical_column", at.file_column);
}

/* source: the text of the place's line, in which characters are counted; empty if it is not known. */
void add_place(json_writer &to, const place &at, std::string_view source) {
    constexpr const char *keys[] = {"column", "length", "character_column", "character_length"};
    add_number_or_null(to, "line", static_cast<size_t>(at.line));
    if (at.column == 0) {
        for (const char *key : keys)
            to.add_null(key);
        add_physical(to, at);
        return;
    }
    character_range in_characters = characters_of(at, source);
    const size_t numbers[] = {at.column, at.length, in_characters.column, in_characters.length};
    for (size_t i = 0; i < std::size(keys); ++i)
        to.add_number(keys[i], numbers[i]);
    add_physical(to, at);
}

void add_fix(json_writer &to, const check::correction &fix) {
    if (fix.edits.empty())
        return to.add_null("fix");
    to.open_object("fix");
    to.add_text("certainty", name_of(fix.sure));
    to.open_list("edits");
    for (const check::edit &made : fix.edits) {
        to.open_object();
        to.add_number("line", static_cast<size_t>(made.line));
        to.add_number("column", made.column);
        to.add_number("character_column", made.character);
        to.add_text("removed", made.removed);
        to.add_text("inserted", made.text);
        to.close();
    }
    to.close();
    to.close();
}

class json_writer_of_findings : public writer {
public:
    explicit json_writer_of_findings(output written_to) : to(std::move(written_to)) {
        to.open_object();
        to.add_schema("cdef-check.schema.json", 1);
        to.open_list("sources");
    }
    void begin_source(const std::string &file) override {
        to.open_object();
        to.add_text("file", file);
        to.open_list("findings");
    }
    void add(const check::finding &found) override {
        to.add_whole([&] { add_members(found); });
    }
    void end_source(const check::totals &count) override {
        to.close();
        add_counts(count);
        if (!unwritten.empty())
            add_unwritten();
        to.close();
        all.errors += count.errors;
        all.warnings += count.warnings;
    }
    void fail_source(const std::string &why) override {
        to.close();
        to.add_text("unreadable", why);
        to.close();
    }
    void fail_output(const std::string &why) override {
        unwritten.push_back(why);
    }
    void close() override {
        to.close();
        add_counts(all);
        to.close();
    }

private:
    void add_members(const check::finding &found) {
        to.open_object();
        to.add_text("code", found.code);
        to.add_text("severity", found.error ? "error" : "warning");
        to.add_text("name", found.name);
        to.add_text("message", found.text);
        add_place(to, found.at, found.source);
        to.add_text("source", found.source);
        to.open_list("notes");
        for (const check::note &more : found.notes) {
            to.open_object();
            to.add_text("message", more.text);
            add_place(to, more.at, source_of(more, found));
            to.close();
        }
        to.close();
        add_fix(to, found.fix);
        to.close();
    }

    void add_unwritten() {
        to.open_list("unwritten");
        for (const std::string &why : unwritten)
            to.add_text({}, why);
        to.close();
        unwritten.clear();
    }

    void add_counts(const check::totals &count) {
        to.add_number("errors", count.errors);
        to.add_number("warnings", count.warnings);
    }

    json_writer to;
    check::totals all;
    std::vector<std::string> unwritten; /* why files made from the source could not be written */
};

} // namespace

std::unique_ptr<writer> json_form(output to) {
    return std::make_unique<json_writer_of_findings>(std::move(to));
}

} // namespace report
