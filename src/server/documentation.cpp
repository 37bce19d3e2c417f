/* documentation.cpp: what names of the language mean, as Markdown. */

#include "server/documentation.h"

#include "format/names.h"
#include "language/fields.h"
#include "language/meanings.h"
#include "language/names.h"
#include "language/suggestions.h"
#include "text/hex.h"

#include <algorithm>
#include <span>

namespace lsp {

namespace {

bool is_required(const table_attrs &attr) {
    return (attr.req_bit & OPTIONAL) == 0;
}

std::string point(std::string_view what, std::string_view text) {
    return text.empty() ? std::string() : std::string("\n- ").append(what).append(": ").append(text);
}

std::string names_of(const srtable_ctrl &kind, bool required) {
    language::name_list names;
    for (const table_attrs *each : language::in_usual_order(kind))
        if (is_required(*each) == required)
            names.push_back(each->ta_name);
    return names.empty() ? std::string() : language::listed(names);
}

/* "`rsrc_pattr_t`, `ra_attr_id`, 4 bytes from offset 56" for each field. */
std::string fields_of(const srtable_ctrl &kind, const table_attrs &attr) {
    const cdb::record_format &record = language::record_of(kind);
    if (attr.ta_type == AT_SD_INDEX)
        return point("field", "none: it is the place of the element's " + language::quoted(record.record) + " in " +
                                  language::quoted("sd_fields") + " of " + language::quoted("sd_def_t"));
    std::string text;
    for (std::size_t i = 0; i < record.facts.size(); ++i) {
        const cdb::field &field = record.fields[i];
        if (language::fills(attr, record.facts[i]))
            text += point("field", language::quoted(field.name) + " of " + language::quoted(record.record) + ", " +
                                       std::to_string(field.width * field.count) + " bytes from offset " +
                                       std::to_string(field.offset));
    }
    return text;
}

std::span<const props_t> properties_of(int attr_type) {
    switch (attr_type) {
    case AT_CLASS_PROPS:
        return rc_props;
    case AT_PATTR_PROPS:
        return pa_props;
    case AT_DATTR_PROPS:
        return da_props;
    case AT_ACTION_PROPS:
        return act_props;
    default:
        return {};
    }
}

std::string type_documentation(std::string_view name) {
    const language::type_meaning *type = language::type_called(name);
    if (type == nullptr)
        return {};
    return "data type " + language::quoted(name) + "\n" + point("text of a value", type->value) +
           point("without a value", type->without);
}

std::string property_documentation(std::span<const props_t> known, std::string_view name) {
    auto found = std::find_if(known.begin(), known.end(), [&](const props_t &each) { return name == each.s; });
    if (found == known.end())
        return {};
    std::string_view meaning = language::meaning_of_word(name);
    return "property " + language::quoted(name) + "\n" + point("bit", text::hex(found->p)) +
           point("meaning", meaning.empty() ? "agreed between the runtime and the manager of the class" : meaning);
}

} // namespace

std::string stanza_documentation(const srtable_ctrl &kind) {
    return language::quoted(kind.sc_name) + ": " + std::string(language::meaning_of(kind)) + "\n" +
           point("required", names_of(kind, true)) + point("optional", names_of(kind, false)) +
           point("record", language::quoted(language::record_of(kind).record));
}

std::string attribute_documentation(const srtable_ctrl &kind, const table_attrs &attr) {
    const language::attribute_meaning &row = language::meaning_of(kind, attr);
    const language::value_form &form = language::form_of(attr.ta_type);
    std::string value(form.name);
    value.append(form.name.empty() ? "" : ": ").append(form.text);
    std::string often = is_required(attr) ? "required" : "optional";
    return language::quoted(attr.ta_name) + " of " + language::quoted(kind.sc_name) + ": " + std::string(row.meaning) +
           "\n" + point("given", often + (attr.dup_allowed != 0 ? ", may repeat" : ", once")) + point("value", value) +
           point("range", row.range) + point("without this line", row.without) + fields_of(kind, attr);
}

std::string value_documentation(const table_attrs &attr, std::string_view value) {
    switch (attr.ta_type) {
    case AT_DATA_TYPE:
    case AT_SD_DATA_TYPE:
        return type_documentation(value);
    case AT_VARIABLE_TYPE: {
        std::string_view meaning = language::meaning_of_word(value);
        return meaning.empty() ? std::string()
                               : "variable type " + language::quoted(value) + ": " + std::string(meaning);
    }
    default:
        return property_documentation(properties_of(attr.ta_type), value);
    }
}

bool is_message_number(const srtable_ctrl &kind, const table_attrs &attr) {
    return language::meaning_of(kind, attr).meaning.starts_with("message number");
}

} // namespace lsp
