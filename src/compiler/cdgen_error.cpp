/* cdgen_error.cpp: the fatal exits. */

#include "compiler/cdgen_error.h"

#include "compiler/cdgen_context.h"

std::array<const char *, 3> words_of(const fatal_exit &failure) {
    auto or_empty = [](const char *text) { return text == nullptr ? "" : text; };
    const message &known = message_of(failure.id);
    const char *detail1 = or_empty(failure.detail1);
    const char *detail2 = or_empty(failure.detail2);
    if (known.place == text_place::AFTER_ITEM)
        return {detail1, known.text, detail2};
    return {known.text, detail1, detail2};
}

void cdgen_error_exit(message_id id, const char *detail1, const char *detail2, int line, int code) {
    throw fatal_exit{id, detail1, detail2, line, code};
}

void bld_error_exit(message_id id, const char *detail1, const char *detail2, int code) {
    throw fatal_exit{id, detail1, detail2, 0, code};
}

void source_error(cdgen &cx, message_id id, const char *detail1, const char *detail2) {
    cdgen_error_exit(id, detail1, detail2, cx.source.shown_line(), 1);
}
