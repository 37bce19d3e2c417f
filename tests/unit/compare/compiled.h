/* compiled.h: databases that are compiled in memory, for tests of comparisons. */
#ifndef CDGEN_TESTS_COMPARE_COMPILED_H
#define CDGEN_TESTS_COMPARE_COMPILED_H

#include "compare/compare.h"
#include "compare/writer.h"
#include "compiler/stepwise.h"
#include "reader/owners.h"

#include <string>
#include <vector>

namespace compiled {

/* The database that a source compiles to. */
inline std::vector<std::byte> image_of(const std::string &text) {
    no_observer observer;
    stepwise_compiler compiler("source", "C.cdef", observer);
    compiler.take_source(text);
    return compiler.image();
}

struct database {
    explicit database(const std::string &text) : image(image_of(text)), db(image), owners(cdb::owners_in(db)) {}
    database(const database &) = delete;
    database &operator=(const database &) = delete;

    compare::origin origin() const {
        return {db, owners};
    }

    std::vector<std::byte> image;
    cdb::database db;
    cdb::ownership owners;
};

/* The source of a class C of these stanzas. */
inline std::string source_of(const std::string &stanzas) {
    return "ControlDefinition\n\tFileVersion=1\nResourceClass\n\tDescription=1\n\tDisplayName=2\n"
           "\tProperties=CanDefine\n\tClassPermTemplate=0\n\tResourcePermTemplate=0\n\tName=C\n" +
           stanzas +
           "ClassToManagerMapping\n\tResourceManager=M\n\tFirstKey=1\n\tLastKey=9\n\tDescriptiveMessageSet=1\n";
}

/* A persistent resource attribute. lines: each "Name=value\n". */
inline std::string attribute(const std::string &name, int id, const std::string &type = "Int32",
                             const std::string &lines = "") {
    std::string text = "PersistentResourceAttribute\n\tName=" + name +
                       "\n\tDescription=3\n\tDisplayName=4\n\tId=" + std::to_string(id) + "\n\tDataType=" + type +
                       "\n\tVarietyRange=0,1\n";
    for (std::size_t at = 0; at < lines.size();) {
        std::size_t end = lines.find('\n', at) + 1;
        text += "\t" + lines.substr(at, end - at);
        at = end;
    }
    return text;
}

/* "changed 'A' type Int32 -> String: CMP104 CMP303", a line for each difference. */
inline std::string line_of(const compare::difference &d) {
    constexpr const char *WORDS[] = {"removed", "added", "renamed", "changed"};
    std::string line = std::string(WORDS[static_cast<std::size_t>(d.what)]) + " " + name_of(*d.path.back());
    if (d.what == compare::change::RENAMED)
        line += " to " + name_of(*d.renamed_to);
    if (d.what == compare::change::CHANGED)
        line += " " + std::string(d.before->what->label()) + " " + text_of(*d.before) + " -> " + text_of(*d.after);
    std::string codes;
    for (compare::breach b : d.broken)
        codes += " " + std::string(compare::rule_of(b).code);
    return line + (codes.empty() ? "" : ":" + codes);
}

/* The differences between two classes of these stanzas. */
inline std::vector<std::string> differences(const std::string &before, const std::string &after) {
    database older(source_of(before)), newer(source_of(after));
    compare::origin one = older.origin(), other = newer.origin();
    std::vector<std::string> lines;
    compare::compare(one, other, [&lines](const compare::difference &d) { lines.push_back(line_of(d)); });
    return lines;
}

using lines = std::vector<std::string>;

} // namespace compiled

#endif
