/* across.h: conflicts between classes that are built together, each of which is correct alone. */
#ifndef CDGEN_BUILD_ACROSS_H
#define CDGEN_BUILD_ACROSS_H

#include "check/check.h"
#include "check/known.h"
#include "check/view.h"

#include <cstddef>
#include <map>
#include <span>
#include <string>
#include <vector>

namespace build {

/* The class-to-manager map of a source: the keys of the class and the catalog with its texts. */
struct mapping {
    std::string catalog;
    check::mention manager;
    check::mention first_key;
    unsigned first = 0;
    unsigned last = 0;
};

struct variable_class {
    check::mention name;
    std::string alias;
    unsigned observed = 0; /* the two intervals */
    unsigned reported = 0;
};

/* The facts about a source that matter to other classes. */
struct class_facts {
    std::vector<check::mention> classes; /* their names */
    std::vector<mapping> maps;
    std::vector<variable_class> variable_classes;
};

/* The facts of a source without errors, whose database is the image. */
class_facts facts_of(const check::view &source, std::span<const std::byte> image);

/* Compares the sources of a build. */
class class_family {
public:
    /* Adds a source. Returns the wanted warnings about conflicts with earlier sources, at most one of each kind. */
    std::vector<check::finding> add(const std::string &source, const class_facts &facts,
                                    const check::warning_set &wanted_warnings);

private:
    template <class Fact> struct member {
        std::string source;
        Fact fact;
    };

    void warn(check::warning_id id, const check::mention &at, std::string text, check::elsewhere other);
    void look_at_name(const check::mention &name, const std::string &source);
    void look_at_keys(const mapping &map);
    void look_at_manager(const mapping &map);
    void look_at_variables(const variable_class &variables, const std::string &source);

    check::warning_set wanted = {};                                 /* of the source that is being added */
    std::map<std::string, member<check::mention>> classes;          /* by name */
    std::map<std::string, std::vector<member<mapping>>> maps;       /* by catalog */
    std::map<std::string, member<variable_class>> variable_classes; /* by name */
    std::vector<check::finding> found;                              /* about the source that is being added */
};

} // namespace build

#endif
