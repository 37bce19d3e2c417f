/* usage.cpp: what is wrong with a command line. */

#include "cdef/usage.h"

#include "cdef/support/command.h"
#include "language/suggestions.h"

#include <CLI/CLI.hpp>

#include <algorithm>
#include <string_view>
#include <utility>

namespace cdef {

namespace {

bool takes_value(const CLI::Option &option) {
    return option.get_items_expected_max() > 0;
}

/* True if a value may follow, but only after "=". */
bool may_take_value(const CLI::Option &option) {
    return !takes_value(option) && !option.get_disable_flag_override();
}

std::vector<CLI::Option *> operands_of(CLI::App &command) {
    return command.get_options([](const CLI::Option *option) { return option->get_positional(); });
}

std::vector<CLI::Option *> options_of(CLI::App &command) {
    return command.get_options([](const CLI::Option *option) { return !option->get_positional(); });
}

/* name: with its dashes. */
CLI::Option *option_called(CLI::App &command, const std::string &name) {
    for (CLI::Option *option : options_of(command))
        if (option->check_name(name))
            return option;
    return nullptr;
}

std::string suggestion(std::string_view misspelt, const language::name_list &names, const std::string &dashes) {
    std::string_view meant = language::near_miss(misspelt, names);
    return meant.empty() ? "" : "; did you mean " + dashes + std::string(meant) + "?";
}

/* name: with its dashes. Only long names are suggested. */
std::string unknown_option(CLI::App &command, const std::string &name) {
    language::name_list names;
    for (const CLI::Option *option : options_of(command))
        names.insert(names.end(), option->get_lnames().begin(), option->get_lnames().end());
    bool is_long = name.starts_with("--");
    return name + ": unknown option" + (is_long ? suggestion(name.substr(2), names, "--") : "");
}

std::string unknown_subcommand(CLI::App &program, const std::string &name) {
    std::vector<std::string> known;
    for (const CLI::App *each : subcommands_of(program))
        known.push_back(each->get_name());
    return name + ": unknown subcommand" + suggestion(name, {known.begin(), known.end()}, "");
}

/* "text, json or hex", or what help calls the value. */
std::string values_of(const CLI::Option &option) {
    std::string shown = may_take_value(option) ? option.get_option_text() : option.get_type_name();
    std::size_t begin = shown.find('{');
    return begin == std::string::npos ? shown : listed_words(shown.substr(begin + 1, shown.find('}') - begin - 1));
}

std::string without_value(const CLI::Option &option, const std::string &name) {
    return name + " needs a value: " + values_of(option);
}

} // namespace

std::vector<CLI::App *> subcommands_of(CLI::App &program) {
    return program.get_subcommands([](const CLI::App *) { return true; });
}

usage::usage(CLI::App &program, const std::vector<std::string> &words) : command(&program) {
    for (std::size_t i = 0; i < words.size() && !found; ++i)
        if (!std::exchange(skips_next, false))
            look_at(words[i], i + 1 < words.size() ? &words[i + 1] : nullptr);
    if (!help.empty())
        found.reset();
}

void usage::look_at(const std::string &word, const std::string *next) {
    if (only_operands || word.size() < 2 || word.front() != '-')
        look_at_operand(word);
    else if (word == "--")
        only_operands = true;
    else if (word[1] == '-')
        look_at_long(word, next);
    else
        look_at_short(word, next);
}

void usage::look_at_long(const std::string &word, const std::string *next) {
    std::size_t end = word.find('=');
    bool has_value = end != std::string::npos;
    std::string name = word.substr(0, end);
    std::string value = has_value ? word.substr(end + 1) : "";
    CLI::Option *option = option_called(*command, name);
    if (option == nullptr)
        return fail(unknown_option(*command, name));
    if (!has_value && takes_value(*option)) {
        skips_next = true;
        return take_value(*option, name, next);
    }
    if (!has_value)
        return take_flag(*option, word);
    if (!takes_value(*option) && !may_take_value(*option))
        return fail(name + " takes no value");
    if (value.empty())
        return fail(without_value(*option, name));
    return takes_value(*option) ? take_value(*option, name, &value) : take_flag(*option, word);
}

/* -q, -j4, -qj4, or -qj with the value in the next word */
void usage::look_at_short(const std::string &word, const std::string *next) {
    for (std::size_t at = 1; at < word.size(); ++at) {
        std::string name = {'-', word[at]};
        std::string rest = word.substr(at + 1);
        CLI::Option *option = option_called(*command, name);
        if (option == nullptr)
            return fail(unknown_option(*command, "-" + word.substr(at)));
        if (takes_value(*option)) {
            skips_next = rest.empty();
            return take_value(*option, name, rest.empty() ? next : &rest);
        }
        if (rest.starts_with('='))
            return fail(name + " takes no value");
        take_flag(*option, name);
    }
}

void usage::look_at_operand(const std::string &word) {
    if (!has_subcommand()) {
        for (CLI::App *each : subcommands_of(*command))
            if (each->get_name() == word) {
                options.push_back(word);
                command = each;
                only_operands = false;
                return;
            }
        return fail(unknown_subcommand(*command, word));
    }
    std::size_t most = 0;
    for (const CLI::Option *each : operands_of(*command))
        most += static_cast<std::size_t>(each->get_items_expected_max());
    if (operands.size() == most)
        return fail(word + ": one operand too many");
    operands.push_back(word);
}

void usage::take_value(CLI::Option &option, const std::string &name, const std::string *value) {
    if (value == nullptr)
        return fail(without_value(option, name));
    options.insert(options.end(), {name, *value});
    given.push_back(&option);
}

void usage::take_flag(CLI::Option &flag, const std::string &word) {
    if (&flag == command->get_help_ptr() || &flag == command->get_version_ptr())
        help = word;
    options.push_back(word);
    if (!is_given(flag))
        given.push_back(&flag);
}

bool usage::has_subcommand() const {
    return command->get_parent() != nullptr;
}

void usage::fail(const std::string &what) {
    found = {what, has_subcommand() ? "cdef " + command->get_name() : "cdef"};
}

std::vector<std::string> usage::in_order() const {
    if (!help.empty())
        return has_subcommand() ? std::vector{command->get_name(), help} : std::vector{help};
    std::vector<std::string> words = options;
    if (!operands.empty())
        words.emplace_back("--");
    words.insert(words.end(), operands.begin(), operands.end());
    return words;
}

bool usage::is_given(const CLI::Option &option) const {
    return std::find(given.begin(), given.end(), &option) != given.end();
}

std::string usage::missing_operand() const {
    if (!has_subcommand())
        return "A subcommand is required";
    std::size_t place = 0; /* of the first word that this operand may have */
    for (const CLI::Option *each : operands_of(*command)) {
        if (each->get_required() && operands.size() <= place)
            return each->get_name() + " is required";
        ++place;
    }
    return {};
}

std::string usage::wrong_combination() const {
    for (std::size_t i = 0; i < given.size(); ++i) {
        const CLI::Option &option = *given[i];
        for (std::size_t before = 0; before < i; ++before) {
            if (given[before] == &option && option.get_items_expected_max() == 1)
                return option.get_name() + " is given more than once";
            if (option.get_excludes().contains(given[before]))
                return given[before]->get_name() + " and " + option.get_name() + " exclude each other";
        }
        for (const CLI::Option *needed : option.get_needs())
            if (!is_given(*needed))
                return option.get_name() + " needs " + needed->get_name();
    }
    return {};
}

wrong_usage usage::mistake_of(const CLI::Error &refused) const {
    wrong_usage wrong = {refused.what(), has_subcommand() ? "cdef " + command->get_name() : "cdef"};
    if (refused.get_exit_code() == static_cast<int>(CLI::ExitCodes::ValidationError))
        return wrong;
    for (const std::string &reason : {wrong_combination(), missing_operand()})
        if (!reason.empty())
            return {reason, wrong.command};
    return wrong;
}

} // namespace cdef
