/* describe.cpp: a difference as a line of text. */

#include "compare/describe.h"

namespace compare {

namespace {

std::string_view sign_of(change what) {
    return what == change::REMOVED ? "- " : what == change::ADDED ? "+ " : "~ ";
}

/* Neither the database nor, if there is just one, the class. */
void write_path(const difference &d, bool one_class, writer &to) {
    bool in_only_class = d.path.size() > 2 && one_class && d.path[1]->kind == node_kind::resource_class;
    std::size_t first = d.path.size() == 1 ? 0 : in_only_class ? 2 : 1;
    for (std::size_t i = first; i < d.path.size(); ++i) {
        to.write(i == first ? "" : ", ");
        to.write(d.path[i]->label());
        to.write(has_name(*d.path[i]) ? " " : "");
        to.write_name(*d.path[i]);
    }
}

void write_change(const difference &d, writer &to) {
    to.write(": ");
    to.write(d.before->what->label());
    to.write(" ");
    to.write_fact(*d.before);
    to.write(" -> ");
    to.write_fact(*d.after);
}

} // namespace

bool has_one_class(const cdb::database &db) {
    auto classes = db.classes();
    auto first = classes.begin();
    return first != classes.end() && ++first == classes.end();
}

void describe(const difference &d, bool one_class, writer &to) {
    to.write(sign_of(d.what));
    write_path(d, one_class, to);
    if (d.what == change::RENAMED) {
        to.write(": renamed to ");
        to.write_name(*d.renamed_to);
    }
    if (d.what == change::CHANGED)
        write_change(d, to);
}

} // namespace compare
