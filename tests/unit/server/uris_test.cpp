/* Files as URIs. */

#include "server/uris.h"

#include <gtest/gtest.h>

namespace {

TEST(Uris, ArePaths) {
    EXPECT_EQ(lsp::path_of("file:///a/b%20c"), "/a/b c");
    EXPECT_EQ(lsp::path_of("file://localhost/a"), "/a");
    EXPECT_EQ(lsp::path_of("file:///a#b"), "/a");
}

TEST(Uris, MayBeNone) {
    for (const char *uri : {"untitled:a", "file://host/a", "file:///%", "file:///%4", "file:///%00", "file:///%+1", ""})
        EXPECT_EQ(lsp::path_of(uri), std::nullopt) << uri;
}

TEST(Uris, HaveOneKeyForADocument) {
    EXPECT_EQ(lsp::key_of("file:///%41"), lsp::key_of("file:///A"));
    EXPECT_EQ(lsp::key_of("untitled:a"), "untitled:a");
}

} // namespace
