/* text.cpp: facts as text, and the listing. */

#include "cdef/dump/dump.h"
#include "cdef/support/output.h"
#include "text/append.h"
#include "text/hex.h"
#include "text/number.h"
#include "text/shown.h"

namespace cdef::dump {

namespace {

/* A fact's text, by its kind. */
std::string text_of(none) {
    return "none";
}
std::string text_of(std::int64_t number) {
    return std::to_string(number);
}
std::string text_of(std::uint64_t number) {
    return std::to_string(number);
}
std::string text_of(float number) {
    return text::shortest(number);
}
std::string text_of(double number) {
    return text::shortest(number);
}
std::string text_of(bits b) {
    return text::hex(b.number);
}
std::string text_of(const word &w) {
    return w.text;
}
std::string text_of(const words &w) {
    std::string joined;
    for (const std::string &item : w.list)
        joined += (joined.empty() ? "" : ", ") + item;
    if (joined.empty())
        return "none";
    return joined;
}
std::string text_of(any_text t) {
    return text::quoted(t.bytes);
}
std::string text_of(binary b) {
    return "0x" + text::hex_of(b.bytes);
}
std::string text_of(const vx_resource_handle_t &h) {
    std::string shown;
    text::appendf(shown, "0x%x 0x%x 0x%x 0x%x 0x%x", h.header, h.id.id1, h.id.id2, h.id.id3, h.id.id4);
    return shown;
}
std::string text_of(const named &n) {
    std::string shown = std::to_string(n.number) + ", ";
    if (n.kind.empty())
        return shown + "unknown";
    return shown.append(n.kind) + " " + text::quoted(n.name);
}
std::string text_of(const checksum &c) {
    if (c.found.empty())
        return "correct";
    return "wrong, " + c.found + " in the place of " + c.expected;
}

/* One fact a line, two blanks a level. */
class listing : public sink {
public:
    explicit listing(bool colours) : coloured(colours) {}

    void open(const label &group) override {
        levels.push_back(!group.title.empty());
        if (group.title.empty())
            return;
        line((coloured ? "\x1b[1m" : "") + group.title + (coloured ? "\x1b[0m" : ""));
        ++depth;
    }
    void open_list(const label &list) override {
        open(list);
    }
    void close() override {
        depth -= levels.back() ? 1 : 0;
        levels.pop_back();
    }
    void add(const label &what, const fact &f) override {
        if (!what.title.empty())
            line(what.title + ": " + as_text(f));
    }

    output out;

private:
    void line(const std::string &shown) {
        out.text.append(depth * 2, ' ');
        out.text += shown;
        out.text += '\n';
        out.flush_if_full();
    }

    bool coloured;
    std::size_t depth = 0;
    std::vector<bool> levels; /* whether each is seen */
};

} // namespace

std::string as_text(const fact &f) {
    return std::visit([](const auto &some) { return text_of(some); }, f);
}

void show_listing(const input &in, const readability &found, bool with_offsets, bool coloured) {
    listing to(coloured);
    walk(in.db, found, to, with_offsets);
    to.out.flush();
}

} // namespace cdef::dump
