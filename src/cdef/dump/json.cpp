/* json.cpp: the facts as JSON. docs/dump.md has the schema. */

#include "cdef/dump/dump.h"
#include "cdef/support/output.h"
#include "report/json_text.h"
#include "text/hex.h"
#include "text/number.h"
#include "text/utf8.h"

#include <nlohmann/json.hpp>

#include <charconv>
#include <cmath>

namespace cdef::dump {

namespace {

using json = nlohmann::ordered_json;

json json_of(none) {
    return nullptr;
}
json json_of(std::int64_t number) {
    return number;
}
json json_of(std::uint64_t number) {
    return number;
}
/* What JSON has no number for is told as text. Through its digits, so that 0.1 of 32 bits does not become
 * 0.10000000149011612. */
template <class Real> json json_of_real(Real number) {
    std::string digits = text::shortest(number);
    if (!std::isfinite(number))
        return digits;
    double same = 0;
    std::from_chars(digits.data(), digits.data() + digits.size(), same);
    return same;
}
json json_of(float number) {
    return json_of_real(number);
}
json json_of(double number) {
    return json_of_real(number);
}
json json_of(bits b) {
    return b.number;
}
json json_of(const word &w) {
    return w.text;
}
json json_of(const words &w) {
    return w.list;
}
json json_of(binary b) {
    json data;
    data["bytes"] = text::hex_of(b.bytes);
    return data;
}
json json_of(any_text t) {
    return text::is_utf8(t.bytes) ? json(t.bytes) : json_of(binary{std::as_bytes(std::span(t.bytes))});
}
json json_of(const vx_resource_handle_t &h) {
    json data;
    data["header"] = h.header;
    for (std::uint32_t part : {h.id.id1, h.id.id2, h.id.id3, h.id.id4})
        data["id"].push_back(part);
    return data;
}
json json_of(const named &n) {
    bool known = !n.kind.empty();
    json data;
    data["number"] = n.number;
    data["kind"] = known ? json(n.kind) : json();
    data["name"] = known ? json_of(any_text{n.name}) : json();
    return data;
}
json json_of(const checksum &c) {
    json data;
    data["correct"] = c.found.empty();
    if (c.found.empty())
        return data;
    data["found"] = c.found;
    data["expected"] = c.expected;
    return data;
}

/* Writes groups as it meets them. Facts, however many members they have, take a line each. */
class json_form : public sink {
public:
    void open(const label &group) override {
        begin(group, '{', '}');
    }
    void open_list(const label &list) override {
        begin(list, '[', ']');
    }
    void close() override {
        level closed = levels.back();
        levels.pop_back();
        if (!closed.is_empty)
            new_line();
        out.text += closed.end;
        if (levels.empty())
            out.text += '\n';
        out.flush_if_full();
    }
    void add(const label &what, const fact &f) override {
        next(what);
        out.text += report::json_line(std::visit([](const auto &some) { return json_of(some); }, f));
    }

    output out;

private:
    struct level {
        char end;
        bool is_empty = true;
    };

    void begin(const label &group, char start, char end) {
        next(group);
        out.text += start;
        levels.push_back({end});
    }
    /* Where the next member of the innermost group goes. */
    void next(const label &what) {
        if (levels.empty())
            return;
        if (!levels.back().is_empty)
            out.text += ',';
        levels.back().is_empty = false;
        new_line();
        if (levels.back().end == '}')
            out.text += report::json_line(what.key) + ": ";
    }
    void new_line() {
        out.text += '\n';
        out.text.append(levels.size() * 2, ' ');
    }

    std::vector<level> levels;
};

} // namespace

void show_json(const input &in, const readability &found, bool with_offsets) {
    json_form to;
    walk(in.db, found, to, with_offsets);
    to.out.flush();
}

} // namespace cdef::dump
