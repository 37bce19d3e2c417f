/* cdgen_attr.cpp: takes one attribute line: its syntax, and the rules of order and repetition. */

#include "compiler/cdgen_attr.h"

#include "compiler/cdgen_values.h"

#include <cstdio>

namespace {

/* Splits a line into name and value, each ended by a NUL; no value if there is nothing to store. */
struct name_value {
    std::string_view name;
    char *value;
    size_t length;
};

char *find_equals(cdgen &cx, const attr_text &text) {
    void *equals = memchr(text.name, '=', static_cast<size_t>(text.end - text.name));
    if (equals == nullptr)
        source_error(cx, MSG_NO_EQUALS);
    return static_cast<char *>(equals);
}

/* known: the attribute that the line begins with; null if it is still to be found. */
name_value split_line(cdgen &cx, const attr_text &text, const table_attrs *known) {
    char *name = text.name;
    char *end = text.end;
    if (known == nullptr)
        cx.source.linepos = 1 + static_cast<int>(name - text.line);
    if (known == nullptr && name == end)
        return {};
    char *equals = known != nullptr ? name + known->ta_length : find_equals(cx, text);
    *equals = '\0';
    char *value = equals + 1;
    if (static_cast<unsigned char>(*value) <= '"') { /* an empty value, a quote or a blank; rarely another */
        if (value[0] == '"' && value[1] == '"' && value[2] == '\0')
            return {};
        value = strip_quotes(value, &end);
        if (value == nullptr)
            source_error(cx, MSG_UNMATCHED_QUOTES, name);
    }
    auto length = static_cast<size_t>(end - value);
    if (length > VALUE_MAX_CHARS)
        source_error(cx, MSG_VALUE_TOO_LONG, name);
    cx.source.linepos = 1 + static_cast<int>(value - text.line);
    return {{name, static_cast<size_t>(equals - name)}, value, length};
}

/* The attribute of that name, when it was not the expected one. */
const table_attrs &known_attr(cdgen &cx, const srtable_ctrl &scp, stanza_state &state, std::string_view name) {
    const table_attrs *attr = find_attr(scp, name);
    if (attr == nullptr)
        source_error(cx, MSG_UNKNOWN_ATTRIBUTE, name.data(), scp.sc_name);
    state.order.took(scp, *attr);
    return *attr;
}

bool missing_excused(const cdgen &cx, const srtable_ctrl &scp) {
    return cx.options.observer != nullptr &&
           cx.options.observer->excuses_missing(static_cast<int>(&scp - sc_tables.data()));
}

/* Optional attributes follow the required ones; most may be given only once. */
void count_optional(cdgen &cx, const srtable_ctrl &scp, stanza_state &state, const table_attrs &attr) {
    if (state.req_mask != scp.req_mask_cmplt && !missing_excused(cx, scp))
        source_error(cx, MSG_OPTIONAL_TOO_EARLY, attr.ta_name);
    if ((state.opt_mask & attr.req_bit & ~OPTIONAL) != 0 && !attr.dup_allowed)
        source_error(cx, MSG_REPEATED_ATTRIBUTE, attr.ta_name);
    state.opt_mask |= attr.req_bit;
}

void count_required(cdgen &cx, stanza_state &state, const table_attrs &attr) {
    if ((state.req_mask & attr.req_bit) != 0 && !attr.dup_allowed)
        source_error(cx, MSG_REPEATED_ATTRIBUTE, attr.ta_name);
    state.req_mask |= attr.req_bit;
    if (cx.options.debugLevel >= 2)
        printf("Added %x to mask, which is now %x\n", attr.req_bit, state.req_mask);
}

} // namespace

void save_attr_line(cdgen &cx, const attr_text &text, const srtable_ctrl &scp, stanza_state &state, char *record) {
    const table_attrs *expected = state.order.expected(scp, text.name);
    *text.end = '\0'; /* not before: reading a byte that has just been written, in a word with others, takes long */
    auto [name, value, length] = split_line(cx, text, expected);
    if (value == nullptr)
        return;
    const table_attrs &attr = expected != nullptr ? *expected : known_attr(cx, scp, state, name);
    if (cx.options.observer != nullptr)
        cx.options.observer->attribute_read(attr, {value, length});
    if (*value == '\0') {
        if (cx.options.explanations != nullptr)
            fprintf(cx.options.explanations, "In file %s: ", cx.options.cdefsrc);
        source_error(cx, MSG_NO_VALUE, attr.ta_name);
    }
    if (cx.options.debugLevel >= 2)
        printf("%s: found attr: \"%s\", value: \"%s\",length: %d\n", scp.sc_name, attr.ta_name, value,
               static_cast<int>(length));
    if ((attr.req_bit & OPTIONAL) != 0)
        count_optional(cx, scp, state, attr);
    else
        count_required(cx, state, attr);
    store_value({cx, scp, state, record, attr, value, length});
}
