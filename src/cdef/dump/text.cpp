/* text.cpp: facts as text, and the listing. */

#include "cdef/dump/dump.h"
#include "cdef/support/output.h"
#include "text/append.h"
#include "text/hex.h"
#include "text/number.h"
#include "text/shown.h"

#include <array>
#include <charconv>

namespace cdef::dump {

namespace {

/* Appends digits without making a text of its own. */
template <class Number> void append_digits(std::string &to, Number number) {
    std::array<char, 24> digits;
    to.append(digits.data(), std::to_chars(digits.data(), digits.data() + digits.size(), number).ptr);
}

/* A fact's text, by its kind. */
struct appender {
    std::string &to;

    void operator()(none) const {
        to += "none";
    }
    void operator()(std::int64_t number) const {
        append_digits(to, number);
    }
    void operator()(std::uint64_t number) const {
        append_digits(to, number);
    }
    void operator()(float number) const {
        to += text::shortest(number);
    }
    void operator()(double number) const {
        to += text::shortest(number);
    }
    void operator()(bits b) const {
        to += text::hex(b.number);
    }
    void operator()(const word &w) const {
        to += w.text;
    }
    void operator()(const named_bits &b) const {
        if (b.set == 0)
            to += "none";
        std::string_view comma;
        facts::take_names(b, [&](std::string_view name) {
            to.append(comma).append(name);
            comma = ", ";
        });
    }
    void operator()(any_text t) const {
        text::append_quoted(to, t.bytes);
    }
    void operator()(binary b) const {
        to += "0x";
        text::append_hex(to, b.bytes);
    }
    void operator()(const vx_resource_handle_t &h) const {
        text::appendf(to, "0x%x 0x%x 0x%x 0x%x 0x%x", h.header, h.id.id1, h.id.id2, h.id.id3, h.id.id4);
    }
    void operator()(const named &n) const {
        append_digits(to, n.number);
        to += ", ";
        if (n.kind.empty())
            to += "unknown";
        else
            text::append_quoted(to.append(n.kind).append(" "), n.name);
    }
    void operator()(const checksum &c) const {
        to += c.found.empty() ? "correct" : "wrong, " + c.found + " in the place of " + c.expected;
    }
};

/* One fact a line, two blanks a level. */
class listing : public sink {
public:
    explicit listing(bool colours) : coloured(colours) {}

    void open(const label &group) override {
        levels.push_back(!group.title.empty());
        if (group.title.empty())
            return;
        begin_line();
        out.text.append(coloured ? "\x1b[1m" : "").append(group.title).append(coloured ? "\x1b[0m" : "");
        end_line();
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
        if (what.title.empty())
            return;
        begin_line();
        append(out.text.append(what.title).append(": "), f);
        end_line();
    }

    output out;

private:
    void begin_line() {
        out.text.append(depth * 2, ' ');
    }
    void end_line() {
        out.text += '\n';
        out.flush_if_full();
    }

    bool coloured;
    std::size_t depth = 0;
    std::vector<bool> levels; /* whether each is seen */
};

} // namespace

void append(std::string &to, const fact &f) {
    std::visit(appender{to}, f);
}

std::string as_text(const fact &f) {
    std::string text;
    append(text, f);
    return text;
}

void show_listing(const input &in, const readability &found, bool with_offsets, bool coloured) {
    listing to(coloured);
    walk(in.db, found, to, with_offsets);
    to.out.flush();
}

} // namespace cdef::dump
