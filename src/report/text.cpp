/* text.cpp: findings as compilers write them. */

#include "report/places.h"
#include "report/report.h"
#include "text/shown.h"

namespace report {

std::string as_text(const std::string &file, const check::finding &found) {
    std::string text = prefix_of(file, found.at);
    text += found.error ? "error: " : "warning: ";
    text += text::masked(found.text) + " [" + found.code;
    if (!found.error)
        text.append(" ").append(found.name);
    text += "]\n" + excerpt_of(found.at, found.source);
    for (const check::note &more : found.notes) {
        text += prefix_of(file, more.at) + "note: " + text::masked(more.text) + "\n";
        if (!more.source.empty())
            text += excerpt_of(more.at, more.source);
    }
    return text;
}

} // namespace report
