/* codes.cpp: everything that cdef reports with a code. */

#include "cdef/explain/codes.h"

#include "cdb_view.h"
#include "check/check.h"
#include "compare/rules.h"
#include "gate/ids.h"
#include "language/messages.h"
#include "reader/diagnosis.h"

#include <algorithm>
#include <cctype>

namespace cdef {

namespace {

std::string upper(std::string_view text) {
    std::string capitals(text);
    for (char &c : capitals)
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    return capitals;
}

bool by_code(const explanation &a, const explanation &b) {
    return a.code < b.code;
}

explanation explained(const cdb::rule &row) {
    const char *severity = row.level == cdb::severity::error ? "error" : "warning";
    return {row.code, severity, {}, row.title, std::string(row.cause), std::string(row.cure), nullptr};
}

explanation explained(const compare::breach_rule &row) {
    return {
        row.code,
        "error",
        {},
        row.title,
        "The change breaks programs or data that rely on the older version: " + std::string(row.reason) +
            ". The rule applies at the level `" + std::string(compare::name_of(row.broken_for)) +
            "` and those after it.",
        "Undo the change, or add something new and keep the old. If nobody relies on the older version in this way, "
        "the change is harmless.",
        nullptr};
}

explanation explained(const gate::ids_rule &row) {
    const char *severity = row.name.empty() ? "error" : "warning";
    return {row.code, severity, row.name, row.title, std::string(row.cause), std::string(row.cure), nullptr};
}

} // namespace

std::vector<explanation> explanations() {
    std::vector<explanation> all;
    for (const message &row : message_rows)
        all.push_back({row.code, "error", {}, row.text, row.cause, row.cure, check::example_of(row.code)});
    for (const check::warning &row : check::warnings)
        all.push_back({row.code, "warning", row.name, row.title, row.cause, row.cure, check::example_of(row.code)});
    std::sort(all.begin(), all.end(), by_code);
    auto first_of_databases = static_cast<std::ptrdiff_t>(all.size());
    for (const cdb::rule &row : cdb::rules())
        all.push_back(explained(row));
    all.push_back(explained(cdb::contradicting_rule()));
    for (const compare::breach_rule &row : compare::breach_rules())
        all.push_back(explained(row));
    for (const gate::ids_rule &row : gate::ids_rules())
        all.push_back(explained(row));
    std::sort(all.begin() + first_of_databases, all.end(), by_code);
    return all;
}

const explanation *find(const std::vector<explanation> &all, std::string_view code) {
    auto found = std::find_if(all.begin(), all.end(), [&, capitals = upper(code)](const explanation &each) {
        return each.code == capitals || (!each.name.empty() && each.name == code);
    });
    return found == all.end() ? nullptr : &*found;
}

language::name_list nearest(const std::vector<explanation> &all, std::string_view text) {
    language::name_list names;
    for (const explanation &each : all) {
        names.push_back(each.code);
        if (!each.name.empty())
            names.push_back(each.name);
    }
    return language::one_edit_from(text, names);
}

} // namespace cdef
