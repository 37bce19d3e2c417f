/* document.cpp: differences as JSON. */

#include "cdef/diff/document.h"

namespace cdef::diff {

namespace {

using compare::change;

const char *name_of(change what) {
    switch (what) {
    case change::REMOVED:
        return "removed";
    case change::ADDED:
        return "added";
    case change::RENAMED:
        return "renamed";
    case change::CHANGED:
        break;
    }
    return "changed";
}

const char *name_of(std::endian order) {
    return order == std::endian::big ? "big-endian" : "little-endian";
}

} // namespace

void document::begin(const std::string &before, const std::string &after) {
    to.open_object();
    to.add_schema("cdef-diff.schema.json", 2);
    to.add_text("before", before);
    to.add_text("after", after);
    to.open_list("differences");
}

void document::end() {
    to.close();
    to.open_list("mentions");
    for (const std::string &mention : mentions)
        to.add_json({}, mention);
    to.close();
    to.close();
}

void document::add(const compare::difference &d, const reasons &why) {
    to.open_object();
    to.add_text("change", name_of(d.what));
    add_path(d);
    if (d.what == change::RENAMED)
        to.add_json("name", values.of_name(*d.renamed_to));
    if (d.what == change::CHANGED)
        add_change(d);
    if (!why.empty())
        add_reasons(why);
    to.close();
}

/* The first node is the database. */
void document::add_path(const compare::difference &d) {
    to.open_list("path");
    for (const compare::node *n : d.path.subspan(1)) {
        to.open_object();
        to.add_text("kind", n->label());
        to.add_json("name", values.of_name(*n));
        to.close();
    }
    to.close();
}

void document::add_change(const compare::difference &d) {
    to.add_text("field", d.before->what->field);
    if (auto type = type_of(*d.before))
        to.add_text("before_type", *type);
    to.add_json("before", values.of_fact(*d.before));
    if (auto type = type_of(*d.after))
        to.add_text("after_type", *type);
    to.add_json("after", values.of_fact(*d.after));
}

void document::add_reasons(const reasons &why) {
    to.open_list("breaks");
    for (const compare::breach_rule *rule : why) {
        to.open_object();
        to.add_text("code", rule->code);
        to.add_text("level", compare::name_of(rule->broken_for));
        to.add_text("reason", rule->reason);
        to.close();
    }
    to.close();
}

void document::mention_version(const compare::difference &d) {
    mentions.push_back(R"({"mention": "lower_version", "class": )" + values.of_name(*d.path.back()) +
                       R"(, "before": )" + values.of_fact(*d.before) + R"(, "after": )" + values.of_fact(*d.after) +
                       "}");
}

void document::mention_order(std::endian before, std::endian after) {
    mentions.push_back(std::string(R"({"mention": "byte_order", "before": ")") + name_of(before) + R"(", "after": ")" +
                       name_of(after) + "\"}");
}

} // namespace cdef::diff
