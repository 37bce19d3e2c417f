/* quotes.cpp: a warning about quotes within quoted values. */

#include "check/warnings/watcher.h"

#include <string>
#include <string_view>

namespace check {

namespace {

/* The next quote from a position on that has no backslash in front. */
size_t next_quote(std::string_view text, size_t from) {
    size_t quote = text.find('"', from);
    while (quote != std::string_view::npos && quote > 0 && text[quote - 1] == '\\')
        quote = text.find('"', quote + 1);
    return quote;
}

/* The first quote without a partner. In a pair, the first quote follows a blank or an operator, and the second is
 * followed by one of these or by nothing. */
size_t unpaired_quote(std::string_view text) {
    constexpr std::string_view APART = " \t()[]{}=!<>~&|+-*/,;:";
    for (size_t first = next_quote(text, 0); first != std::string_view::npos;) {
        size_t second = next_quote(text, first + 1);
        bool opens = first == 0 || APART.find(text[first - 1]) != std::string_view::npos;
        bool closes = second == text.size() - 1 ||
                      (second != std::string_view::npos && APART.find(text[second + 1]) != std::string_view::npos);
        if (!opens || !closes)
            return first;
        first = next_quote(text, second + 1);
    }
    return std::string_view::npos;
}

/* Values such as "user == "root"" are stored as intended, without the outer quotes. */
class text_after_quote : public watcher {
public:
    using watcher::watcher;

    void quoted_value(const view &see) override {
        std::string_view text = see.value();
        size_t quote = unpaired_quote(text);
        if (quote == std::string_view::npos)
            return;
        place at = see.part_of_value(quote, text.size() - quote);
        std::string whole = "\"" + std::string(text) + "\"";
        bool all_meant = unpaired_quote(whole) == std::string_view::npos;
        report(see, at, "a value ends with its last quote: this one and what follows belong to it",
               {at, all_meant ? "the outer quotes are not stored: if they are meant, write `" +
                                    std::string(see.attr().ta_name) + "=\"" + whole + "\"`"
                              : "remove this quote if it is not part of the value"});
    }
};

} // namespace

made_watcher make_text_after_quote(const watcher_setup &setup) {
    return make<text_after_quote>(setup);
}

} // namespace check
