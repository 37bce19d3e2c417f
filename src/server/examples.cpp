/* examples.cpp: values for lines that the server adds to a source. */

#include "server/examples.h"

#include "language/names.h"

#include <set>
#include <unordered_set>

namespace lsp {

namespace {

/* "NewName"; with a number if another stanza has this name. */
std::string new_name(std::string_view source, const source_index::index &of, const char *attribute) {
    std::unordered_set<std::string_view> used;
    for (const source_index::stanza &each : of.stanzas)
        if (each.is_known())
            used.insert(each.value(source, attribute));
    std::string first = "New" + std::string(attribute);
    std::string name = first;
    for (int number = 2; used.contains(name); ++number)
        name = first + std::to_string(number);
    return name;
}

/* A variable class that dynamic attributes use but nothing defines; empty: there is none. */
std::string undefined_variable_class(std::string_view source, const source_index::index &of) {
    std::set<std::string_view> defined;
    for (const source_index::stanza &each : of.stanzas)
        if (each.kind == SC_RESOURCE_VARIABLE_CLASS)
            defined.insert(each.value(source, "VariableClass"));
    for (const source_index::stanza &each : of.stanzas) {
        std::string_view used = each.is_known() ? each.value(source, "VariableClass") : std::string_view();
        if (!used.empty() && !defined.contains(used))
            return std::string(used);
    }
    return {};
}

/* The upper one of two numbers must not be below the lower one. */
std::string example_number(std::string_view source, const source_index::stanza &in, std::string_view attribute) {
    std::string_view lower;
    if (attribute == "ReportingInterval")
        lower = in.value(source, "ObservationInterval");
    else if (attribute == "LastKey")
        lower = in.value(source, "FirstKey");
    return lower.empty() ? "0" : source_index::written_value(lower);
}

} // namespace

std::string example_value(std::string_view source, const source_index::index &of, const source_index::stanza &in,
                          const table_attrs &attr) {
    switch (attr.ta_type) {
    case AT_ID:
    case AT_SD_INDEX:
        return std::to_string(of.next_id(source, in).value_or(0));
    case AT_VERSION:
        return "1.0.0.0";
    case AT_VARIETY:
        return "1,1";
    case AT_DATA_TYPE:
    case AT_SD_DATA_TYPE:
        return "String";
    case AT_VARIABLE_TYPE:
        return "Quantity";
    case AT_CLASS_PROPS:
        return "HasResources";
    case AT_STRING:
    case AT_SD_NAME:
    case AT_MANAGER: {
        bool defines_class = in.kind == SC_RESOURCE_VARIABLE_CLASS && std::string_view(attr.ta_name) == "VariableClass";
        std::string wanted = defines_class ? undefined_variable_class(source, of) : std::string();
        return wanted.empty() ? new_name(source, of, attr.ta_name) : source_index::written_value(wanted);
    }
    default:
        return example_number(source, in, attr.ta_name);
    }
}

std::vector<const table_attrs *> missing_in(const source_index::stanza &in) {
    std::vector<const table_attrs *> missing;
    vx_uint32_t seen = in.required_seen();
    for (const table_attrs *each : language::in_usual_order(in.row()))
        if ((each->req_bit & OPTIONAL) == 0 && (seen & each->req_bit) == 0)
            missing.push_back(each);
    return missing;
}

} // namespace lsp
