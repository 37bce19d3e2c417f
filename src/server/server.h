/* server.h: the language server: messages in, messages out. Knows neither processes nor terminals. */
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

    /* Queues a message for work(). A cancellation is carried out at once, on the messages in the queue. */
    void receive(const frame &message);

    bool has_work() const;
    /* Whether the queue is full: call work() before the next receive(). */
    bool is_full() const {
        return waiting.size() >= WAITING_MAX || waiting_bytes >= BODY_MAX;
    }
    /* Does one step: handles the oldest message or, if there is none, checks a document that has changed. There must be
     * work. */
    void work();

    /* Messages for the client, oldest first, without their headers. */
    std::vector<std::string> take_output();

    /* Set when the client has ended the server, or when its messages can no longer be understood. */
    std::optional<int> exit_status() const {
        return status;
    }
    /* The process that started the server, if the client has named it. */
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
    std::vector<std::string> folders; /* of the initialize request */
};

} // namespace lsp

#endif
