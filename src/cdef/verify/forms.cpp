/* forms.cpp: findings in databases as text and as JSON. */

#include "cdef/verify/forms.h"

#include "cdef/support/output.h"
#include "cdef/verify/findings.h"
#include "report/json_writer.h"

#include <utility>

namespace cdef::verify {

namespace {

/* Each cause with the number of its consequences, or with these. */
class text : public form {
public:
    explicit text(bool with_consequences) : shows_all(with_consequences) {}

    void begin_file(const std::string &name, bool /* sound */) override {
        file = name;
    }
    void add(const std::vector<cdb::diagnosed> &findings) override {
        std::size_t hidden = 0;
        for (std::size_t i = 0; i < findings.size(); ++i) {
            bool follows = findings[i].cause != i;
            hidden += follows && !shows_all;
            if (!follows || shows_all)
                out.text += (follows ? "  " : "") + line_of(file, findings[i].found);
            bool group_ends = i + 1 == findings.size() || findings[i + 1].cause == i + 1;
            if (group_ends && hidden > 0)
                out.text += note_of(file, std::exchange(hidden, 0));
            out.flush_if_full();
        }
    }
    void begin_many(std::size_t count) override {
        out.text += note_of_many(file, count);
    }
    void add_one(const cdb::finding &found) override {
        out.text += line_of(file, found);
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

class json : public form {
public:
    json() : to(print) {
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
            add_finding(to, findings[i], i);
    }
    void begin_many(std::size_t /* count */) override {
        to.add_truth("diagnosed", false);
        to.open_list("findings");
    }
    void add_one(const cdb::finding &found) override {
        add_finding(to, {found, 0}, 0);
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

} // namespace

std::unique_ptr<form> text_form(bool with_consequences) {
    return std::make_unique<text>(with_consequences);
}

std::unique_ptr<form> json_form() {
    return std::make_unique<json>();
}

} // namespace cdef::verify
