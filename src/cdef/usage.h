/* usage.h: what is wrong with a command line. The library that reads command lines has texts for that too, but they
 * differ between its versions, and it accepts values for flags that take none. */
#ifndef CDGEN_CDEF_USAGE_H
#define CDGEN_CDEF_USAGE_H

#include <optional>
#include <string>
#include <vector>

namespace CLI {
class App;
class Error;
class Option;
} // namespace CLI

namespace cdef {

std::vector<CLI::App *> subcommands_of(CLI::App &program);

/* A wrong command line. */
struct wrong_usage {
    std::string what;
    std::string command; /* whose help to read: "cdef", or "cdef check" */
};

/* Looks at the words of a command line before the library does, and puts them into an order that the library cannot
 * misunderstand: the subcommand, its options, "--", its operands. */
class usage {
public:
    /* words: without the name of the program. */
    usage(CLI::App &program, const std::vector<std::string> &words);

    /* An unknown option or subcommand, an option without its value, a flag with a value, or an operand too many.
     * Nothing if help is asked for before it. */
    const std::optional<wrong_usage> &mistake() const {
        return found;
    }
    /* The words in that order. If help is asked for, only the words for that. */
    std::vector<std::string> in_order() const;
    /* Why the library refuses these words: a wrong value, a missing operand, or options that exclude each other. */
    wrong_usage mistake_of(const CLI::Error &refused) const;

private:
    void look_at(const std::string &word, const std::string *next);
    void look_at_long(const std::string &word, const std::string *next);
    void look_at_short(const std::string &word, const std::string *next);
    void look_at_operand(const std::string &word);
    /* value: null if the command line ends before it. */
    void take_value(CLI::Option &option, const std::string &name, const std::string *value);
    void take_flag(CLI::Option &flag, const std::string &word);
    void fail(const std::string &what);
    bool has_subcommand() const;
    bool is_given(const CLI::Option &option) const;
    std::string missing_operand() const;
    std::string wrong_combination() const;

    CLI::App *command; /* the subcommand; until it is known, the program */
    bool only_operands = false;
    bool skips_next = false;          /* the next word is a value */
    std::string help;                 /* the flag that asks for help, or for the version; empty: none does */
    std::vector<std::string> options; /* and the subcommand */
    std::vector<std::string> operands;
    std::vector<CLI::Option *> given;
    std::optional<wrong_usage> found;
};

} // namespace cdef

#endif
