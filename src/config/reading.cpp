/* reading.cpp: reads the values of a project file, and collects what is wrong with them. */

#include "config/reading.h"

#include "language/suggestions.h"
#include "text/shown.h"

#include <algorithm>
#include <filesystem>
#include <utility>

namespace config {

namespace {

/* What a value is, for messages. */
std::string_view kind_of(const toml::node &value) {
    switch (value.type()) {
    case toml::node_type::table:
        return "a table";
    case toml::node_type::array:
        return "an array";
    case toml::node_type::string:
        return "a string";
    case toml::node_type::integer:
    case toml::node_type::floating_point:
        return "a number";
    case toml::node_type::boolean:
        return "a boolean";
    default:
        return "a time";
    }
}

std::string expected(std::string_view what, const toml::node &value) {
    return std::string("expected ").append(what).append(", found ").append(kind_of(value));
}

language::name_list warning_names() {
    language::name_list all = {"all"};
    for (const check::warning &known : check::warnings)
        all.insert(all.end(), {known.name, known.code});
    return all;
}

bool is_among(std::string_view text, const language::name_list &names) {
    return std::find(names.begin(), names.end(), text) != names.end();
}

std::string with_suggestion(const std::string &text, std::string_view unknown, const language::name_list &known) {
    std::string more = language::suggestion(unknown, known);
    return more.empty() ? text : text + "; " + more;
}

} // namespace

void value_reader::report(const toml::source_region &at, std::string_view text) {
    result.problems.push_back(
        {static_cast<int>(at.begin.line), static_cast<int>(at.begin.column), text::escaped(text)});
}

void value_reader::report_unknown(const toml::key &key, const std::string &what, const language::name_list &known) {
    std::string_view name = key.str();
    report(key.source(), with_suggestion("unknown " + what + " " + language::quoted(name), name, known));
}

const std::string *value_reader::text_of(const toml::node &value) {
    const auto *text = value.as_string();
    if (text == nullptr)
        report(value.source(), expected("a string", value));
    else if (text->get().empty() || text->get().find('\0') != std::string::npos)
        report(value.source(), "the string is empty or has a zero byte");
    else
        return &text->get();
    return nullptr;
}

void value_reader::read_truth(const toml::node &value, bool &to) {
    if (const auto *truth = value.as_boolean())
        to = truth->get();
    else
        report(value.source(), expected("true or false", value));
}

void value_reader::read_word(const toml::node &value, const language::name_list &words, std::string &to) {
    const std::string *text = text_of(value);
    if (text == nullptr)
        return;
    if (is_among(*text, words))
        to = *text;
    else
        report(value.source(), "expected " + language::listed(words, "or") + ", found " + language::quoted(*text));
}

void value_reader::read_path(const toml::node &value, std::string &to) {
    if (const std::string *text = text_of(value))
        to = (std::filesystem::path(result.values.path).parent_path() / *text).string();
}

void value_reader::read_baseline(const toml::node &value, std::string &to) {
    const auto *text = value.as_string();
    if (text != nullptr && text->get() == "git:")
        report(value.source(), "expected git:REVISION, found " + language::quoted(text->get()));
    else if (text != nullptr && text->get().starts_with("git:") && text->get().find('\0') == std::string::npos)
        to = text->get();
    else
        read_path(value, to);
}

void value_reader::read_warnings(const toml::node &value, std::vector<std::string> &to) {
    const toml::array *names = value.as_array();
    if (names == nullptr) {
        report(value.source(), expected("an array of names of warnings", value));
        return;
    }
    for (const toml::node &each : *names) {
        const std::string *name = text_of(each);
        if (name != nullptr && !is_among(*name, warning_names()))
            report(each.source(),
                   with_suggestion("unknown warning " + language::quoted(*name), *name, warning_names()));
        else if (name != nullptr)
            to.push_back(*name);
    }
}

} // namespace config
