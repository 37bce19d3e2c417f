/* folding.cpp: which lines of a document can be folded into one. */

#include "server/folding.h"

#include <algorithm>

namespace lsp {

namespace {

class folds {
public:
    folds(document &of, encoding units) : in(of), positions(of.positions(units)) {}

    /* Adds a fold, if it has several lines. first, last: in the index */
    void add(std::size_t first, std::size_t last, const char *kind) {
        std::size_t start = positions.at(in.index().lines[first].whole.begin).line;
        std::size_t end = positions.at(in.index().lines[last].whole.end).line;
        if (start < end)
            all.push_back({{"startLine", start}, {"endLine", end}, {"kind", kind}});
    }

    json all = json::array();

private:
    document &in;
    position_maker positions;
};

} // namespace

json folding_ranges(session &now, const json &params) {
    document &in = now.document_in(params);
    folds found(in, now.client.units);
    for (const source_index::stanza &each : in.index().stanzas)
        found.add(each.first_line, each.last_line, "region");
    const std::vector<source_index::line> &lines = in.index().lines;
    for (std::size_t at = 0; at < lines.size(); ++at) {
        std::size_t end = at;
        while (end < lines.size() && lines[end].kind == source_index::line_kind::comment)
            ++end;
        if (end > at)
            found.add(at, end - 1, "comment");
        at = std::max(at, end);
    }
    return std::move(found.all);
}

} // namespace lsp
