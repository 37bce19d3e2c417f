/* values.cpp: warnings about single values that mean less than they say. */

#include "check/warnings/watcher.h"
#include "format/names.h"

#include <algorithm>
#include <iterator>

namespace check {

namespace {

class unused_default : public watcher {
public:
    using watcher::watcher;
    static constexpr std::array types = {AT_DEFAULT_VALUE};

    void value(const view &see) override {
        if (see.known.kind == SC_PERSISTENT_CLASS_ATTRIBUTE)
            report(see, see.name_place(),
                   "the default of a class attribute is that of its type: this one is never used");
    }
};

class permission : public watcher {
public:
    using watcher::watcher;
    static constexpr std::array types = {AT_PERMISSION};

    void value(const view &see) override {
        std::string_view text = see.value();
        place at = see.value_place();
        bool known = std::any_of(std::begin(perm_list), std::end(perm_list),
                                 [&](const valid_perms_t &each) { return each.permission == text[0]; });
        if (!known)
            report(see, at, "no permission has this letter, so that none is needed",
                   {at, "the letters are q, l, e, v, d, c, s, o, a and x"});
        else if (text.size() > 1)
            report(see, at, "only the first letter of a Permission counts");
    }
};

/* Where the element's default will be asked for, the compiler may refuse the type at the run's end. */
class element_type : public watcher {
public:
    using watcher::watcher;
    static constexpr std::array types = {AT_SD_DATA_TYPE};

    void value(const view &see) override {
        if (see.compiler.data_type() != VX_UNKNOWN || see.compiler.run_makes_value())
            return;
        place at = see.value_place();
        report(see, at, "unknown data type: the element gets none", {at, language::type_suggestion(see.value(), true)});
    }
};

} // namespace

made_watcher make_unused_default(const watcher_setup &setup) {
    return make<unused_default>(setup);
}

made_watcher make_permission(const watcher_setup &setup) {
    return make<permission>(setup);
}

made_watcher make_element_type(const watcher_setup &setup) {
    return make<element_type>(setup);
}

} // namespace check
