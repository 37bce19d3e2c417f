/* ids.cpp: the file of all numbers that were ever in use. */

#include "gate/ids.h"

#include "format/names.h"
#include "language/suggestions.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <iterator>
#include <optional>
#include <utility>

namespace gate {

namespace {

using compare::node_kind;
using language::quoted;

constexpr std::string_view HEAD =
    "# Numbers that are or were in use: class, kind, number, type, name. Written by 'cdef gate --update'.\n";

constexpr ids_rule rows[] = {
    {"CMP401",
     {},
     "a number was used for another name",
     "`ids.lock` says that the number belonged to another attribute or action. Stored values and programs that use the "
     "number would now refer to the new one.",
     "Take a number that was never used. If no stored value and no program uses the number, accept it with `cdef gate "
     "--update`."},
    {"CMP402",
     {},
     "a number was used for another kind of attribute",
     "`ids.lock` says that the number belonged to an attribute of another kind: persistent instead of dynamic, or the "
     "other way round.",
     "Take a number that was never used, or accept it with `cdef gate --update`."},
    {"CMP403",
     {},
     "a number was used for values of another type",
     "`ids.lock` says that values under the number have another type. Stored values would be misread.",
     "Define a new attribute with a number that was never used, or accept it with `cdef gate --update`."},
    {"CMP404", "unrecorded-number", "a number is not in ids.lock",
     "The number is new. Unless it is recorded, it can be used again for something else later.",
     "Run `cdef gate --update` and keep `ids.lock` with the sources."},
};
static_assert(std::size(rows) == static_cast<std::size_t>(ids_breach::UNRECORDED) + 1);

/* Characters that are written with a backslash, and what follows it. A line that begins with # is a comment. */
constexpr std::pair<char, char> ESCAPES[] = {{'\t', 't'}, {'\n', 'n'}, {'\r', 'r'}, {'\\', '\\'}, {'#', '#'}};

void append_field(std::string &to, std::string_view text, char end) {
    for (char c : text) {
        const auto *found = std::find_if(std::begin(ESCAPES), std::end(ESCAPES), [c](auto &e) { return e.first == c; });
        if (found == std::end(ESCAPES))
            to += c;
        else
            to.append("\\").append(1, found->second);
    }
    to += end;
}

/* No value if a backslash begins no known escape. */
std::optional<std::string> unescaped(std::string_view field) {
    std::string text;
    for (std::size_t i = 0; i < field.size(); ++i) {
        if (field[i] != '\\') {
            text += field[i];
            continue;
        }
        char second = ++i < field.size() ? field[i] : '\0';
        const auto *found =
            std::find_if(std::begin(ESCAPES), std::end(ESCAPES), [second](auto &e) { return e.second == second; });
        if (found == std::end(ESCAPES))
            return std::nullopt;
        text += found->first;
    }
    return text;
}

constexpr auto recorded_kinds = std::array{node_kind::persistent_attribute,
                                           node_kind::dynamic_attribute,
                                           node_kind::persistent_class_attribute,
                                           node_kind::dynamic_class_attribute,
                                           node_kind::action,
                                           node_kind::class_action};

std::optional<node_kind> kind_called(std::string_view text) {
    const auto *found = std::find_if(recorded_kinds.begin(), recorded_kinds.end(),
                                     [text](node_kind kind) { return compare::row_of(kind).text == text; });
    return found == recorded_kinds.end() ? std::nullopt : std::optional(*found);
}

/* Persistent and dynamic attributes share their numbers; the family of both is that of the persistent ones. */
node_kind family_of(node_kind kind) {
    if (kind == node_kind::dynamic_attribute)
        return node_kind::persistent_attribute;
    return kind == node_kind::dynamic_class_attribute ? node_kind::persistent_class_attribute : kind;
}

std::string spelled(vx_data_type_t type) {
    for (std::size_t i = 0; i < std::size(vxTypeMap); ++i)
        if (vxTypeMap[i] == type)
            return vxTypeStr[i];
    return std::to_string(type);
}

constexpr std::size_t FIELDS = 5;

std::optional<std::array<std::string, FIELDS>> fields_of(std::string_view line) {
    std::array<std::string, FIELDS> fields;
    for (std::string &field : fields) {
        std::size_t end = line.find('\t');
        bool is_last = &field == &fields.back();
        if ((end == std::string_view::npos) != is_last)
            return std::nullopt;
        std::optional<std::string> text = unescaped(line.substr(0, end));
        if (!text)
            return std::nullopt;
        field = std::move(*text);
        if (!is_last)
            line.remove_prefix(end + 1);
    }
    return fields;
}

std::optional<numbered> numbered_in(std::string_view line) {
    auto fields = fields_of(line);
    if (!fields)
        return std::nullopt;
    auto &[class_name, kind_name, digits, type, name] = *fields;
    std::optional<node_kind> kind = kind_called(kind_name);
    vx_int32_t number = 0;
    auto [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), number);
    if (!kind || error != std::errc() || end != digits.data() + digits.size())
        return std::nullopt;
    return numbered{std::move(class_name), *kind, number, std::move(name), std::move(type)};
}

/* Which rule a new meaning of a number breaks; nothing if it is the old one. */
std::optional<ids_breach> breach_of(const numbered &was, const numbered &is) {
    if (was.name != is.name)
        return ids_breach::NAME;
    if (was.kind != is.kind)
        return ids_breach::KIND;
    return was.type == is.type ? std::nullopt : std::optional(ids_breach::TYPE);
}

/* "the `PersistentResourceAttribute` `Size` of type `Int32`" */
std::string shown(const numbered &one) {
    std::string text = "the " + quoted(compare::row_of(one.kind).text) + " " + quoted(one.name);
    return one.type == "-" ? text : text + " of type " + quoted(one.type);
}

check::finding finding_of(ids_breach b, const numbered &is, std::string text, const source_places &places) {
    constexpr std::array<const char *, 4> attributes = {"Id", "Id", "DataType", "Id"};
    const ids_rule &rule = rule_of(b);
    located where = places.of(stanza_kind_of(is.kind), is.name, attributes.at(static_cast<std::size_t>(b)));
    check::finding found;
    found.error = rule.name.empty();
    found.code = rule.code.data(); /* literals */
    if (!found.error)
        found.name = rule.name.data();
    found.text = std::move(text);
    found.at = where.at;
    found.source = std::move(where.line);
    return found;
}

} // namespace

