/* verify.cpp: the subcommand that checks whether databases are sound. */

#include "cdef/cdef.h"
#include "cdef/support/failure.h"
#include "cdef/support/forms.h"
#include "cdef/support/input.h"
#include "cdef/support/output.h"
#include "cdef/verify/findings.h"
#include "report/json_writer.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <memory>
#include <utility>

namespace cdef {

namespace {

struct verify_options {
    std::vector<std::string> files;
    std::string form;
    bool warnings_count = false; /* a database with warnings fails as one with errors does */
    bool quiet = false;          /* warnings are not shown */
    bool shows_all = false;      /* consequences are shown too */
};

/* Shows what is found in each database. */
class verify_form {
public:
    verify_form() = default;
    verify_form(const verify_form &) = delete;
    verify_form &operator=(const verify_form &) = delete;
    virtual ~verify_form() = default;

    virtual void begin_file(const std::string &name, bool sound) = 0;
    virtual void add(const std::vector<cdb::diagnosed> &findings) = 0;
    /* Instead, if there are so many that nobody looks for their causes: says so, and each is added by itself. */
    virtual void begin_many(std::size_t count) = 0;
    virtual void add_one(const cdb::finding &found) = 0;
    virtual void end_file() = 0;
    virtual void add_unreadable(const std::string &name, const std::string &why) = 0;
    virtual void close() = 0;
};

/* Each cause with the number of its consequences, or with these. */
class text_form : public verify_form {
public:
    explicit text_form(bool with_consequences) : shows_all(with_consequences) {}

    void begin_file(const std::string &name, bool /* sound */) override {
        file = name;
    }
    void add(const std::vector<cdb::diagnosed> &findings) override {
        std::size_t hidden = 0;
        for (std::size_t i = 0; i < findings.size(); ++i) {
            bool follows = findings[i].cause != i;
            hidden += follows && !shows_all;
            if (!follows || shows_all)
                out.text += (follows ? "  " : "") + verify::line_of(file, findings[i].found);
            bool group_ends = i + 1 == findings.size() || findings[i + 1].cause == i + 1;
            if (group_ends && hidden > 0)
                out.text += verify::note_of(file, std::exchange(hidden, 0));
            out.flush_if_full();
        }
    }
    void begin_many(std::size_t count) override {
        out.text += verify::note_of_many(file, count);
    }
    void add_one(const cdb::finding &found) override {
        out.text += verify::line_of(file, found);
        out.flush_if_full();
    }
    void end_file() override {}
    void add_unreadable(const std::string & /* name */, const std::string & /* why */) override {}
    void close() override {
        out.flush();
    }

private:
    bool shows_all;
    std::string file;
    output out;
};

class json_form : public verify_form {
public:
    json_form() : to(print) {
        to.open_object();
        to.add_schema("cdef-verify.schema.json", 1);
        to.open_list("files");
    }
    void begin_file(const std::string &name, bool sound) override {
        to.open_object();
        to.add_text("file", name);
        to.add_truth("sound", sound);
    }
    void add(const std::vector<cdb::diagnosed> &findings) override {
        to.open_list("findings");
        for (std::size_t i = 0; i < findings.size(); ++i)
            verify::add_finding(to, findings[i], i);
    }
    void begin_many(std::size_t /* count */) override {
        to.add_truth("diagnosed", false);
        to.open_list("findings");
    }
    void add_one(const cdb::finding &found) override {
        verify::add_finding(to, {found, 0}, 0);
    }
    void end_file() override {
        to.close();
        to.close();
    }
    void add_unreadable(const std::string &name, const std::string &why) override {
        to.open_object();
        to.add_text("file", name);
        to.add_text("unreadable", why);
        to.close();
    }
    void close() override {
        to.close();
        to.close();
    }

private:
    report::json_writer to;
};

std::unique_ptr<verify_form> form_of(const verify_options &options) {
    if (options.form == "json")
        return std::make_unique<json_form>();
    return std::make_unique<text_form>(options.shows_all);
}

constexpr std::size_t MOST_DIAGNOSED = 10000; /* findings of which the causes are looked for */

bool is_shown(const cdb::finding &found, const verify_options &options) {
    return !options.quiet || found.broken->level == cdb::severity::error;
}

void show_diagnosis(const cdb::database &db, std::vector<cdb::finding> &&found, const verify_options &options,
                    verify_form &form) {
    std::vector<cdb::diagnosed> findings = cdb::diagnose(db, std::move(found));
    form.add(options.quiet ? verify::errors_of(std::move(findings)) : findings);
}

/* Verifies again, so that the findings are never in memory together. */
void show_many(const cdb::database &db, std::size_t count, const verify_options &options, verify_form &form) {
    form.begin_many(count);
    cdb::verify(db, [&](cdb::finding &&found) {
        if (is_shown(found, options))
            form.add_one(found);
    });
}

/* Shows the findings in one file; whether it passes. */
bool judge(const std::string &path, const verify_options &options, verify_form &form) {
    input in(path);
    if (is_text(in.contents))
        throw failure(path + ": a text, not a database; 'cdef check' checks sources");
    cdb::first_findings first = cdb::find_first(in.db, MOST_DIAGNOSED);
    bool pass = options.warnings_count ? first.count == 0 : first.sound;
    form.begin_file(path, pass);
    if (first.count > first.kept.size())
        show_many(in.db, first.count, options, form);
    else
        show_diagnosis(in.db, std::move(first.kept), options, form);
    form.end_file();
    return pass;
}

int run(const verify_options &options) {
    std::unique_ptr<verify_form> form = form_of(options);
    bool pass = true;
    bool read = true;
    for (const std::string &file : options.files) {
        try {
            pass = judge(file, options, *form) && pass;
        } catch (const failure &unreadable) {
            print_error(unreadable.what());
            form->add_unreadable(file, unreadable.what());
            read = false;
        }
    }
    form->close();
    return !read ? FAILED : pass ? OK : FOUND;
}

} // namespace

void add_verify(CLI::App &app, int &status) {
    auto options = std::make_shared<verify_options>();
    CLI::App *command =
        app.add_subcommand("verify", "Checks whether databases are sound; prints nothing about flawless ones");
    command->add_option("FILE", options->files, "Database to verify; - is standard input")->required();
    add_forms(*command, options->form, {"text", "json"}, "Form of the findings: text or json");
    command->add_flag("--all", options->shows_all, "Show the findings that follow from others too");
    command->add_flag("--werror", options->warnings_count, "Count warnings as errors");
    command->add_flag("-q,--quiet", options->quiet, "Show errors only");
    command->footer(status_help("verify"));
    command->callback([options, &status] { status = run(*options); });
}

} // namespace cdef
