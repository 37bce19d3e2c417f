/* cdgen_attr.cpp: takes one attribute line: its syntax, and the rules of order and repetition. */

#include "compiler/cdgen_attr.h"

#include "compiler/cdgen_values.h"

#include <cstdio>

namespace {

/* The name in the line, with a NUL at its end, for a message. */
const char *ended_name(attr_text text, char *equals) {
    *equals = '\0';
    return text.name;
}

char *find_equals(cdgen &cx, attr_text text) {
    void *equals = memchr(text.name, '=', static_cast<size_t>(text.end - text.name));
    if (equals == nullptr)
        source_error(cx, MSG_NO_EQUALS);
    return static_cast<char *>(equals);
}

/* A value without its quotes. */
struct bare_value {
    char *text; /* null if the value consists of two quotes only: the line is then ignored */
    char *end;
};

[[gnu::noinline]] bare_value unquoted(cdgen &cx, attr_text text, char *equals) {
    char *value = equals + 1;
    char *end = text.end;
    *end = '\0';
    if (value[0] == '"' && value[1] == '"' && value[2] == '\0')
        return {nullptr, end};
    value = strip_quotes(value, &end);
    if (value == nullptr)
        source_error(cx, MSG_UNMATCHED_QUOTES, ended_name(text, equals));
    return {value, end};
}

/* The attribute of that name, when it was not the expected one. */
const table_attrs &known_attr(cdgen &cx, attr_text text, char *equals) {
    const srtable_ctrl &kind = *cx.framing.scp;
    const table_attrs *attr = find_attr(kind, {text.name, static_cast<size_t>(equals - text.name)});
    if (attr == nullptr)
        source_error(cx, MSG_UNKNOWN_ATTRIBUTE, ended_name(text, equals), kind.sc_name);
    cx.framing.state->order.took(kind, *attr);
    return *attr;
}

void observe(const cdgen &cx, const table_attrs &attr, bare_value value) {
    if (cx.options.observer != nullptr)
        cx.options.observer->attribute_read(attr, {value.text, static_cast<size_t>(value.end - value.text)});
}

/* A value that is too long is refused whatever its name is; an empty one only after its name has been found. */
[[noreturn]] void refuse_length(cdgen &cx, attr_text text, const table_attrs *attr, char *equals, bare_value value) {
    if (value.end != value.text)
        source_error(cx, MSG_VALUE_TOO_LONG, ended_name(text, equals));
    cx.source.point_at(text.line, value.text);
    if (attr == nullptr)
        attr = &known_attr(cx, text, equals);
    observe(cx, *attr, value);
    if (cx.options.explanations != nullptr)
        fprintf(cx.options.explanations, "In file %s: ", cx.options.cdefsrc);
    source_error(cx, MSG_NO_VALUE, attr->ta_name);
}

/* Reports a line of a stanza that is watched. */
[[gnu::noinline]] void watch(const cdgen &cx, const table_attrs &attr, bare_value value) {
    observe(cx, attr, value);
    if (cx.options.debugLevel < 2)
        return;
    *value.end = '\0';
    printf("%s: found attr: \"%s\", value: \"%s\",length: %d\n", cx.framing.scp->sc_name, attr.ta_name, value.text,
           static_cast<int>(value.end - value.text));
}

bool missing_excused(const cdgen &cx, const srtable_ctrl &scp) {
    return cx.options.observer != nullptr &&
           cx.options.observer->excuses_missing(static_cast<int>(&scp - sc_tables.data()));
}

/* Optional attributes follow the required ones; most may be given only once. */
void count_optional(cdgen &cx, const table_attrs &attr) {
    const srtable_ctrl &kind = *cx.framing.scp;
    stanza_state &state = *cx.framing.state;
    if (state.req_mask != kind.req_mask_cmplt && !missing_excused(cx, kind))
        source_error(cx, MSG_OPTIONAL_TOO_EARLY, attr.ta_name);
    if ((state.opt_mask & attr.req_bit & ~OPTIONAL) != 0 && !attr.dup_allowed)
        source_error(cx, MSG_REPEATED_ATTRIBUTE, attr.ta_name);
    state.opt_mask |= attr.req_bit;
}

void count_required(cdgen &cx, const table_attrs &attr) {
    stanza_state &state = *cx.framing.state;
    if ((state.req_mask & attr.req_bit) != 0 && !attr.dup_allowed)
        source_error(cx, MSG_REPEATED_ATTRIBUTE, attr.ta_name);
    state.req_mask |= attr.req_bit;
    if (cx.framing.watched && cx.options.debugLevel >= 2)
        printf("Added %x to mask, which is now %x\n", attr.req_bit, state.req_mask);
}

} // namespace

void save_attr_line(cdgen &cx, char *line, char *name, char *end) {
    attr_text text = {line, name, end};
    const table_attrs *attr = cx.framing.state->order.expected(*cx.framing.scp, text.name);
    if (attr == nullptr)
        cx.source.point_at(text.line, text.name);
    if (attr == nullptr && text.name == text.end)
        return;
    char *equals = attr != nullptr ? text.name + attr->ta_length : find_equals(cx, text);
    bare_value value = {equals + 1, text.end};
    if (static_cast<unsigned char>(*value.text) <= '"') /* no value, a quote or a blank; rarely another */
        value = unquoted(cx, text, equals);
    if (value.text == nullptr)
        return;
    auto length = static_cast<size_t>(value.end - value.text);
    if (length == 0 || length > VALUE_MAX_CHARS)
        refuse_length(cx, text, attr, equals, value);
    cx.source.point_at(text.line, value.text);
    if (attr == nullptr)
        attr = &known_attr(cx, text, equals);
    if (cx.framing.watched)
        watch(cx, *attr, value);
    if ((attr->req_bit & OPTIONAL) != 0)
        count_optional(cx, *attr);
    else
        count_required(cx, *attr);
    store_value({cx, *attr, value.text, length});
}
