/* diagnostics.cpp: findings as the protocol shows them. */

#include "server/diagnostics.h"

#include "report/json_writer.h"

#include <algorithm>
#include <cctype>

namespace lsp {

namespace {

/* The page has an anchor for each code, in lower case. */
std::string link_to(const std::string &explanations, std::string_view code) {
    std::string link = explanations + "#";
    for (char c : code)
        link += static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return link;
}

} // namespace

finding_places::finding_places(std::string_view of_text) : text(of_text), begins{0} {
    for (std::size_t at = text.find('\n'); at != std::string_view::npos; at = text.find('\n', at + 1))
        begins.push_back(at + 1);
}

std::size_t finding_places::offset(std::size_t line, std::size_t column) const {
    if (line == 0)
        return 0;
    if (line > begins.size())
        return text.size();
    return std::min(begins[line - 1] + column - 1, text.size());
}

stretch finding_places::of(const check::place &at) const {
    auto line = static_cast<std::size_t>(at.file_line != 0 ? at.file_line : at.line);
    if (line == 0)
        return {};
    if (at.column != 0) {
        std::size_t begin = offset(line, at.file_column != 0 ? at.file_column : at.column);
        return {begin, std::min(begin + at.length, text.size())};
    }
    std::size_t begin = offset(line, 1);
    std::string_view whole = text.substr(begin, std::min(text.find('\n', begin), text.size()) - begin);
    std::size_t blanks = std::min(whole.find_first_not_of(" \t"), whole.size());
    return {begin + blanks, begin + std::max(blanks, whole.find_last_not_of(" \t\r") + 1)};
}

stretch finding_places::of(const check::edit &change) const {
    std::size_t begin = offset(static_cast<std::size_t>(change.line), change.column);
    return {begin, std::min(begin + change.removed.size(), text.size())};
}

namespace {

void append_number(std::string &to, std::size_t number) {
    to += std::to_string(number);
}

/* Writes the diagnostics of one document as text: building JSON values for very many of them would take too long. */
class list_writer {
public:
    list_writer(std::string_view text, const line_table &lines, const std::string &called,
                const diagnostic_form &wanted, const other_places &elsewhere)
        : form(wanted), others(elsewhere), places(text), positions(text, lines, wanted.units),
          note_positions(text, lines, wanted.units) {
        report::append_json(uri, called);
    }

    void add(const check::finding &found) {
        made += made.size() == 1 ? "{" : ",{";
        add_range(positions.of(places.of(found.at)));
        made += found.error ? R"(,"severity":1,"source":"cdef","code":)" : R"(,"severity":2,"source":"cdef","code":)";
        report::append_json(made, found.code);
        made += R"(,"data":{"name":)";
        report::append_json(made, found.name);
        made += R"(},"message":)";
        report::append_json(made, message_of(found));
        if (form.links && !form.explanations.empty()) {
            made += R"(,"codeDescription":{"href":)";
            report::append_json(made, link_to(form.explanations, found.code));
            made += "}";
        }
        if (form.relates && !(found.notes.empty() && found.others.empty()))
            add_related(found);
        made += "}";
    }
    std::string take() {
        return std::move(made) + "]";
    }

private:
    std::string message_of(const check::finding &found) const {
        std::string text = found.text;
        for (const check::note &more : found.notes)
            text += form.relates ? std::string() : "\n" + more.text;
        return text;
    }
    void add_position(std::string_view name, const position &at) {
        made.append("\"").append(name).append(R"(":{"line":)");
        append_number(made, at.line);
        made += R"(,"character":)";
        append_number(made, at.character);
        made += "}";
    }
    void add_range(const range &of) {
        made += R"("range":{)";
        add_position("start", of.start);
        made += ",";
        add_position("end", of.end);
        made += "}";
    }
    void add_related(const check::finding &found) {
        made += R"(,"relatedInformation":[)";
        for (const check::note &more : found.notes)
            add_place(uri, note_positions.of(places.of(more.at.line == 0 ? found.at : more.at)), more.text);
        for (const check::elsewhere &other : found.others) {
            const location place = others(other);
            std::string other_uri;
            report::append_json(other_uri, place.uri);
            add_place(other_uri, place.at, other.what.text);
        }
        made.back() = ']';
    }
    /* With a comma after it. */
    void add_place(const std::string &uri_as_json, const range &at, std::string_view message) {
        made.append(R"({"location":{"uri":)").append(uri_as_json).append(",");
        add_range(at);
        made += R"(},"message":)";
        report::append_json(made, message);
        made += "},";
    }

    const diagnostic_form &form;
    const other_places &others;
    std::string uri; /* as JSON */
    finding_places places;
    position_maker positions;
    position_maker note_positions;
    std::string made = "[";
};

} // namespace

std::string diagnostics_text(std::string_view text, const line_table &lines, const std::string &uri,
                             std::span<const check::finding> findings, const diagnostic_form &form,
                             const other_places &others) {
    if (findings.empty())
        return "[]";
    list_writer list(text, lines, uri, form, others);
    for (const check::finding &each : findings)
        list.add(each);
    return list.take();
}

} // namespace lsp
