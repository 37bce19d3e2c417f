/* command.cpp: options and operands, made by the library that reads command lines. */

#include "cdef/support/command.h"

#include "cdef/support/status.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <charconv>
#include <limits>
#include <string_view>

namespace cdef {

namespace {

std::string joined(const std::vector<std::string> &words) {
    std::string list;
    for (const std::string &word : words)
        list += (list.empty() ? "" : ",") + word;
    return list;
}

/* help: the list that help shows after the name of the value, or nothing. */
CLI::Validator membership(const std::vector<std::string> &words, const std::string &help) {
    auto check = [words](const std::string &value) {
        bool known = std::find(words.begin(), words.end(), value) != words.end();
        return known ? "" : "'" + value + "' is not " + listed_words(joined(words));
    };
    return {check, help};
}

/* In decimal digits only. */
std::optional<std::size_t> number_in(std::string_view text, std::size_t least, std::size_t most) {
    std::size_t number = 0;
    auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    bool whole = error == std::errc() && end == text.data() + text.size();
    return whole && number >= least && number <= most ? std::optional(number) : std::nullopt;
}

template <class number>
CLI::Option *add_number_to(CLI::App &command, const std::string &names, number &to, std::size_t least, number most,
                           const std::string &help) {
    std::string expected = "a number from " + std::to_string(least);
    if (most != std::numeric_limits<number>::max())
        expected += " to " + std::to_string(most);
    auto check = [=](const std::string &text) {
        return number_in(text, least, most) ? "" : "'" + text + "' is not " + expected;
    };
    auto store = [&to, least, most](const std::string &text) {
        to = static_cast<number>(number_in(text, least, most).value_or(least));
    };
    return command.add_option_function<std::string>(names, store, help)->check(check)->type_name("N");
}

/* The name of an operand says what it is. */
CLI::Option &without_type_if_operand(CLI::Option &added) {
    return added.get_positional() ? *added.type_name("") : added;
}

} // namespace

std::string listed_words(std::string list) {
    std::size_t last = list.rfind(',');
    if (last != std::string::npos)
        list.replace(last, 1, " or ");
    for (std::size_t at = 0; (at = list.find(',', at)) != std::string::npos; ++at)
        list.insert(at + 1, " ");
    return list;
}

option option::required() {
    made->required();
    return *this;
}

option option::called(const std::string &name) {
    made->type_name(name);
    return *this;
}

option option::one_of(const std::vector<std::string> &words) {
    made->check(membership(words, "{" + joined(words) + "}"));
    return *this;
}

option option::one_of_unlisted(const std::vector<std::string> &words) {
    made->check(membership(words, ""));
    return *this;
}

option option::checked(const std::function<std::string(const std::string &)> &check) {
    made->check(check);
    return *this;
}

option option::one_value_each() {
    made->allow_extra_args(false);
    return *this;
}

option option::shown_as(const std::string &text) {
    made->option_text(text);
    return *this;
}

option option::excludes(const option &other) {
    made->excludes(other.made);
    return *this;
}

option option::needs(const option &other) {
    made->needs(other.made);
    return *this;
}

option command::add(const std::string &names, std::string &to, const std::string &help) {
    return option(without_type_if_operand(*made->add_option(names, to, help)));
}

option command::add(const std::string &names, std::optional<std::string> &to, const std::string &help) {
    return option(without_type_if_operand(*made->add_option(names, to, help)));
}

option command::add(const std::string &names, std::vector<std::string> &to, const std::string &help) {
    return option(without_type_if_operand(*made->add_option(names, to, help)));
}

option command::add_number(const std::string &names, unsigned &to, unsigned most, const std::string &help) {
    return option(*add_number_to(*made, names, to, 1, most, help));
}

option command::add_count(const std::string &names, std::size_t &to, const std::string &help) {
    std::string with_default = help + " (default: " + std::to_string(to) + ")";
    return option(*add_number_to(*made, names, to, 0, std::numeric_limits<std::size_t>::max(), with_default));
}

option command::add_flag(const std::string &names, bool &to, const std::string &help) {
    return option(*made->add_flag(names, to, help)->disable_flag_override());
}

option command::add_flag(const std::string &names, std::string &to, const std::string &help) {
    return option(*made->add_flag(names, to, help));
}

option command::add_flag(const std::string &names, const std::function<void()> &chosen, const std::string &help) {
    return option(*made->add_flag_callback(names, chosen, help)->disable_flag_override());
}

void command::show_examples(const std::string &lines) {
    made->footer("Examples:\n" + lines + "\n" + made->get_footer());
}

command program::add(const std::string &name, const std::string &help, const std::function<int()> &run) {
    CLI::App *added = made->add_subcommand(name, help);
    added->footer(status_help(name));
    added->callback([run, status = status] { *status = run(); });
    return command(*added);
}

} // namespace cdef
