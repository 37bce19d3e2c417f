/* expressions.cpp: a warning about incomplete expressions. The runtime defines their grammar; this only checks that
 * parentheses and quotes come in pairs. */

#include "language/expressions.h"
#include "check/warnings/watcher.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace check {

namespace {

/* A character without a partner, and its place. */
struct lone_character {
    size_t at;
    char character;
};

/* The first closing character without an opening one, or else the last opening one without a closing one. Parentheses
 * in quotes or after a backslash do not count. */
std::optional<lone_character> lone_in(std::string_view text) {
    std::vector<size_t> open; /* parentheses */
    for (size_t at = 0; at < text.size(); ++at) {
        char c = text[at];
        if (language::is_quote(c)) {
            size_t end = language::end_of_quoted(text, at);
            if (end == std::string_view::npos)
                return lone_character{at, c};
            at = end - 1;
        } else if (c == '\\' && at + 1 < text.size() && !language::is_quote(text[at + 1])) {
            ++at;
        } else if (c == '(') {
            open.push_back(at);
        } else if (c == ')' && open.empty()) {
            return lone_character{at, c};
        } else if (c == ')') {
            open.pop_back();
        }
    }
    if (!open.empty())
        return lone_character{open.back(), '('};
    return std::nullopt;
}

class unbalanced : public watcher {
public:
    using watcher::watcher;
    static constexpr auto types = std::array{AT_STRING};

    void value(const view &see) override {
        std::string_view name = name_of(see.attr());
        if (name != "Expression" && name != "ReArmExpression")
            return;
        std::optional<lone_character> lone = lone_in(see.value());
        if (!lone)
            return;
        std::string what(1, lone->character);
        std::string partner = what == "(" ? ")" : what == ")" ? "(" : what;
        advise(report(see, see.part_of_value(lone->at, 1), language::quoted(what) + " without its `" + partner + "`"),
               "add the other one, or remove this one");
    }
};

} // namespace

made_watcher make_unbalanced(const watcher_setup &setup) {
    return make<unbalanced>(setup);
}

} // namespace check
