/* format_fuzz: formats arbitrary bytes.
 *
 * The first byte holds the options: bit 0 puts attributes in order, bit 1 formats only some lines, whose number the
 * other bits are. The rest is the source. One with errors is left alone. Any other is formatted, is the same class with
 * the same comments afterwards, and is not changed again. */

#include "formatter/format.h"
#include "formatter/lines.h"
#include "formatter/same.h"
#include "fuzz.h"

#include <algorithm>
#include <string>
#include <string_view>
#include <vector>

namespace {

const std::string NAME = "source";

std::string with_changes(std::string_view source, const std::vector<formatter::change> &changes) {
    std::string text;
    std::size_t taken = 0;
    for (const formatter::change &each : changes) {
        fuzz::require(each.begin >= taken && each.size <= source.size() - each.begin, "changes overlap");
        text.append(source.substr(taken, each.begin - taken)).append(each.text);
        taken = each.begin + each.size;
    }
    return text.append(source.substr(taken));
}

/* What may not be lost: comments and lines that are not changed, in order, unless attributes have been moved. */
std::vector<std::string_view> kept_parts(std::string_view source, bool sorted) {
    std::vector<std::string_view> parts;
    for (const formatter::line &each : formatter::lines_of(source))
        if (std::string_view part = each.kind == formatter::line_kind::verbatim ? each.whole : each.comment;
            !part.empty())
            parts.push_back(part);
    if (sorted)
        std::sort(parts.begin(), parts.end());
    return parts;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    if (size == 0)
        return 0;
    std::string_view source(reinterpret_cast<const char *>(data) + 1, size - 1);
    formatter::options how = {.reorder = (data[0] & 1) != 0};
    if ((data[0] & 2) != 0)
        how.only = formatter::line_range{data[0] / 4U, data[0] / 4U + 2};
    formatter::formatted result = formatter::format(source, NAME, how);
    fuzz::require(result.is_left_alone() == result.error.has_value(), "not formatted: " + result.refusal);
    fuzz::require(with_changes(source, result.changes) == result.text, "the changes do not make the text");
    if (result.is_left_alone()) {
        fuzz::require(result.text == source, "a source with errors is changed");
        return 0;
    }
    fuzz::require(kept_parts(source, how.reorder) == kept_parts(result.text, how.reorder), "a comment is lost");
    fuzz::require(formatter::is_same(formatter::compile(source, NAME), formatter::compile(result.text, NAME)),
                  "another class");
    if (!how.only)
        fuzz::require(formatter::format(result.text, NAME, how).changes.empty(), "it is changed again");
    return 0;
}
