/* diagnostics.cpp: findings as the protocol shows them. */

#include "server/diagnostics.h"

#include <algorithm>
#include <cctype>

namespace lsp {

namespace {

constexpr int ERROR = 1;
constexpr int WARNING = 2;

/* The page has an anchor for each code, in small letters. */
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

/* Makes the diagnostics of one document. */
class maker {
public:
    maker(std::string_view text, const line_table &lines, const std::string &called, const diagnostic_form &wanted)
        : uri(called), form(wanted), places(text), positions(text, lines, wanted.units),
          note_positions(text, lines, wanted.units) {}

    json of(const check::finding &found) {
        json made = {{"range", to_json(positions.of(places.of(found.at)))},
                     {"severity", found.error ? ERROR : WARNING},
                     {"code", found.code},
                     {"source", "cdef"},
                     {"message", found.text},
                     {"data", {{"name", found.name}}}};
        if (form.links && !form.explanations.empty())
            made["codeDescription"]["href"] = link_to(form.explanations, found.code);
        for (const check::note &more : found.notes)
            add_note(made, more, found);
        return made;
    }

private:
    void add_note(json &to, const check::note &more, const check::finding &found) {
        if (!form.relates) {
            to["message"] = to["message"].get<std::string>() + "\n" + more.text;
            return;
        }
        const check::place &at = more.at.line == 0 ? found.at : more.at;
        to["relatedInformation"].push_back(
            {{"location", {{"uri", uri}, {"range", to_json(note_positions.of(places.of(at)))}}},
             {"message", more.text}});
    }

    const std::string &uri;
    const diagnostic_form &form;
    finding_places places;
    position_maker positions;
    position_maker note_positions;
};

} // namespace

json diagnostics_of(std::string_view text, const line_table &lines, const std::string &uri,
                    std::span<const check::finding> findings, const diagnostic_form &form) {
    json all = json::array();
    if (findings.empty())
        return all;
    maker make(text, lines, uri, form);
    for (const check::finding &each : findings)
        all.push_back(make.of(each));
    return all;
}

} // namespace lsp
