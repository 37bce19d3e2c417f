/* rules.cpp: what each code means. */

#include "report/rules.h"

#include "check/check.h"
#include "language/messages.h"

namespace report {

namespace {

std::vector<rule> make_rules() {
    std::vector<rule> all;
    for (const message &known : message_rows)
        all.push_back({known.code, {}, known.text, known.cause, help_of(known.cause, known.cure), true});
    for (const check::warning &known : check::warnings)
        all.push_back({known.code, known.name, known.title, known.cause, help_of(known.cause, known.cure), false});
    return all;
}

} // namespace

std::string help_of(std::string_view cause, std::string_view cure) {
    return std::string(cause).append(cure.empty() ? "" : " ").append(cure);
}

const std::vector<rule> &all_rules() {
    static const std::vector<rule> all = make_rules();
    return all;
}

} // namespace report
