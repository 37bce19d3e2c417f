/* codes.cpp: all that cdef reports under a code. */

#include "cdef/explain/codes.h"

#include "cdb_view.h"
#include "check/check.h"
#include "language/messages.h"
#include "language/suggestions.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cstdlib>
#include <optional>
#include <system_error>

namespace cdef {

namespace {

std::string upper(std::string_view text) {
    std::string capitals(text);
    for (char &c : capitals)
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    return capitals;
}

/* The number of a code such as S101 or CDB101, and the letters in front of it. */
struct numbered {
    std::string letters;
    int number = 0;
};

std::optional<numbered> number_of(std::string_view code) {
    size_t digits = std::min(code.find_first_of("0123456789"), code.size());
    numbered parts = {upper(code.substr(0, digits)), 0};
    auto [end, error] = std::from_chars(code.data() + digits, code.data() + code.size(), parts.number);
    if (error != std::errc() || end != code.data() + code.size())
        return std::nullopt;
    return parts;
}

} // namespace

std::vector<explanation> explanations() {
    std::vector<explanation> all;
    for (const message &row : message_rows)
        all.push_back({row.code, "error", {}, row.text, row.cause, row.cure, check::example_of(row.code)});
    for (const check::warning &row : check::warnings)
        all.push_back({row.code, "warning", row.name, row.title, row.cause, row.cure, check::example_of(row.code)});
    std::sort(all.begin(), all.end(), [](const auto &a, const auto &b) { return a.code < b.code; });
    for (const cdb::rule &row : cdb::rules())
        all.push_back({row.code,
                       row.level == cdb::severity::error ? "error" : "warning",
                       {},
                       row.title,
                       row.cause,
                       row.cure,
                       nullptr});
    return all;
}

const explanation *find(const std::vector<explanation> &all, std::string_view code) {
    auto found = std::find_if(all.begin(), all.end(), [&, capitals = upper(code)](const explanation &each) {
        return each.code == capitals || (!each.name.empty() && each.name == code);
    });
    return found == all.end() ? nullptr : &*found;
}

std::string_view nearest(const std::vector<explanation> &all, std::string_view text) {
    language::name_list names;
    for (const explanation &each : all) {
        names.push_back(each.code);
        if (!each.name.empty())
            names.push_back(each.name);
    }
    language::guess meant = language::meant_by(text, names);
    std::optional<numbered> wanted = number_of(text);
    if (meant.is_certain() || !wanted)
        return meant.name();
    auto distance = [&](const explanation &each) {
        numbered known = *number_of(each.code);
        constexpr int OTHER_KIND = 1'000'000;
        return std::abs(known.number - wanted->number) + (known.letters == wanted->letters ? 0 : OTHER_KIND);
    };
    return std::min_element(all.begin(), all.end(),
                            [&](const explanation &a, const explanation &b) { return distance(a) < distance(b); })
        ->code;
}

} // namespace cdef
