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
    orb_timeval32_t wanted = {0, 0};
    if (wishes.option == "now")
        wanted = now;
    else if (wishes.option && wishes.option != "none")
        wanted = seconds_in(*wishes.option, "--timestamp", "none, now or seconds");
    else if (!wishes.option && wishes.environment && !wishes.forced_empty)
        wanted = seconds_in(*wishes.environment, "SOURCE_DATE_EPOCH", "seconds");
    return wishes.forced_empty ? orb_timeval32_t{0, 0} : wanted;
}

} // namespace build
