/* reading.h: reads the values of a project file, and collects what is wrong with them. */
#ifndef CDGEN_CONFIG_READING_H
#define CDGEN_CONFIG_READING_H

#include "config/config.h"
#include "config/toml.h"
#include "language/words.h"

#include <string>
#include <string_view>
#include <vector>

namespace config {

class value_reader {
public:
    explicit value_reader(reading &to) : result(to) {}

    /* Each reads a value into `to`, or reports why it cannot. */
    void read_truth(const toml::node &value, bool &to);
    void read_word(const toml::node &value, const language::name_list &words, std::string &to);
    /* A relative path begins at the directory of the project file. */
    void read_path(const toml::node &value, std::string &to);
    /* A path, or a revision for git, which stays as it is. */
    void read_baseline(const toml::node &value, std::string &to);
    /* Names of warnings. */
    void read_warnings(const toml::node &value, std::vector<std::string> &to);

    void report(const toml::source_region &at, std::string_view text);
    void report_unknown(const toml::key &key, const std::string &what, const language::name_list &known);

private:
    /* The text of a value that has to be a text, which may not be empty; else nullptr. */
    const std::string *text_of(const toml::node &value);

    reading &result;
};

} // namespace config

#endif
