/* Cuts a stream into frames. */

#include "server/framing.h"

#include <gtest/gtest.h>

#include <vector>

namespace {

/* The bodies of a stream, which arrives in pieces of this size; "!" for a frame that is refused. */
std::vector<std::string> bodies_of(std::string_view stream, std::size_t piece) {
    lsp::frame_reader reader;
    std::vector<std::string> found;
    for (std::size_t at = 0; at < stream.size(); at += piece) {
        std::string_view bytes = stream.substr(at, piece);
        while (std::optional<lsp::frame> next = reader.take(bytes))
            found.push_back(next->state == lsp::frame_state::whole ? next->body : "!");
    }
    return found;
}

using texts = std::vector<std::string>;

TEST(Frames, AreTheSameInPiecesOfAnySize) {
    std::string stream = lsp::framed("one") + lsp::framed("") + lsp::framed("\r\n\r\n");
    for (std::size_t piece : {1U, 2U, 7U, 1000U})
        EXPECT_EQ(bodies_of(stream, piece), (texts{"one", "", "\r\n\r\n"})) << piece;
}

TEST(Frames, EndAtABadHeader) {
    EXPECT_EQ(bodies_of("Content-Length: 99999999999999999999\r\n\r\n" + lsp::framed("a"), 5), texts{"!"});
    EXPECT_EQ(bodies_of("Content-Length: 1\n\n" + std::string(5000, 'a'), 5), texts{"!"});
}

TEST(Frames, PassOverABodyThatIsTooLarge) {
    std::string stream = lsp::framed(std::string(lsp::BODY_MAX + 1, ' ')) + lsp::framed("b");
    EXPECT_EQ(bodies_of(stream, 65536), (texts{"!", "b"}));
}

/* A client that waits for an answer learns at once that there will be none. */
TEST(Frames, AreRefusedBeforeTheirBodyHasCome) {
    EXPECT_EQ(bodies_of("Content-Length: 99999999\r\n\r\n", 5), texts{"!"});
    EXPECT_EQ(bodies_of("Content-Length: 9\r\nContent-Type: a; charset=utf-16\r\n\r\n", 5), texts{"!"});
}

TEST(Frames, EndAtALengthThatNobodyWillWaitFor) {
    auto state_after = [](std::uint64_t length) {
        std::string header = "Content-Length: " + std::to_string(length) + "\r\n\r\n";
        std::string_view bytes = header;
        return lsp::frame_reader().take(bytes)->state;
    };
    EXPECT_EQ(state_after(9'999'999'999), lsp::frame_state::bad_header);
    EXPECT_EQ(state_after(lsp::SKIPPED_MAX + 1), lsp::frame_state::bad_header);
    EXPECT_EQ(state_after(lsp::SKIPPED_MAX), lsp::frame_state::too_large);
}

TEST(Frames, MayNameTheirCharsetInQuotes) {
    for (const char *charset : {"\"UTF-8\"", "utf8", "\"utf-8\" ; x=y"})
        EXPECT_EQ(bodies_of(std::string("Content-Type: a; Charset=") + charset + "\r\n" + lsp::framed("b"), 5),
                  texts{"b"})
            << charset;
    EXPECT_EQ(bodies_of("Content-Type: a; charset=\"\r\n" + lsp::framed("b"), 5), texts{"!"});
}

TEST(Frames, SayWhetherOneHasBegun) {
    lsp::frame_reader reader;
    EXPECT_TRUE(reader.is_between());
    std::string_view bytes = "Content-Length: 2\r\n\r\na";
    reader.take(bytes);
    EXPECT_FALSE(reader.is_between());
}

} // namespace
