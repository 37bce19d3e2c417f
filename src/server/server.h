/* server.h: the language server: messages in, messages out. It knows no process and no terminal. */
#ifndef CDGEN_SERVER_SERVER_H
#define CDGEN_SERVER_SERVER_H

#include "server/framing.h"
#include "server/session.h"

#include <cstdint>
#include <deque>
#include <optional>
#include <string>
#include <vector>

namespace lsp {

class server {
public:
    explicit server(surroundings world) : now(std::move(world)) {}

    /* Takes a message; it waits until work() comes to it. A cancellation is for those that wait. */
    void receive(const frame &message);

    bool has_work() const;
    /* Whether so much waits that it is time to work before more is received. */
    bool is_full() const {
        return waiting.size() >= WAITING_MAX || waiting_bytes >= BODY_MAX;
    }
    /* Does one step: the message that has waited longest; without one, what a change of a document has left to do.
     * There must be work. */
    void work();

    /* Messages for the client, oldest first, without their headers. */
    std::vector<std::string> take_output();

    /* Set when the client has asked the server to end, or when nothing more can be understood. */
    std::optional<int> exit_status() const {
        return status;
    }
    /* The process that started the server, if the client has said so. */
    std::optional<int> client_process() const {
        return process;
    }

private:
    enum class phase : std::uint8_t { fresh, initialized, shut_down };

    static constexpr std::size_t WAITING_MAX = 256;

    struct waiting_message {
        json content;
        std::size_t size = 0; /* bytes of its body */
        bool cancelled = false;
    };

    void handle(const waiting_message &message);
    void handle_request(const waiting_message &message);
    void handle_notification(const json &message);
    json answer(const std::string &method, const json &params);
    json initialize(const json &params);
    void finish_step();
    void cancel(const json &params);
    void refuse(const json &id, error_code code, std::string_view text);

    session now;
    phase state = phase::fresh;
    std::deque<waiting_message> waiting;
    std::size_t waiting_bytes = 0;
    std::optional<int> status;
    std::optional<int> process;
    std::vector<std::string> folders; /* that the client begins with */
};

} // namespace lsp

#endif
