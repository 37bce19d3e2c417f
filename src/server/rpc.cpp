/* rpc.cpp: requests, notifications and responses as JSON. */

#include "server/rpc.h"

#include <limits>

namespace lsp {

namespace {

/* How deeply objects and lists are nested in a text, which need not be JSON. */
std::size_t nesting_of(std::string_view text) {
    std::size_t depth = 0;
    std::size_t most = 0;
    bool quoted = false;
    for (std::size_t at = 0; at < text.size(); ++at) {
        char c = text[at];
        if (quoted && c == '\\')
            ++at;
        else if (c == '"')
            quoted = !quoted;
        else if (!quoted && (c == '{' || c == '['))
            most = std::max(most, ++depth);
        else if (!quoted && (c == '}' || c == ']') && depth > 0)
            --depth;
    }
    return most;
}

} // namespace

json parsed(std::string_view body) {
    if (nesting_of(body) > NESTING_MAX)
        throw request_error(INVALID_REQUEST, "the message is nested too deeply");
    json message = json::parse(body, nullptr, false);
    bool has_zero = body.find('\0') != std::string_view::npos; /* where the parser would take the body to end */
    if (message.is_discarded() || has_zero)
        throw request_error(PARSE_ERROR, "the message is not JSON");
    return message;
}

std::string written(const json &message) {
    return message.dump(-1, ' ', false, json::error_handler_t::replace);
}

bool is_id(const json &value) {
    return value.is_number_integer() || value.is_string();
}

json response(const json &id, json result) {
    return {{"jsonrpc", "2.0"}, {"id", id}, {"result", std::move(result)}};
}

json error_response(const json &id, error_code code, std::string_view text) {
    return {{"jsonrpc", "2.0"}, {"id", id}, {"error", {{"code", static_cast<int>(code)}, {"message", text}}}};
}

json notification(std::string_view method, json params) {
    return {{"jsonrpc", "2.0"}, {"method", method}, {"params", std::move(params)}};
}

json request(const json &id, std::string_view method, json params) {
    return {{"jsonrpc", "2.0"}, {"id", id}, {"method", method}, {"params", std::move(params)}};
}

const json *optional_member(const json &of, const char *name) {
    if (!of.is_object())
        return nullptr;
    auto found = of.find(name);
    return found == of.end() || found->is_null() ? nullptr : &*found;
}

const json &member(const json &of, const char *name) {
    const json *found = optional_member(of, name);
    if (found == nullptr)
        throw request_error(INVALID_PARAMS, std::string("the parameters have no ") + name);
    return *found;
}

std::string text_member(const json &of, const char *name) {
    const json &value = member(of, name);
    if (!value.is_string())
        throw request_error(INVALID_PARAMS, std::string(name) + " is not a text");
    return value.get<std::string>();
}

namespace {

std::size_t natural_member(const json &of, const char *name) {
    const json &value = member(of, name);
    if (!value.is_number_unsigned() || value.get<std::uint64_t>() > std::numeric_limits<std::int32_t>::max())
        throw request_error(INVALID_PARAMS, std::string(name) + " is not a number from 0 to 2147483647");
    return value.get<std::size_t>();
}

} // namespace

int number_member(const json &of, const char *name) {
    const json &value = member(of, name);
    if (!value.is_number_integer())
        throw request_error(INVALID_PARAMS, std::string(name) + " is not a number");
    return static_cast<int>(value.get<std::int64_t>());
}

bool is_true(const json &of, const char *path) {
    const json::json_pointer pointer(path);
    return of.contains(pointer) && of.at(pointer) == true;
}

position position_from(const json &value) {
    return {natural_member(value, "line"), natural_member(value, "character")};
}

range range_from(const json &value) {
    return {position_from(member(value, "start")), position_from(member(value, "end"))};
}

json to_json(const position &at) {
    return {{"line", at.line}, {"character", at.character}};
}

json to_json(const range &of) {
    return {{"start", to_json(of.start)}, {"end", to_json(of.end)}};
}

} // namespace lsp
