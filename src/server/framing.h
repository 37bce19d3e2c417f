/* framing.h: finds messages in a stream of bytes by their headers. Knows neither processes nor JSON. */
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
/* The largest body that is skipped, in bytes. A client that announces more does not mean it. */
constexpr std::size_t SKIPPED_MAX = 1024UL * 1024 * 1024;

enum class frame_state : std::uint8_t {
    whole,         /* the body is complete */
    too_large,     /* the body is not kept: it has more than BODY_MAX bytes */
    other_charset, /* the body is not kept: it is not in UTF-8 */
    bad_header     /* the beginning of the next frame is unknown or too far away: nothing more can be read */
};

struct frame {
    frame_state state = frame_state::whole;
    std::string body = {};
};

/* Cuts a stream of bytes into frames. Keeps at most one header and one body. */
class frame_reader {
public:
    /* Removes the bytes of at most one frame from the front; returns the frame once it is complete, or after its header
     * if its body is not kept. After a bad header it removes everything and returns nothing. */
    std::optional<frame> take(std::string_view &bytes);

    /* Whether the stream is between two frames. */
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
