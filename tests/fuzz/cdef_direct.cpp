/* cdef_direct.cpp: the functions that the subcommands of cdef call, without a command line. */

#include "cdef_direct.h"

#include "captured.h"
#include "cdef/dump/dump.h"
#include "cdef/new/first_source.h"
#include "cdef/source/compose.h"
#include "cdef/source/error.h"
#include "cdef/support/failure.h"
#include "cdef/verify/findings.h"
#include "check/check.h"
#include "compare/compare.h"
#include "compare/writer.h"
#include "compiler/stepwise.h"
#include "gate/ids.h"
#include "gate/judge.h"
#include "harmless.h"
#include "report/report.h"

#include <algorithm>
#include <memory>
#include <optional>
#include <string_view>

namespace fuzz {

namespace {

bool has(const words &form, std::string_view word) {
    return std::find(form.begin(), form.end(), word) != form.end();
}

bool leaves_the_rest_readable(const cdb::finding &f) {
    return f.broken->level != cdb::severity::error || f.broken->code == cdb::CODE_CHECKSUM ||
           f.broken->code == cdb::CODE_RESERVED;
}

/* A database, and what verification says of it. */
struct judged {
    explicit judged(const bytes &image) : db(image), findings(cdb::verify(db)) {}

    bool readable() const {
        return std::all_of(findings.begin(), findings.end(), leaves_the_rest_readable);
    }
    cdb::ownership owners() const {
        std::vector<std::size_t> strays;
        for (const cdb::finding &f : findings)
            if (std::optional<std::size_t> stray = cdb::stray_of(f))
                strays.push_back(*stray);
        return {db, strays};
    }

    /* As cdef::require_readable() has it, without verifying again; of a readable database. */
    cdef::readability readability() const {
        cdef::readability known = {owners(), {}};
        for (const cdb::finding &f : findings)
            if (f.broken->level == cdb::severity::error && !known.first_of(f.broken->code))
                known.errors.push_back(f);
        return known;
    }

    cdb::database db;
    std::vector<cdb::finding> findings;
};

/* ---- Databases -------------------------------------------------------------------------------------------------- */

void show_findings(const judged &it) {
    for (const cdb::finding &f : it.findings)
        expect_harmless(cdef::verify::line_of("file", f));
}

void show_database(const bytes &image, const judged &it, const words &form) {
    cdef::input in("file", image);
    captured out(stdout);
    if (has(form, "--hex"))
        cdef::dump::show_hex(in);
    else if (has(form, "--json"))
        cdef::dump::show_json(in, it.readability(), has(form, "--offsets"));
    else
        cdef::dump::show_listing(in, it.readability(), has(form, "--offsets"), false);
    std::string shown = out.taken();
    require(!shown.empty() || image.empty(), "nothing is shown");
    expect_harmless(shown);
}

/* The source is compiled and compared before it is returned. */
void write_source(const judged &it) {
    try {
        std::string text;
        cdef::source::proven_source(it.db, it.owners()).compose([&](std::string_view part) { text += part; });
        require(!text.empty(), "an empty source");
    } catch (const cdef::source::no_source_error &e) {
        expect_harmless(e.what());
    }
}

} // namespace

void read_directly(const bytes &image, const words &form) {
    judged it(image);
    show_findings(it);
    if (form.front() == "dump" && (it.readable() || has(form, "--hex")))
        show_database(image, it, form);
    if (form.front() == "source" && it.readable())
        write_source(it);
}

void compare_directly(const bytes &before, const bytes &after) {
    judged first(before), second(after);
    if (!first.readable() || !second.readable())
        return;
    cdb::ownership was = first.owners(), is = second.owners();
    std::string shown;
    compare::writer writer(before.size() + after.size(), [&](std::string_view piece) { shown += piece; });
    try {
        compare::compare({first.db, was}, {second.db, is}, [&](const compare::difference &d) {
            require(before != after, "a file differs from itself");
            writer.write_name(*d.path.back());
            for (const compare::fact *each : {d.before, d.after})
                if (each != nullptr)
                    writer.write_fact(*each);
        });
    } catch (const compare::too_entangled &) {
        require(before != after, "a comparison without differences is refused");
    }
    expect_harmless(shown);
}

void gate_directly(const bytes &before, const bytes &after) {
    judged first(before), second(after);
    if (!first.readable() || !second.readable())
        return;
    cdb::ownership was = first.owners(), is = second.owners();
    std::size_t most = 0;
    for (compare::level each : compare::levels)
        try {
            std::vector<check::finding> found = gate::judge({{first.db, was}, {second.db, is}, ""}, each);
            require(before != after || found.empty(), "a file breaks itself");
            require(found.size() >= most, "a level finds less than those before it");
            most = found.size();
        } catch (const compare::too_entangled &) {
            require(before != after, "a comparison without differences is refused");
        }
    gate::id_record record;
    record.accept(gate::numbers_of(first.db));
    std::string text = record.text();
    require(gate::id_record(text).text() == text, "recorded numbers are read as others");
}

/* ---- Sources ---------------------------------------------------------------------------------------------------- */

namespace {

/* The compiler's message, as it is printed; empty if the source compiles. */
std::string message_of_compiler(std::string_view source, const std::string &output) {
    no_observer observer;
    auto compiler = std::make_unique<stepwise_compiler>("source", output.c_str(), observer);
    try {
        compiler->take_source(source);
        compiler->image();
    } catch (const fatal_exit &failure) {
        std::string message;
        for (const char *part : words_of(failure))
            message += part;
        return message;
    }
    return {};
}

std::unique_ptr<report::writer> form_of(const words &form, report::output to) {
    return has(form, "json")    ? report::json_form(std::move(to))
           : has(form, "sarif") ? report::sarif_form(std::move(to))
                                : report::text_form(std::move(to), {});
}

} // namespace

void check_directly(const bytes &source, const std::string &output, const words &form) {
    check::warning_set all;
    all.fill(true);
    std::string_view text(reinterpret_cast<const char *>(source.data()), source.size());
    std::string shown;
    std::optional<std::string> first_error;
    std::unique_ptr<report::writer> to = form_of(form, [&](std::string_view more) { shown += more; });
    to->begin_source("file");
    to->end_source(check::check_bytes(text, "file", all, [&](check::finding &&found) {
        if (found.error && !first_error)
            first_error = found.text;
        to->add(found);
    }));
    to->close();
    expect_harmless(shown);
    std::string message = message_of_compiler(text, output);
    require(first_error.value_or("") == message, "the compiler's error is not the first one");
}

void start_directly(const std::string &name) {
    std::optional<std::string> source = cdef::new_command::first_source(name);
    require(!source || message_of_compiler(*source, "x.cdef").empty(), "a first source does not compile");
}

} // namespace fuzz
