/* lsp_fuzz: gives the language server what a client may send. The first byte says how: as a stream of bytes, or as
 * bodies separated by zero bytes, which get their headers here. Each request gets one answer or one error, nothing is
 * answered that was not asked, and all that is sent is well-formed and of reasonable size. */

#include "fuzz.h"
#include "server/framing.h"
#include "server/server.h"

#include <map>
#include <string>
#include <string_view>
#include <vector>

namespace {

using nlohmann::json;

constexpr std::size_t ANSWER_MAX =
    64UL * 1024 * 1024; /* the most bytes that the server may send for an input of a few KB */

/* The identifier that the answer to a message must have, as text; empty if there must be no such answer. A message with
 * an identifier that is not a response is answered, if only to say that its method is missing. */
std::string answered_id(const std::string &body) {
    json message = json::parse(body, nullptr, false);
    if (!message.is_object() || !message.contains("id"))
        return {};
    const json &id = message["id"];
    bool has_method = message.contains("method") && message["method"].is_string();
    bool is_response = !has_method && (message.contains("result") || message.contains("error"));
    return (id.is_number_integer() || id.is_string()) && !is_response ? id.dump() : std::string();
}

class conversation {
public:
    void take(const lsp::frame &frame) {
        if (server.exit_status())
            return;
        if (frame.state == lsp::frame_state::whole)
            if (std::string id = answered_id(frame.body); !id.empty())
                ++open[id];
        server.receive(frame);
        if (server.is_full())
            work();
    }

    void work() {
        while (server.has_work())
            server.work();
        for (const std::string &body : server.take_output())
            look_at(body);
    }

    /* Requests that come after the server has ended are not answered. */
    void end() {
        work();
        for (const auto &[id, count] : open)
            fuzz::require(count == 0 || server.exit_status(), "a request is not answered");
    }

private:
    void look_at(const std::string &body) {
        fuzz::require(body.size() < ANSWER_MAX, "an answer is too large");
        json message = json::parse(body, nullptr, false);
        fuzz::require(message.is_object() && message.value("jsonrpc", "") == "2.0", "no message");
        bool is_answer = !message.contains("method");
        if (!is_answer)
            return;
        fuzz::require(message.contains("result") != message.contains("error"), "neither a result nor an error");
        if (message.at("id").is_null())
            return; /* about something that was no request */
        auto asked = open.find(message.at("id").dump());
        fuzz::require(asked != open.end() && asked->second-- > 0, "an answer that was not asked for");
    }

    lsp::server server{{.read = [](const std::string &) { return std::nullopt; },
                        .sources_in = [](const std::string &) { return lsp::source_list(); },
                        .explanations = "file:///codes",
                        .version = "0",
                        .project_file = ""}};
    std::map<std::string, int> open; /* requests without an answer, by identifier */
};

constexpr std::string_view INITIALIZE =
    R"({"jsonrpc":"2.0","id":-1,"method":"initialize","params":{"capabilities":{"textDocument":{)"
    R"("publishDiagnostics":{"relatedInformation":true,"codeDescriptionSupport":true},)"
    R"("documentSymbol":{"hierarchicalDocumentSymbolSupport":true},"codeAction":{"codeActionLiteralSupport":{}},)"
    R"("completion":{"completionItem":{"snippetSupport":true}}},"workspace":{"workspaceEdit":{"documentChanges":true}}}}})";

void stream(conversation &with, std::string_view bytes) {
    lsp::frame_reader frames;
    while (std::optional<lsp::frame> next = frames.take(bytes))
        with.take(*next);
}

void bodies(conversation &with, std::string_view all) {
    std::string_view initialize = INITIALIZE;
    for (bool first = true; first || !all.empty(); first = false) {
        std::string_view body = first ? initialize : all.substr(0, all.find('\0'));
        if (!first)
            all.remove_prefix(std::min(all.size(), body.size() + 1));
        stream(with, lsp::framed(body));
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    if (size == 0)
        return 0;
    std::string_view rest(reinterpret_cast<const char *>(data) + 1, size - 1);
    conversation with;
    if ((data[0] & 1) != 0)
        stream(with, rest);
    else
        bodies(with, rest);
    with.end();
    return 0;
}
