/* same.cpp: warnings about names and Ids that are given twice. */

#include "check/first_lines.h"
#include "check/warnings/watcher.h"

#include <string_view>

namespace check {

namespace {

std::string another(const view &see, const char *what) {
    return "another " + language::quoted(table_of(see.known.kind).sc_name) + " has the same " + what;
}

class same_name : public watcher {
public:
    using watcher::watcher;
    static constexpr std::array types = {AT_STRING, AT_SD_NAME};

    void value(const view &see) override {
        if (int first = earlier(see); first != 0)
            report(see, see.value_place(), another(see, "name"), {{first, 0, 0}, "first given here"});
    }

private:
    /* The line that gave the current line's name first; 0: none did. Variable classes belong to no class. */
    int earlier(const view &see) {
        if (see.known.kind != SC_RESOURCE_VARIABLE_CLASS)
            return see.known.declared.earlier_name;
        if (std::string_view(see.attr().ta_name) != "VariableClass")
            return 0;
        int &line = variable_classes.line_of(see.value());
        int first = line;
        if (first == 0)
            line = see.line.number;
        return first;
    }

    first_lines variable_classes;
};

class same_id : public watcher {
public:
    using watcher::watcher;
    static constexpr std::array types = {AT_ID};

    void value(const view &see) override {
        if (int first = see.known.declared.earlier_id; first != 0)
            report(see, see.value_place(), another(see, "Id"), {{first, 0, 0}, "first given here"});
    }
};

} // namespace

made_watcher make_same_name(const watcher_setup &setup) {
    return make<same_name>(setup);
}

made_watcher make_same_id(const watcher_setup &setup) {
    return make<same_id>(setup);
}

} // namespace check
