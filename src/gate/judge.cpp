/* judge.cpp: whether a class may replace an older version. */

#include "gate/judge.h"

#include "compare/describe.h"
#include "gate/places.h"
#include "text/shown.h"

#include <string>
#include <utility>

namespace gate {

namespace {

check::finding finding_of(const compare::breach_rule &rule, std::string text, located where) {
    check::finding found;
    found.code = rule.code.data(); /* a literal */
    found.text = std::move(text.append(" (").append(rule.reason).append(")"));
    found.at = where.at;
    found.source = std::move(where.line);
    return found;
}

} // namespace

check::finding without_class(std::string_view name) {
    std::string text("- ");
    text.append(compare::row_of(compare::node_kind::resource_class).text).append(" ").append(text::quoted_ascii(name));
    return finding_of(compare::rule_of(compare::breach::GONE), std::move(text), {});
}

std::vector<check::finding> judge(const versions &of, compare::level up_to) {
    std::vector<check::finding> all;
    bool one_class = compare::has_one_class(of.before.db) && compare::has_one_class(of.after.db);
    std::size_t size = of.before.db.file().size() + of.after.db.file().size();
    source_places places(of.source);
    std::string text;
    compare::writer writer(size, [&text](std::string_view piece) { text += piece; });
    compare::compare(of.before, of.after, [&](const compare::difference &d) {
        check::finding *first = nullptr;
        for (compare::breach each : d.broken) {
            const compare::breach_rule &rule = compare::rule_of(each);
            if (rule.broken_for > up_to)
                continue;
            if (first == nullptr) {
                text.clear();
                compare::describe(d, one_class, writer);
                first = &all.emplace_back(finding_of(rule, text, places.of(d)));
            } else
                first->notes.push_back(
                    {first->at, std::string(rule.reason).append(" [").append(rule.code).append("]")});
        }
    });
    return all;
}

} // namespace gate
