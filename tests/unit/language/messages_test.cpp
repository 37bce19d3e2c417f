/* messages_test.cpp: the table of messages, and docs/messages.md, which explains the same ones. */

#include "language/messages.h"

#include "messages_document.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using messages_document::body_of;
using messages_document::sections;

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

TEST(Document, ExplainsEachMessageAsTheTableDoes) {
    std::map<std::string, std::string> document = sections();
    for (const message &row : message_rows) {
        std::string text = row.text;
        std::string shown = "### " + std::string(row.code) + " `" + text.substr(0, text.find_last_not_of(' ') + 1);
        EXPECT_EQ(document[row.code].substr(0, shown.size()), shown);
        EXPECT_EQ(body_of(document[row.code]), messages_document::words(row.cause, row.cure)) << row.code;
    }
}

TEST(Document, ExplainsNoOtherErrors) {
    for (const auto &[code, section] : sections())
        EXPECT_TRUE(code.starts_with("S5") || code.starts_with("S6") || find_message(code) != nullptr) << section;
}

} // namespace