const ids_rule &rule_of(ids_breach b) {
    return rows[static_cast<std::size_t>(b)];
}

std::span<const ids_rule> ids_rules() {
    return rows;
}

std::vector<numbered> numbers_of(const cdb::database &db) {
    std::vector<numbered> all;
    for (const cdb::resource_class &one : db.classes()) {
        std::string name(one.name());
        auto add_attributes = [&](const auto &list, node_kind kind) {
            for (const auto &each : list)
                all.push_back({name, kind, each.record().ra_attr_id, std::string(each.name()), spelled(each.type())});
        };
        auto add_actions = [&](const auto &list, node_kind kind) {
            for (const auto &each : list)
                all.push_back({name, kind, each.record().ac_action_id, std::string(each.name()), "-"});
        };
        add_attributes(one.persistent_attributes(cdb::level::of_resource), node_kind::persistent_attribute);
        add_attributes(one.dynamic_attributes(cdb::level::of_resource), node_kind::dynamic_attribute);
        add_attributes(one.persistent_attributes(cdb::level::of_class), node_kind::persistent_class_attribute);
        add_attributes(one.dynamic_attributes(cdb::level::of_class), node_kind::dynamic_class_attribute);
        add_actions(one.actions(cdb::level::of_resource), node_kind::action);
        add_actions(one.actions(cdb::level::of_class), node_kind::class_action);
    }
    return all;
}

id_record::key id_record::key_of(const numbered &of) {
    return {of.class_name, family_of(of.kind), of.number};
}

void id_record::add(std::string_view line, std::size_t line_number) {
    if (line.ends_with('\r')) /* in a name, it is written as \r */
        throw wrong_ids(std::to_string(line_number) + ": the line ends with a carriage return before the newline");
    if (line.empty() || line.starts_with('#'))
        return;
    std::optional<numbered> read = numbered_in(line);
    if (!read)
        throw wrong_ids(std::to_string(line_number) +
                        ": expected class, kind, number, type and name, with tabs between");
    key place = key_of(*read);
    auto [at, is_new] = known.emplace(place, *read);
    if (!is_new && at->second != *read)
        throw wrong_ids(std::to_string(line_number) + ": the number is also that of " + shown(at->second));
}

id_record::id_record(std::string_view text) {
    for (std::size_t line_number = 1; !text.empty(); ++line_number) {
        std::size_t end = std::min(text.find('\n'), text.size());
        add(text.substr(0, end), line_number);
        text.remove_prefix(std::min(end + 1, text.size()));
    }
}

std::string id_record::text() const {
    std::string all(HEAD);
    for (const auto &[place, one] : known) {
        append_field(all, one.class_name, '\t');
        append_field(all, compare::row_of(one.kind).text, '\t');
        append_field(all, std::to_string(one.number), '\t');
        append_field(all, one.type, '\t');
        append_field(all, one.name, '\n');
    }
    return all;
}

std::vector<check::finding> id_record::judge(const std::vector<numbered> &of, const source_places &places) const {
    std::vector<check::finding> all;
    for (const numbered &is : of) {
        std::string number = "the number " + std::to_string(is.number);
        auto was = known.find(key_of(is));
        if (was == known.end()) {
            all.push_back(
                finding_of(ids_breach::UNRECORDED, is, number + " of " + shown(is) + " is not recorded", places));
            continue;
        }
        if (std::optional<ids_breach> broken = breach_of(was->second, is))
            all.push_back(finding_of(
                *broken, is, number + " is recorded for " + shown(was->second) + ", not for " + shown(is), places));
    }
    return all;
}

void id_record::accept(const std::vector<numbered> &of) {
    for (const numbered &one : of)
        known.insert_or_assign(key_of(one), one);
}

} // namespace gate
