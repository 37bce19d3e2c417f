/* dependencies.cpp: which databases depend on which files, in Make's syntax. */

#include "build/dependencies.h"

#include "language/suggestions.h"

#include <algorithm>

namespace build {

namespace {

/* The characters that Make takes for a separator, a comment or a pattern without a backslash. A backslash is special
 * only before these, and must be doubled there. */
constexpr std::string_view ESCAPED = " \t#:";

/* Besides letters, digits and bytes above 0x7F, what Ninja reads as a part of a name. */
constexpr std::string_view PLAIN = "+,/_:.~()}{%=@[]!-";

bool is_plain(char c) {
    return static_cast<unsigned char>(c) >= 0x80 || (c >= '0' && c <= '9') || (c >= 'a' && c <= 'z') ||
           (c >= 'A' && c <= 'Z') || PLAIN.find(c) != PLAIN.npos;
}

/* Whether Ninja reads the first character or, after a backslash, the first two characters. It unescapes a
 * blank as Make does, but # and : otherwise, and takes backslashes before any other character for a part of the name.
 */
bool is_read_by_ninja(std::string_view path) {
    constexpr std::string_view NOT_AFTER_BACKSLASH = "\t#:$\r";
    if (path.starts_with('\\'))
        return path.size() > 1 && NOT_AFTER_BACKSLASH.find(path[1]) == NOT_AFTER_BACKSLASH.npos;
    if (path.starts_with(':'))
        return path.size() > 1;
    return is_plain(path.front()) || std::string_view(" #$").find(path.front()) != path.npos;
}

bool is_misread_by_ninja(std::string_view path) {
    while (!path.empty()) {
        if (!is_read_by_ninja(path))
            return true;
        path.remove_prefix(path.starts_with('\\') && !path.starts_with("\\\\") ? 2 : 1);
    }
    return false;
}

/* Make takes "=" for the assignment of a variable, "%" in a target for a pattern, "a(b)" for a part of an archive, and
 * a backslash before a wildcard for an escape. */
bool is_misread_by_make(std::string_view path, rule_side side) {
    std::size_t open = path.find('(');
    bool escapes = false;
    for (std::string_view escape : {"\\*", "\\?", "\\["})
        escapes = escapes || path.find(escape) != path.npos;
    return path.find('=') != path.npos || (side == rule_side::target && path.find('%') != path.npos) ||
           (open != path.npos && open > 0 && path.ends_with(')')) || escapes;
}

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

std::string_view misreader_of(std::string_view path, rule_side side) {
    return is_misread_by_ninja(path) ? "Ninja" : is_misread_by_make(path, side) ? "Make" : "";
}

std::optional<check::finding> misread_name_in(const unit &what) {
    std::vector<std::pair<std::string, rule_side>> names;
    for (const output &made : what.outputs)
        names.emplace_back(made.path, rule_side::target);
    for (const std::string &read : {what.source, what.project_file})
        names.emplace_back(read, rule_side::prerequisite);
    for (const auto &[name, side] : names) {
        std::string_view misreader = misreader_of(name, side);
        if (misreader.empty())
            continue;
        const check::warning &known = check::warnings[check::RULE_NAME];
        check::finding one;
        one.error = false;
        one.code = known.code;
        one.name = known.name;
        one.text = std::string(misreader) + " takes the name " + language::quoted(name) +
                   " in the file of dependencies for another one";
        return one;
    }
    return std::nullopt;
}

} // namespace build
