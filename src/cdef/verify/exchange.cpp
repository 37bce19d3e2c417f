/* exchange.cpp: findings in databases as SARIF, and as GitHub and GitLab read them. */

#include "cdef/support/output.h"
#include "cdef/verify/findings.h"
#include "cdef/verify/forms.h"
#include "report/fingerprint.h"
#include "report/github.h"
#include "report/gitlab.h"
#include "report/sarif.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <map>
#include <set>

namespace cdef::verify {

namespace {

using nlohmann::ordered_json;

bool is_error(const cdb::finding &f) {
    return f.broken->level == cdb::severity::error;
}

/* Distinguishes findings about one file from each other. */
class marks {
public:
    /* The mark of a finding. A finding about the same field of another file has the same mark, whatever was found. */
    std::string of(const cdb::finding &f) {
        std::string mark = std::string(f.broken->code) + " " + place_of(f);
        unsigned count = ++counts[mark];
        return mark.append(":").append(std::to_string(count));
    }

private:
    std::map<std::string, unsigned> counts;
};

/* The same without memory of the others, for files with very many. */
std::string mark_of_many(const cdb::finding &f) {
    return std::string(f.broken->code) + " " + place_of(f) + " at " + std::to_string(f.offset);
}

/* ---- SARIF ----------------------------------------------------------------------------------------------------- */

std::vector<report::rule> make_rules() {
    std::vector<cdb::rule> known(cdb::rules().begin(), cdb::rules().end());
    known.push_back(cdb::contradicting_rule());
    std::sort(known.begin(), known.end(), [](const auto &a, const auto &b) { return a.code < b.code; });
    std::vector<report::rule> all;
    all.reserve(known.size());
    for (const cdb::rule &each : known)
        all.push_back({.code = each.code,
                       .name = {},
                       .title = each.title,
                       .cause = each.cause,
                       .help = std::string(each.cause) + " " + std::string(each.cure),
                       .error = each.level == cdb::severity::error});
    return all;
}

/* The place of a finding, in bytes: a database has no lines. */
ordered_json location_of(const std::string &file, const cdb::finding &f) {
    ordered_json location;
    ordered_json &physical = location["physicalLocation"];
    physical["artifactLocation"] = report::artifact_of(file);
    physical["region"]["byteOffset"] = f.offset;
    return location;
}

/* A result for each cause. What follows from it is its related locations. */
class sarif : public form {
public:
    sarif() : rules(make_rules()), to(print, "cdef verify", rules) {}

    void begin_file(const std::string &name, bool /* sound */) override {
        file = name;
        made = {};
    }
    void add(const std::vector<cdb::diagnosed> &findings) override {
        for (std::size_t i = 0; i < findings.size(); ++i) {
            std::size_t count = consequences_of(findings, i);
            add(findings[i].found, std::span(findings).subspan(i + 1, count), made.of(findings[i].found));
            i += count;
        }
    }
    void begin_many(std::size_t /* count */) override {}
    void add_one(const cdb::finding &found) override {
        add(found, {}, mark_of_many(found));
    }
    void end_file() override {}
    void add_unreadable(const std::string &name, const std::string &why) override {
        to.fail(name, why);
    }
    void close() override {
        to.close();
    }

private:
    std::size_t index_of(std::string_view code) const {
        auto found = std::find_if(rules.begin(), rules.end(), [code](const auto &each) { return each.code == code; });
        return static_cast<std::size_t>(found - rules.begin());
    }

    void add(const cdb::finding &f, std::span<const cdb::diagnosed> consequences, const std::string &mark) {
        ordered_json result = result_of(f);
        add_related(result, file, consequences);
        result["partialFingerprints"]["codeAndField/v1"] = report::hexadecimal(report::hash_of(mark));
        to.add(result);
    }

    ordered_json result_of(const cdb::finding &f) const {
        ordered_json result;
        result["ruleId"] = f.broken->code;
        result["ruleIndex"] = index_of(f.broken->code);
        result["level"] = is_error(f) ? "error" : "warning";
        result["message"]["text"] = sentence_of(f);
        result["locations"].push_back(location_of(file, f));
        return result;
    }

    static void add_related(ordered_json &result, const std::string &file, std::span<const cdb::diagnosed> all) {
        std::set<std::string> shown; /* each may occur only once */
        for (const cdb::diagnosed &each : all) {
            std::string text = sentence_of(each.found) + " [" + std::string(each.found.broken->code) + "]";
            if (!shown.insert(text).second)
                continue;
            ordered_json related = location_of(file, each.found);
            related["message"]["text"] = text;
            result["relatedLocations"].push_back(std::move(related));
        }
    }

    std::vector<report::rule> rules;
    report::sarif_log to;
    std::string file;
    marks made;
};

/* ---- GitHub and GitLab ----------------------------------------------------------------------------------------- */

/* Takes findings one by one. */
class single : public form {
public:
    explicit single(bool with_consequences) : shows_all(with_consequences) {}

    void begin_file(const std::string &name, bool /* sound */) override {
        file = name;
        made = {};
    }
    void add(const std::vector<cdb::diagnosed> &findings) override {
        for (std::size_t i = 0; i < findings.size(); ++i) {
            std::size_t count = shows_all ? 0 : consequences_of(findings, i);
            add(file, findings[i].found, made.of(findings[i].found), count);
            i += count;
        }
    }
    void begin_many(std::size_t /* count */) override {}
    void add_one(const cdb::finding &found) override {
        add(file, found, mark_of_many(found), 0);
    }
    void end_file() override {}

protected:
    /* mark: distinguishes the finding from others about the file. hidden: how many consequences are not shown. */
    virtual void add(const std::string &name, const cdb::finding &f, const std::string &mark, std::size_t hidden) = 0;

private:
    bool shows_all;
    std::string file;
    marks made;
};

class github : public single {
public:
    using single::single;

    void add_unreadable(const std::string &name, const std::string &why) override {
        out.text += report::github_command{.file = name}.with(why);
    }
    void close() override {
        out.flush();
    }

protected:
    void add(const std::string &name, const cdb::finding &f, const std::string & /* mark */,
             std::size_t hidden) override {
        report::github_command command = {.error = is_error(f), .file = name, .title = f.broken->code};
        out.text += command.with(sentence_of(f) + (hidden > 0 ? "\n" + count_of(hidden) : ""));
        out.flush_if_full();
    }

private:
    output out;
};

class gitlab : public single {
public:
    using single::single;

    void add_unreadable(const std::string &name, const std::string &why) override {
        to.fail(name, why);
    }
    void close() override {
        to.close();
    }

protected:
    void add(const std::string &name, const cdb::finding &f, const std::string &mark, std::size_t hidden) override {
        std::string description = sentence_of(f) + (hidden > 0 ? "; " + count_of(hidden) : "");
        to.add(name, {std::move(description), f.broken->code, mark, is_error(f) ? "major" : "minor"});
    }

private:
    report::gitlab_report to{print};
};

} // namespace

std::unique_ptr<form> sarif_form() {
    return std::make_unique<sarif>();
}

std::unique_ptr<form> github_form(bool with_consequences) {
    return std::make_unique<github>(with_consequences);
}

std::unique_ptr<form> gitlab_form(bool with_consequences) {
    return std::make_unique<gitlab>(with_consequences);
}

} // namespace cdef::verify
