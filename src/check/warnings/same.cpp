/* same.cpp: warnings about names and Ids that are given twice. */

#include "check/warnings/watcher.h"

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
        if (int first = see.known.declared.earlier_name; first != 0)
            report(see, see.value_place(), another(see, "name"), {{first, 0, 0}, "first given here"});
    }
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
