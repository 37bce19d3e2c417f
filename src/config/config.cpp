/* config.cpp: the keys of a project file, as a table, and the way through the file. docs/config.md is checked against
 * the table. */

#include "config/config.h"

#include "check/switches.h"
#include "config/reading.h"
#include "text/shown.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <memory>
#include <tuple>

namespace config {

namespace {

/* To add a key: a member of the settings, and a row. */
struct row {
    std::string_view table;
    std::string_view key;
    void (*read)(value_reader &reader, const toml::node &value, settings &to);
};

constexpr row rows[] = {
    {"warnings", "on", [](value_reader &r, const toml::node &v, settings &to) { r.read_warnings(v, to.warnings_on); }},
    {"warnings", "off",
     [](value_reader &r, const toml::node &v, settings &to) { r.read_warnings(v, to.warnings_off); }},
    {"warnings", "werror",
     [](value_reader &r, const toml::node &v, settings &to) { r.read_truth(v, to.warnings_count); }},
    {"build", "directory", [](value_reader &r, const toml::node &v, settings &to) { r.read_path(v, to.directory); }},
    {"build", "byte-order",
     [](value_reader &r, const toml::node &v, settings &to) {
         r.read_word(v, {"native", "little", "big", "both"}, to.byte_order);
     }},
    {"gate", "level",
     [](value_reader &r, const toml::node &v, settings &to) {
         r.read_word(v, {"readers", "clients", "stored"}, to.level);
     }},
    {"gate", "baseline", [](value_reader &r, const toml::node &v, settings &to) { r.read_baseline(v, to.baseline); }},
    {"gate", "ids", [](value_reader &r, const toml::node &v, settings &to) { r.read_path(v, to.ids); }},
};

language::name_list table_names() {
    language::name_list names;
    for (const row &each : rows)
        if (names.empty() || names.back() != each.table)
            names.push_back(each.table);
    return names;
}

language::name_list keys_of(std::string_view table) {
    language::name_list names;
    for (const row &each : rows)
        if (each.table == table)
            names.push_back(each.key);
    return names;
}

void read_key(value_reader &reader, std::string_view table, const toml::key &key, const toml::node &value,
              settings &to) {
    for (const row &each : rows)
        if (each.table == table && each.key == key.str())
            return each.read(reader, value, to);
    reader.report_unknown(key, "key of " + ("[" + std::string(table) + "]:"), keys_of(table));
}

void read_table(value_reader &reader, const toml::key &name, const toml::node &value, settings &to) {
    language::name_list known = table_names();
    const toml::table *table = value.as_table();
    if (std::find(known.begin(), known.end(), name.str()) == known.end())
        reader.report_unknown(name, table == nullptr ? "key" : "table", known);
    else if (table == nullptr)
        reader.report(value.source(), "expected a table, [" + std::string(name.str()) + "]");
    else
        for (auto &&[key, each] : *table)
            read_key(reader, name.str(), key, each, to);
}

/* The line at which the parser's assertion fails: the last line of the shortest beginning of the file that makes it. */
int broken_line(std::string_view bytes) {
    int line = 1;
    for (std::size_t end = bytes.find('\n'); end != std::string_view::npos; end = bytes.find('\n', end + 1), ++line) {
        try {
            static_cast<void>(toml::parse(bytes.substr(0, end)));
        } catch (const broken_assumption &) {
            break;
        } catch (const toml::parse_error &) {
            continue; /* a part of a value, perhaps */
        }
    }
    return line;
}

void read_file(std::string_view bytes, reading &result) {
    value_reader reader(result);
    try {
        toml::table file = toml::parse(bytes);
        for (auto &&[name, value] : file)
            read_table(reader, name, value, result.values);
    } catch (const toml::parse_error &wrong) {
        reader.report(wrong.source(), wrong.description());
    } catch (const broken_assumption &) {
        result.problems.push_back({broken_line(bytes), 1, "expected a key or a table"});
    }
}

} // namespace

check::warning_set settings::warnings() const {
    check::warning_set set;
    set.fill(true);
    check::switch_warnings(set, warnings_off, false);
    check::switch_warnings(set, warnings_on, true);
    return set;
}

std::vector<key_name> known_keys() {
    std::vector<key_name> all;
    for (const row &each : rows)
        all.push_back({each.table, each.key});
    return all;
}

reading parse(std::string_view bytes, const std::string &path) {
    reading result;
    result.values.path = path;
    if (bytes.size() > MOST_BYTES)
        result.problems.push_back({0, 0, "more than " + std::to_string(MOST_BYTES) + " bytes"});
    else
        read_file(bytes, result);
    std::stable_sort(result.problems.begin(), result.problems.end(), [](const problem &a, const problem &b) {
        return std::tie(a.line, a.column) < std::tie(b.line, b.column);
    });
    return result;
}

reading load(const std::string &path) {
    std::unique_ptr<std::FILE, int (*)(std::FILE *)> file(std::fopen(path.c_str(), "rbe"), &std::fclose);
    std::array<char, MOST_BYTES + 1> bytes;
    std::size_t size = file ? std::fread(bytes.data(), 1, bytes.size(), file.get()) : 0;
    if (!file || std::ferror(file.get()) != 0)
        return {{.path = path}, {{0, 0, std::strerror(errno)}}};
    return parse({bytes.data(), size}, path);
}

reading load_found(const std::string &path) {
    std::error_code error;
    std::filesystem::file_status is = std::filesystem::status(path, error);
    if (std::filesystem::exists(is) && !std::filesystem::is_regular_file(is))
        return {{.path = path}, {{0, 0, "not a regular file"}}};
    return load(path);
}

std::string as_text(const std::string &path, const problem &what) {
    std::string place =
        what.line == 0 ? path : path + ":" + std::to_string(what.line) + ":" + std::to_string(what.column);
    return place + ": " + what.text;
}

} // namespace config
