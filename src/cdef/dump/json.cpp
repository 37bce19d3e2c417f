/* json.cpp: the facts as JSON. docs/dump.md has the schema. */

#include "cdef/dump/dump.h"
#include "cdef/support/output.h"
#include "report/json_text.h"
#include "report/json_writer.h"
#include "text/hex.h"
#include "text/number.h"
#include "text/utf8.h"

#include <nlohmann/json.hpp>

#include <charconv>
#include <cmath>
#include <utility>

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
    data["found"] = std::strtoul(c.found.c_str(), nullptr, 16);
    data["expected"] = std::strtoul(c.expected.c_str(), nullptr, 16);
    return data;
}

/* Writes groups as it meets them. Facts, however many members they have, take a line each. */
class json_form : public sink {
public:
    void open(const label &group) override {
        bool is_document = std::exchange(first, false);
        to.open_object(group.key);
        if (is_document)
            to.add_schema("cdef-dump.schema.json", 1);
    }
    void open_list(const label &list) override {
        to.open_list(list.key);
    }
    void close() override {
        to.close();
    }
    void add(const label &what, const fact &f) override {
        to.add_json(what.key, report::json_line(std::visit([](const auto &some) { return json_of(some); }, f)));
    }

private:
    report::json_writer to{print};
    bool first = true;
};

} // namespace

void show_json(const input &in, const readability &found, bool with_offsets) {
    json_form to;
    walk(in.db, found, to, with_offsets);
}

} // namespace cdef::dump
