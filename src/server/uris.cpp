/* uris.cpp: files as URIs. */

#include "server/uris.h"

#include <charconv>
#include <cstddef>

namespace lsp {

namespace {

/* Replaces escapes such as %20. Nothing if one is malformed or stands for a zero byte. */
std::optional<std::string> unescaped(std::string_view text) {
    std::string plain;
    constexpr std::size_t DIGITS = 2;
    for (std::size_t at = 0; at < text.size(); ++at) {
        if (text[at] != '%') {
            plain += text[at];
            continue;
        }
        std::string_view digits = text.substr(at + 1, DIGITS);
        unsigned byte = 0;
        auto [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), byte, 16);
        if (digits.size() != DIGITS || error != std::errc() || end != digits.data() + DIGITS || byte == 0)
            return std::nullopt;
        plain += static_cast<char>(byte);
        at += DIGITS;
    }
    return plain;
}

} // namespace

std::optional<std::string> path_of(std::string_view uri) {
    constexpr std::string_view SCHEME = "file://";
    constexpr std::string_view LOCAL_HOST = "localhost/";
    if (!uri.starts_with(SCHEME))
        return std::nullopt;
    uri.remove_prefix(SCHEME.size());
    uri = uri.substr(0, uri.find_first_of("?#"));
    if (uri.starts_with(LOCAL_HOST))
        uri.remove_prefix(LOCAL_HOST.size() - 1);
    return uri.starts_with('/') ? unescaped(uri) : std::nullopt;
}

std::string key_of(const std::string &uri) {
    return path_of(uri).value_or(uri);
}

} // namespace lsp
