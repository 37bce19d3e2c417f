/* command.h: the options and operands of a subcommand. Only command.cpp, usage.cpp and cdef.cpp include the library
 * that reads command lines, because compiling it takes longer than compiling any subcommand. */
#ifndef CDGEN_CDEF_COMMAND_H
#define CDGEN_CDEF_COMMAND_H

#include <cstddef>
#include <functional>
#include <optional>
#include <string>
#include <vector>

namespace CLI {
class App;
class Option;
} // namespace CLI

namespace cdef {

/* "text, json or hex" for "text,json,hex" */
std::string listed_words(std::string list);

/* An option or an operand. Each function returns the option itself. */
class option {
public:
    explicit option(CLI::Option &added) : made(&added) {}

    option required();
    /* What help calls the value. */
    option called(const std::string &name);
    /* The value is one of these words, which help lists. */
    option one_of(const std::vector<std::string> &words);
    option one_of_unlisted(const std::vector<std::string> &words);
    /* check returns what is wrong with a value, or nothing. */
    option checked(const std::function<std::string(const std::string &)> &check);
    /* Makes it take one value each time it is given, not all values that follow. */
    option one_value_each();
    /* What help shows instead of the kind of the value and whether it is required. */
    option shown_as(const std::string &text);
    option excludes(const option &other);
    option needs(const option &other);

private:
    CLI::Option *made;
};

/* A subcommand. The variables in which its options are stored must outlive it. */
class command {
public:
    explicit command(CLI::App &added) : made(&added) {}

    /* Options, and operands if the name has no dash. */
    option add(const std::string &names, std::string &to, const std::string &help);
    option add(const std::string &names, std::optional<std::string> &to, const std::string &help);
    option add(const std::string &names, std::vector<std::string> &to, const std::string &help);
    /* From 1 to most, in decimal digits. Help calls the value N, as in the next function. */
    option add_number(const std::string &names, unsigned &to, unsigned most, const std::string &help);
    /* From 0. The help shows the default, which is the present value. */
    option add_count(const std::string &names, std::size_t &to, const std::string &help);
    option add_flag(const std::string &names, bool &to, const std::string &help);
    /* A flag that may have a value, after "=". */
    option add_flag(const std::string &names, std::string &to, const std::string &help);
    option add_flag(const std::string &names, const std::function<void()> &chosen, const std::string &help);

    /* Lines for the help, which shows them before the exit statuses. */
    void show_examples(const std::string &lines);

private:
    CLI::App *made;
};

/* The program, which is given its subcommands. */
class program {
public:
    /* to: where the exit status of the subcommand that ran is stored. */
    program(CLI::App &whole, int &to) : made(&whole), status(&to) {}

    /* The help of a subcommand ends with its exit statuses. run: returns its exit status. */
    command add(const std::string &name, const std::string &help, const std::function<int()> &run);

private:
    CLI::App *made;
    int *status;
};

} // namespace cdef

#endif
