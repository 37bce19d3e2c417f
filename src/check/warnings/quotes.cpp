/* quotes.cpp: a warning about quotes within quoted values. */

#include "check/warnings/watcher.h"

namespace check {

namespace {

class text_after_quote : public watcher {
public:
    using watcher::watcher;

    void quoted_value(const view &see) override {
        std::string_view text = see.value();
        size_t quote = text.find('"');
        while (quote != std::string_view::npos && quote > 0 && text[quote - 1] == '\\')
            quote = text.find('"', quote + 1);
        if (quote != std::string_view::npos)
            report(see, see.part_of_value(quote, text.size() - quote),
                   "a value ends with its last quote: this one and what follows belong to it");
    }
};

} // namespace

made_watcher make_text_after_quote(const watcher_setup &setup) {
    return make<text_after_quote>(setup);
}

} // namespace check
