/* messages_test.cpp: the table of messages, and docs/messages.md, which explains the same ones. */

#include "language/messages.h"

#include <gtest/gtest.h>

#include <fstream>
#include <map>
#include <regex>
#include <sstream>
#include <string>

namespace {

TEST(Message, IsFoundByIdAndByCode) {
    EXPECT_STREQ(message_of(MSG_UNKNOWN_STANZA).text, "Invalid table name: ");
    EXPECT_EQ(find_message("S201"), &message_of(MSG_INVALID_PROPERTY));
    EXPECT_EQ(find_message("S919"), &message_of(MSG_IMAGE_TOO_SMALL));
    EXPECT_EQ(find_message("S999"), nullptr);
    EXPECT_EQ(message_rows.size(), 71u);
}

TEST(Message, ThatStartsWithAColonFollowsItsItem) {
    for (const message &row : message_rows)
        EXPECT_EQ(row.place == text_place::AFTER_ITEM, row.text[0] == ':') << row.code;
}

/* The document's sections by code, each from its title to the next one's, with links reduced to their texts. */
std::map<std::string, std::string> sections() {
    std::stringstream whole;
    whole << std::ifstream(CDB_PROJECT "/docs/messages.md").rdbuf();
    std::string text = std::regex_replace(whole.str(), std::regex(R"(\[([^\]]*)\]\([^)]*\))"), "$1");
    std::map<std::string, std::string> found;
    for (size_t at = text.find("### S"); at != std::string::npos;) {
        size_t next = std::min(text.find("\n## ", at), text.find("\n### ", at));
        found[text.substr(at + 4, 4)] = text.substr(at, next == std::string::npos ? next : next - at);
        at = text.find("### S", at + 1);
    }
    return found;
}

TEST(Document, ExplainsEachMessageAsTheTableDoes) {
    std::map<std::string, std::string> document = sections();
    for (const message &row : message_rows) {
        std::string text = row.text;
        std::string shown = "### " + std::string(row.code) + " `" + text.substr(0, text.find_last_not_of(' ') + 1);
        EXPECT_EQ(document[row.code].substr(0, shown.size()), shown);
        std::string words = "\n\n**Cause**: " + std::string(row.cause) + " **Cure**: " + row.cure;
        std::string body = document[row.code];
        EXPECT_EQ(body.substr(std::min(body.find("\n\n"), body.size())), words + "\n") << row.code;
    }
}

TEST(Document, ExplainsNoOtherErrors) {
    for (const auto &[code, section] : sections())
        EXPECT_TRUE(code.starts_with("S5") || find_message(code) != nullptr) << section;
}

} // namespace
