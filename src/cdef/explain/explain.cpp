/* explain.cpp: the subcommand that explains codes: cause, cure and an example. */

#include "cdef/cdef.h"
#include "cdef/explain/codes.h"
#include "cdef/support/command.h"
#include "cdef/support/failure.h"
#include "cdef/support/forms.h"
#include "cdef/support/output.h"
#include "report/json_writer.h"
#include "text/shown.h"

#include <cstddef>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace cdef {

namespace {

struct explain_options {
    std::vector<std::string> codes;
    std::string form;
};

/* The message without the place for details at its end. */
std::string title_of(const explanation &shown) {
    std::string_view title = shown.title;
    return std::string(title.substr(0, title.find_last_not_of(": ") + 1));
}

/* Lines of at most 80 characters, each after two blanks. */
std::string wrapped(std::string_view text) {
    constexpr std::size_t WIDTH = 78;
    std::string lines;
    while (!text.empty()) {
        std::size_t end = text.size() <= WIDTH ? text.size() : text.rfind(' ', WIDTH);
        if (end == std::string_view::npos)
            end = text.size();
        lines.append("  ").append(text.substr(0, end)).append("\n");
        text.remove_prefix(end < text.size() ? end + 1 : end);
    }
    return lines;
}

std::string indented(const std::string &source) {
    std::string lines;
    for (std::size_t begin = 0; begin < source.size();) {
        std::size_t end = source.find('\n', begin);
        lines += "    " + text::masked(std::string_view(source).substr(begin, end - begin)) + "\n";
        begin = end + 1;
    }
    return lines.empty() ? "    (without these lines)\n" : lines;
}

std::string as_text(const explanation &shown) {
    std::string text = std::string(shown.code) + ": " + std::string(shown.severity) + ": " + title_of(shown);
    if (!shown.name.empty())
        text.append(" [").append(shown.name).append("]");
    text += "\n\nCause:\n" + wrapped(shown.cause) + "\nCure:\n" + wrapped(shown.cure);
    if (const check::example *one = shown.example) {
        text += "\nExample:\n" + indented(check::shown_with(*one->within, one->lines));
        if (one->cured != nullptr)
            text += "\nCured:\n" + indented(check::shown_with(*one->within, one->cured));
    }
    return text;
}

std::string as_line(const explanation &shown) {
    std::string code(shown.code);
    constexpr std::size_t CODE_WIDTH = 8;
    code.resize(CODE_WIDTH, ' ');
    std::string text = code + title_of(shown);
    if (!shown.name.empty())
        text.append(" [").append(shown.name).append("]");
    return text + "\n";
}

void add_json(report::json_writer &to, const explanation &shown) {
    to.open_object();
    to.add_text("code", shown.code);
    to.add_text("severity", shown.severity);
    if (shown.name.empty())
        to.add_null("name");
    else
        to.add_text("name", shown.name);
    to.add_text("title", title_of(shown));
    to.add_text("cause", shown.cause);
    to.add_text("cure", shown.cure);
    const check::example *one = shown.example;
    if (one == nullptr)
        to.add_null("example");
    else
        to.add_text("example", check::source_with(*one->within, one->lines));
    if (one == nullptr || one->cured == nullptr)
        to.add_null("cured");
    else
        to.add_text("cured", check::source_with(*one->within, one->cured));
    to.close();
}

/* "S101", "S101 or S102", "S101, S102 or S103" */
std::string joined(const language::name_list &names) {
    std::string text;
    for (std::size_t i = 0; i < names.size(); ++i) {
        if (i > 0)
            text += i + 1 < names.size() ? ", " : " or ";
        text += names[i];
    }
    return text;
}

/* Throws failure if there is no such code. */
const explanation &known(const std::vector<explanation> &all, const std::string &code) {
    const explanation *found = find(all, code);
    if (found != nullptr)
        return *found;
    constexpr std::size_t OFFERED_MAX = 3;
    language::name_list near = nearest(all, code);
    std::string hint =
        near.empty() || near.size() > OFFERED_MAX ? "'cdef explain' lists all" : "did you mean " + joined(near) + "?";
    throw failure(code + ": no such code; " + hint);
}

int explain(const explain_options &options) {
    std::vector<explanation> all = explanations();
    std::vector<explanation> chosen;
    for (const std::string &code : options.codes)
        chosen.push_back(known(all, code));
    const std::vector<explanation> &shown = options.codes.empty() ? all : chosen;
    if (options.form == "json") {
        report::json_writer json([](std::string_view text) { print(text); });
        json.open_object();
        json.add_schema("cdef-explain.schema.json", 1);
        json.open_list("codes");
        for (const explanation &each : shown)
            add_json(json, each);
        json.close();
        json.close();
        return OK;
    }
    std::string text;
    for (const explanation &each : shown) {
        if (options.codes.empty())
            text += as_line(each);
        else
            text += (text.empty() ? "" : "\n") + as_text(each);
    }
    print(text);
    return OK;
}

} // namespace

void add_explain(program &app) {
    auto options = std::make_shared<explain_options>();
    command made = app.add("explain", "Explains the codes of findings: cause, cure and an example",
                           [options] { return explain(*options); });
    made.add("CODE", options->codes, "Code such as S101 or CDB104, or a warning's name; without one, all are listed");
    add_forms(made, options->form, {"text", "json"}, "Form: text or json");
}

} // namespace cdef
