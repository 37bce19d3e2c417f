/* value_notes.cpp: notes that say how to write a line that the compiler refuses. */

#include "check/value_notes.h"

#include "check/numbers.h"
#include "format/data_types.h"
#include "format/names.h"
#include "language/suggestions.h"

#include <algorithm>

namespace check {

namespace {

using language::quoted;

const char *form_of(vx_data_type_t type) {
    switch (scalar_vx(type)) {
    case VX_INT32:
        return "a decimal integer from -2147483648 to 2147483647";
    case VX_INT64:
        return "a decimal integer from -9223372036854775808 to 9223372036854775807";
    case VX_UINT32:
        return "a decimal integer from 0 to 4294967295";
    case VX_UINT64:
        return "a decimal integer from 0 to 18446744073709551615";
    case VX_FLOAT32:
    case VX_FLOAT64:
        return "a floating point number";
    case VX_BINARY_PTR:
        return "0x and pairs of hexadecimal digits";
    case VX_CHAR_PTR:
        return "a text that is not empty";
    default:
        return "no value that could be written";
    }
}

std::string trimmed(std::string_view text) {
    size_t begin = text.find_first_not_of(" \t");
    if (begin == std::string_view::npos)
        return {};
    return std::string(text.substr(begin, text.find_last_not_of(" \t") + 1 - begin));
}

std::string line_of(std::string_view name, std::string_view value) {
    return quoted(std::string(name).append("=").append(value));
}

} // namespace

std::string value_note(const table_attrs &attr, vx_data_type_t type, std::string_view value) {
    std::string name = quoted(attr.ta_name);
    auto commas = is_numeric(type) ? std::count(value.begin(), value.end(), ',') : 0;
    bool takes_two = attr.ta_type == AT_RANGE || attr.ta_type == AT_VALID_VALUE || attr.ta_type == AT_SD_VALID_VALUE;
    if (attr.ta_type == AT_RANGE && commas > 1)
        return name + " takes two bounds: " + line_of(attr.ta_name, "low,high");
    if (takes_two && commas > 1)
        return name + " takes one value, or two bounds with a comma between them: write a line for each value";
    if (!takes_two && commas > 0 && is_vx_array(type) == 0)
        return name + " takes one value, not a list";
    if (!takes_two && commas > 0)
        return name + " takes one element of the array" +
               (attr.dup_allowed != 0 ? ": write a line for each element" : ", and there is only one such line");
    return quoted(vxTypeStr[type]) + " takes " + form_of(type);
}

std::string variety_note(std::string_view value) {
    if (value.find(',') != std::string_view::npos)
        return "write a line " + line_of("VarietyRange", "low,high") + " for each range of varieties";
    bool is_number = number(value, 0).read == value.size() && !value.empty();
    std::string one(is_number ? value : "1");
    return "write two numbers with a comma between them; one variety is " + line_of("VarietyRange", one + "," + one);
}

std::string no_value_note(const table_attrs &attr, std::string_view rest) {
    std::string text = trimmed(rest);
    for (std::string_view mark : {"#", "//", "/*"})
        if (text.starts_with(mark))
            return quoted(mark) + " begins a comment: to make it part of the value, write " +
                   line_of(attr.ta_name, "\"" + text + "\"");
    if ((attr.req_bit & OPTIONAL) != 0)
        return "give it a value, or leave the line out";
    return "give it a value: " + quoted(attr.ta_name) + " is required";
}

std::string no_equals_note(const srtable_ctrl &kind, std::string_view text) {
    std::string_view name = text.substr(0, text.find_first_of(" \t:"));
    size_t begin = text.find_first_not_of(" \t:", name.size());
    if (find_attr(kind, name) != nullptr && begin != std::string_view::npos)
        return "write " + line_of(name, text.substr(begin));
    return "an attribute line is `Name=value`; a comment begins with `#` or `//`";
}

std::string open_quote_note(std::string_view value) {
    if (value.size() > 1 && value.ends_with("\\\""))
        return "a quote after a backslash does not close the value; to store quotes, leave the outer ones out";
    if (value.find('"', 1) != std::string_view::npos)
        return "only a comment may follow the closing quote; to store quotes, leave the outer ones out";
    return "close it at the end of the value: `" + std::string(value) + "\"`";
}

} // namespace check
