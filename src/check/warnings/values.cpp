/* values.cpp: warnings about single values that have less effect than it seems. */

#include "check/warnings/watcher.h"
#include "format/data_types.h"
#include "format/names.h"

#include <algorithm>
#include <iterator>
#include <string_view>
#include <vector>

namespace check {

namespace {

class unused_default : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_DEFAULT_VALUE};

    void value(const view &see) override {
        if (see.known.kind == SC_PERSISTENT_CLASS_ATTRIBUTE)
            report(see, see.name_place(),
                   "the default of a class attribute is that of its type: this one is never used");
    }
};

class permission : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_PERMISSION};

    void value(const view &see) override {
        std::string_view text = see.value();
        place at = see.value_place();
        bool known = std::any_of(std::begin(perm_list), std::end(perm_list),
                                 [&](const valid_perms_t &each) { return each.permission == text[0]; });
        if (!known)
            report(see, at, "no permission has this letter, so no permission is needed",
                   {at, "the letters are q, l, e, v, d, c, s, o, a and x"});
        else if (text.size() > 1)
            report(see, at, "only the first letter of a Permission counts");
    }
};

/* If the element needs a default, the compiler may refuse its type at the end of the run. */
class element_type : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_SD_DATA_TYPE};

    void value(const view &see) override {
        if (see.compiler.data_type() != VX_UNKNOWN || see.compiler.run_makes_value())
            return;
        place at = see.value_place();
        report(see, at, "unknown data type: the element gets none", {at, language::type_suggestion(see.value(), true)},
               see.line.renamed(at, see.line.raw, language::type_meant_by(see.value(), true)));
    }
};

class ignored_range : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_RANGE};

    void value(const view &see) override {
        switch (scalar_vx(see.compiler.data_type())) {
        case VX_CHAR_PTR:
        case VX_BINARY_PTR:
        case VX_RSRC_HANDLE_PTR:
        case VX_SD_PTR:
            return look_at(see);
        default:
            return;
        }
    }

private:
    void look_at(const view &see) {
        bool text = scalar_vx(see.compiler.data_type()) == VX_CHAR_PTR;
        advise(report(see, see.text_place(),
                      "the type " + language::quoted(see.known.stanza().data_type.text) +
                          " has no range: this line is ignored"),
               text ? "remove the line, or write a `ValidStateValue`" : "remove the line");
    }
};

class properties : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_CLASS_PROPS, AT_PATTR_PROPS, AT_DATTR_PROPS, AT_ACTION_PROPS};

    void value(const view &see) override {
        std::string_view list = see.value();
        std::vector<std::string_view> earlier;
        for (size_t begin = 0; begin < list.size();) {
            size_t end = std::min(list.find(',', begin), list.size());
            std::string_view name = list.substr(begin, end - begin);
            look_at(see, see.part_of_value(begin, name.size()), name, earlier);
            earlier.push_back(name);
            begin = end + 1;
        }
    }

private:
    void look_at(const view &see, const place &at, std::string_view name,
                 const std::vector<std::string_view> &earlier) {
        if (name.empty())
            return;
        if (std::find(earlier.begin(), earlier.end(), name) != earlier.end())
            return advise(report(see, at, "this property has already been given"), "remove one of the two");
        for (std::string_view other : earlier)
            if (contradict(name, other))
                return advise(report(see, at, language::quoted(name) + " contradicts " + language::quoted(other)),
                              "remove one of the two");
    }
    /* Whether a client must, may or must not give the attribute when it defines a resource. An attribute that must be
     * given cannot be read-only. */
    static bool contradict(std::string_view one, std::string_view other) {
        constexpr std::string_view PAIRS[][2] = {{"ReqdForDefine", "OptForDefine"},
                                                 {"ReqdForDefine", "InvalForDefine"},
                                                 {"OptForDefine", "InvalForDefine"},
                                                 {"ReqdForDefine", "ReadOnly"}};
        return std::any_of(std::begin(PAIRS), std::end(PAIRS), [&](const auto &pair) {
            return (pair[0] == one && pair[1] == other) || (pair[0] == other && pair[1] == one);
        });
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

made_watcher make_ignored_range(const watcher_setup &setup) {
    return make<ignored_range>(setup);
}

made_watcher make_properties(const watcher_setup &setup) {
    return make<properties>(setup);
}

} // namespace check
