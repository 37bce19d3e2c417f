/* The language server without a process. */

#include "server/server.h"

#include "check/found_in.h"

#include <gtest/gtest.h>

namespace {

using lsp::json;

/* All that a server says to these messages. */
std::vector<json> said(lsp::server &to, const std::vector<json> &messages) {
    for (json each : messages) {
        each["jsonrpc"] = "2.0";
        to.receive({lsp::frame_state::whole, each.dump()});
    }
    std::vector<json> all;
    while (to.has_work())
        to.work();
    for (const std::string &body : to.take_output())
        all.push_back(json::parse(body));
    return all;
}

json request(int id, const char *method, json params) {
    return {{"jsonrpc", "2.0"}, {"id", id}, {"method", method}, {"params", std::move(params)}};
}

const json INITIALIZE = request(1, "initialize", {{"capabilities", json::object()}});

lsp::surroundings nothing() {
    lsp::surroundings world;
    world.read = [](const std::string &) { return std::nullopt; };
    world.sources_in = [](const std::string &) { return lsp::source_list(); };
    world.project_file = "";
    return world;
}

TEST(Server, ShowsTheTextOfAMessageIfItIsKnown) {
    lsp::surroundings world = nothing();
    world.message_text = [](const lsp::message_number &wanted) -> std::optional<std::string> {
        return wanted.catalog + "/" + wanted.set + "/" + wanted.number;
    };
    lsp::server server(world);
    json about = {{"uri", "file:///a.cdefsrc"}, {"version", 1}, {"text", found_in::CLASS}};
    json place = {{"textDocument", {{"uri", "file:///a.cdefsrc"}}}, {"position", {{"line", 3}, {"character", 4}}}};
    std::vector<json> answers =
        said(server, {INITIALIZE,
                      {{"method", "textDocument/didOpen"}, {"params", {{"textDocument", about}}}},
                      request(2, "textDocument/hover", place)});
    std::string text = answers.at(1).at("result").at("contents").at("value");
    EXPECT_TRUE(text.ends_with("\n- text: m/1/1")) << text;
}

/* A client asks only for what is offered. A document's text comes with its changes, so the server need not know when it
 * is saved. */
TEST(Server, OffersWhatItDoes) {
    lsp::server server(nothing());
    json offers = said(server, {INITIALIZE}).at(0).at("result").at("capabilities");
    json documents = {{"openClose", true}, {"change", 2}, {"save", false}}; /* 2: only what has changed */
    EXPECT_EQ(offers.at("textDocumentSync"), documents);
    for (const char *each : {"hover", "definition", "references", "documentHighlight", "documentSymbol", "foldingRange",
                             "documentFormatting", "documentRangeFormatting", "workspaceSymbol"})
        EXPECT_EQ(offers.at(std::string(each) + "Provider"), true) << each;
    EXPECT_EQ(offers.at("renameProvider").at("prepareProvider"), true);
    EXPECT_EQ(offers.at("semanticTokensProvider").at("full"), true);
    EXPECT_EQ(offers.at("semanticTokensProvider").at("range"), true);
    EXPECT_EQ(offers.at("completionProvider").at("triggerCharacters"), json({"=", ",", "."}));
    EXPECT_EQ(offers.at("codeActionProvider").at("codeActionKinds"),
              json({"quickfix", "refactor.rewrite", "source.fixAll.cdef"}));
    json folders = {{"supported", true}, {"changeNotifications", true}};
    EXPECT_EQ(offers.at("workspace").at("workspaceFolders"), folders);
}

TEST(Server, AnswersInOrderAndForgetsCancelledRequests) {
    lsp::server server(nothing());
    json cancel = {{"method", "$/cancelRequest"}, {"params", {{"id", 3}}}};
    std::vector<json> answers =
        said(server, {INITIALIZE, request(2, "workspace/symbol", {{"query", ""}}),
                      request(3, "workspace/symbol", {{"query", ""}}), cancel, request(4, "shutdown", nullptr)});
    ASSERT_EQ(answers.size(), 4U);
    EXPECT_EQ(answers[1].at("result"), json::array());
    EXPECT_EQ(answers[2].at("error").at("code"), -32800);
    EXPECT_EQ(answers[3].at("id"), 4);
}

/* What has an identifier is a request, and is answered: this one is unknown. */
TEST(Server, AnswersACancellationThatIsARequest) {
    lsp::server server(nothing());
    std::vector<json> answers = said(server, {INITIALIZE, request(2, "$/cancelRequest", {{"id", 1}})});
    ASSERT_EQ(answers.size(), 2U);
    EXPECT_TRUE(answers[0].contains("result"));
    EXPECT_EQ(answers[1].at("error").at("code"), -32601);
}

TEST(Server, AnswersAMessageWithAnIdentifierButNoMethod) {
    lsp::server server(nothing());
    std::vector<json> answers = said(server, {INITIALIZE, {{"jsonrpc", "2.0"}, {"id", 2}}});
    ASSERT_EQ(answers.size(), 2U);
    EXPECT_EQ(answers[1].at("id"), 2);
    EXPECT_EQ(answers[1].at("error").at("code"), -32600);
}

/* What a server with one source in a folder says after the client has answered whether it shows progress. */
std::vector<std::string> progress_after(const json &answer) {
    lsp::surroundings world = nothing();
    world.read = [](const std::string &) { return found_in::CLASS; };
    world.sources_in = [](const std::string &) { return lsp::source_list{{"/x/a.cdefsrc"}}; };
    lsp::server server(world);
    json able = {{"capabilities", {{"window", {{"workDoneProgress", true}}}}}, {"rootUri", "file:///x"}};
    json asked;
    for (const json &each : said(server, {request(1, "initialize", able), {{"method", "initialized"}}})) {
        EXPECT_NE(each.value("method", ""), "$/progress") << "before the client has agreed";
        if (each.value("method", "") == "window/workDoneProgress/create")
            asked = each.at("id");
    }
    json response = answer;
    response["id"] = asked;
    std::vector<std::string> kinds;
    for (const json &each : said(server, {response}))
        kinds.push_back(each.at("params").at("value").at("kind"));
    return kinds;
}

TEST(Server, ReportsProgressOnlyAfterTheClientHasAgreed) {
    EXPECT_EQ(progress_after({{"result", nullptr}}), (std::vector<std::string>{"begin", "end"}));
    EXPECT_EQ(progress_after({{"error", {{"code", -32803}, {"message", "no"}}}}), std::vector<std::string>());
}

TEST(Server, ChecksNoMoreSourcesAfterItsProgressIsCancelled) {
    int reads = 0;
    lsp::surroundings world = nothing();
    world.read = [&](const std::string &) { return ++reads, found_in::CLASS; };
    world.sources_in = [](const std::string &) { return lsp::source_list{{"/x/a.cdefsrc", "/x/b.cdefsrc"}}; };
    lsp::server server(world);
    json able = {{"capabilities", {{"window", {{"workDoneProgress", true}}}}}, {"rootUri", "file:///x"}};
    json cancel = {{"method", "window/workDoneProgress/cancel"}, {"params", {{"token", "cdef/sources"}}}};
    std::vector<std::string> kinds;
    for (const json &each : said(server, {request(1, "initialize", able),
                                          {{"method", "initialized"}},
                                          {{"id", "cdef/1"}, {"result", nullptr}},
                                          cancel}))
        if (each.value("method", "") == "$/progress")
            kinds.push_back(each.at("params").at("value").at("kind"));
    EXPECT_EQ(kinds, (std::vector<std::string>{"begin", "end"}));
    EXPECT_EQ(reads, 0);
}

TEST(Server, LogsThatAFolderIsTooLarge) {
    lsp::surroundings world = nothing();
    world.sources_in = [](const std::string &) { return lsp::source_list{{"/x/a.cdefsrc"}, false}; };
    lsp::server server(world);
    json folder = {{"capabilities", json::object()}, {"rootUri", "file:///x"}};
    std::vector<json> all = said(server, {request(1, "initialize", folder), {{"method", "initialized"}}});
    EXPECT_EQ(all.at(1).at("method"), "window/logMessage");
    EXPECT_EQ(all[1].at("params").at("message"), "/x: too many files; only 1 sources are checked");
}

TEST(Server, WaitsForNoMoreThanItCanHold) {
    lsp::server server(nothing());
    for (int i = 0; i < 256; ++i) {
        EXPECT_FALSE(server.is_full());
        server.receive({lsp::frame_state::whole, INITIALIZE.dump()});
    }
    EXPECT_TRUE(server.is_full());
}

} // namespace
