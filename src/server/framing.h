/* framing.h: messages between bytes: each has a header that says how long it is. No process, no JSON. */
#ifndef CDGEN_SERVER_FRAMING_H
#define CDGEN_SERVER_FRAMING_H

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace lsp {

constexpr std::size_t HEADER_MAX = 4096;             /* bytes, with the empty line that ends it */
constexpr std::size_t BODY_MAX = 32UL * 1024 * 1024; /* bytes */

enum class frame_state : std::uint8_t {
    whole,         /* the body is there */
    too_large,     /* the body is not kept: it has more than BODY_MAX bytes */
    other_charset, /* nor is one in another encoding than UTF-8 */
    bad_header     /* where the next frame begins is not known: nothing after it can be read */
};

struct frame {
    frame_state state = frame_state::whole;
    std::string body = {};
};

/* Cuts a stream of bytes into frames. It keeps one header and one body at the most. */
class frame_reader {
public:
    /* Takes bytes from the front of these, at most one frame's; returns the frame when it is complete. After a bad
     * header it takes everything and returns nothing more. */
    std::optional<frame> take(std::string_view &bytes);

    /* Whether no frame has begun. */
    bool is_between() const {
        return header.empty() && !in_body;
    }

private:
    bool take_header(std::string_view &bytes);
    void begin_body();
    bool take_body(std::string_view &bytes);

    std::string header; /* as far as it has been read */
    frame current;
    std::size_t awaited = 0; /* bytes of the body */
    bool in_body = false;
    bool lost = false;
};

/* A body with its header. */
std::string framed(std::string_view body);

} // namespace lsp

#endif
