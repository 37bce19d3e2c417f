/* rpc.h: requests, notifications and responses as JSON, and their errors. */
#ifndef CDGEN_SERVER_RPC_H
#define CDGEN_SERVER_RPC_H

#include "server/positions.h"

#include <nlohmann/json.hpp>

#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

namespace lsp {

using nlohmann::json;

enum error_code {
    PARSE_ERROR = -32700,
    INVALID_REQUEST = -32600,
    METHOD_NOT_FOUND = -32601,
    INVALID_PARAMS = -32602,
    INTERNAL_ERROR = -32603,
    NOT_INITIALIZED = -32002,
    REQUEST_FAILED = -32803,
    REQUEST_CANCELLED = -32800
};

/* A request cannot be answered. */
struct request_error : std::runtime_error {
    request_error(error_code why, const std::string &text) : std::runtime_error(text), code(why) {}
    error_code code;
};

constexpr std::size_t NESTING_MAX = 128; /* levels of objects and lists in a message */

/* The message in a body. Throws request_error if it is not JSON, or is nested too deeply. */
json parsed(std::string_view body);

/* A message as bytes. Bytes of a source that are not UTF-8 become U+FFFD. */
std::string written(const json &message);

/* Whether a value may identify a request. */
bool is_id(const json &value);

json response(const json &id, json result);
json error_response(const json &id, error_code code, std::string_view text);
json notification(std::string_view method, json params);
json request(const json &id, std::string_view method, json params);

/* ---- Members of messages. These functions throw request_error if a member is missing or has another type. */

const json &member(const json &of, const char *name);
std::string text_member(const json &of, const char *name);
int number_member(const json &of, const char *name);
/* The same for optional members; null counts as missing. */
const json *optional_member(const json &of, const char *name);
/* Whether the member at a path such as "/a/b" exists and is true. */
bool is_true(const json &of, const char *path);

position position_from(const json &value);
range range_from(const json &value);
json to_json(const position &at);
json to_json(const range &of);

} // namespace lsp

#endif
