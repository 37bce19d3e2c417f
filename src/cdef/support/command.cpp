/* command.cpp: options and operands, made by the library that reads command lines. */

#include "cdef/support/command.h"

#include "cdef/support/status.h"

#include <CLI/CLI.hpp>

namespace cdef {

option option::required() {
    made->required();
    return *this;
}

option option::called(const std::string &name) {
    made->type_name(name);
    return *this;
}

option option::one_of(const std::vector<std::string> &words) {
    made->check(CLI::IsMember(words));
    return *this;
}

option option::one_of_unlisted(const std::vector<std::string> &words) {
    made->check(CLI::IsMember(words).description(""));
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
    return option(*made->add_option(names, to, help));
}

option command::add(const std::string &names, std::optional<std::string> &to, const std::string &help) {
    return option(*made->add_option(names, to, help));
}

option command::add(const std::string &names, std::vector<std::string> &to, const std::string &help) {
    return option(*made->add_option(names, to, help));
}

option command::add_number(const std::string &names, unsigned &to, unsigned most, const std::string &help) {
    return option(*made->add_option(names, to, help)->check(CLI::Range(1U, most)));
}

option command::add_count(const std::string &names, std::size_t &to, const std::string &help) {
    return option(*made->add_option(names, to, help)->check(CLI::NonNegativeNumber)->capture_default_str());
}

option command::add_flag(const std::string &names, bool &to, const std::string &help) {
    return option(*made->add_flag(names, to, help));
}

option command::add_flag(const std::string &names, std::string &to, const std::string &help) {
    return option(*made->add_flag(names, to, help));
}

option command::add_flag(const std::string &names, const std::function<void()> &chosen, const std::string &help) {
    return option(*made->add_flag_callback(names, chosen, help));
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
