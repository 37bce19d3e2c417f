/* time.cpp: determines the time in databases. */

#include "build/time.h"

#include <charconv>

namespace build {

namespace {

orb_timeval32_t seconds_in(const std::string &text, const std::string &name, const char *forms) {
    vx_uint32_t seconds = 0;
    const char *end = text.data() + text.size();
    auto [stop, error] = std::from_chars(text.data(), end, seconds);
    if (error != std::errc() || stop != end)
        throw wrong_request(name + ": '" + text + "' is not " + forms + " from 0 to 4294967295");
    return {seconds, 0};
}

} // namespace

orb_timeval32_t time_of(const time_wishes &wishes, orb_timeval32_t now) {
    if (wishes.forced_empty || wishes.option == "none")
        return {0, 0};
    if (wishes.option == "now")
        return now;
    if (wishes.option)
        return seconds_in(*wishes.option, "--timestamp", "none, now or seconds");
    if (wishes.environment)
        return seconds_in(*wishes.environment, "SOURCE_DATE_EPOCH", "seconds");
    return {0, 0};
}

} // namespace build
