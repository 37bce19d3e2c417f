/* dependencies.cpp: which databases depend on which files, in Make's syntax. */

#include "build/dependencies.h"

#include <algorithm>

namespace build {

namespace {

/* The characters that Make takes for a separator, a comment or a pattern without a backslash. A backslash is special
 * only before these, and must be doubled there. */
constexpr std::string_view ESCAPED = " \t#:";

/* The number of backslashes at the end of the output so far. */
size_t backslashes_of(const std::string &text) {
    auto last = std::find_if(text.rbegin(), text.rend(), [](char c) { return c != '\\'; });
    return static_cast<size_t>(last - text.rbegin());
}

} // namespace

std::string rule_name(std::string_view path) {
    std::string name = path.starts_with('~') ? "./" : ""; /* Make would look for a user */
    for (char c : path) {
        if (c == '\n' || c == ';' || c == '|')
            throw wrong_request("--depfile: Make cannot read a name with a newline, a semicolon or a bar");
        if (ESCAPED.find(c) != ESCAPED.npos)
            name.append(backslashes_of(name), '\\').append("\\");
        if (c == '$')
            name += '$';
        name += c;
    }
    return name.append(backslashes_of(name), '\\');
}

std::string dependencies_of(std::span<const unit> units) {
    std::string rules;
    for (const unit &each : units) {
        for (const output &made : each.outputs)
            rules.append(rules.empty() || rules.ends_with('\n') ? "" : " ").append(rule_name(made.path));
        rules.append(":");
        if (each.source != "-")
            rules.append(" ").append(rule_name(each.source));
        if (!each.project_file.empty())
            rules.append(" ").append(rule_name(each.project_file));
        rules += '\n';
    }
    return rules;
}

} // namespace build
