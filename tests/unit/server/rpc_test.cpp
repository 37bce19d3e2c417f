/* Requests, notifications and responses as JSON. */

#include "server/rpc.h"

#include <gtest/gtest.h>

namespace {

/* A list of lists, this deep. */
std::string lists(std::size_t depth) {
    return std::string(depth, '[') + std::string(depth, ']');
}

bool is_refused(const std::string &body) {
    try {
        lsp::parsed(body);
        return false;
    } catch (const lsp::request_error &error) {
        EXPECT_EQ(error.code, lsp::INVALID_REQUEST) << error.what();
        return true;
    }
}

} // namespace

TEST(Rpc, RefusesMessagesThatAreNestedTooDeeply) {
    EXPECT_FALSE(is_refused(lists(lsp::NESTING_MAX)));
    EXPECT_TRUE(is_refused(lists(lsp::NESTING_MAX + 1)));
}

/* The text of a document may contain any number of brackets, and quotes with a backslash, which do not end it. */
TEST(Rpc, CountsTheNestingOfAMessageOutsideOfItsTexts) {
    for (const char *text : {R"("")", R"("[[[")", R"("\"[")", R"("\\")"}) {
        EXPECT_FALSE(is_refused(std::string("[") + text + "," + lists(lsp::NESTING_MAX - 1) + "]")) << text;
        EXPECT_TRUE(is_refused(std::string("[") + text + "," + lists(lsp::NESTING_MAX) + "]")) << text;
    }
}
