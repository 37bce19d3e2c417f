/* workspace.cpp: the sources in the client's folders. */

#include "server/workspace.h"

#include "report/places.h"
#include "server/compiled.h"
#include "server/publishing.h"
#include "server/session.h"

#include <algorithm>
#include <filesystem>
#include <string_view>
#include <system_error>
#include <tuple>
#include <utility>

namespace lsp {

namespace {

constexpr const char *PROGRESS = "cdef/sources"; /* the token */

std::string with_slash(const std::string &path) {
    return path.ends_with('/') ? path : path + "/";
}

/* File, line and column. */
std::vector<std::tuple<std::string_view, int, std::size_t>> places_elsewhere(const check::finding &found) {
    std::vector<std::tuple<std::string_view, int, std::size_t>> places;
    for (const check::elsewhere &other : found.others)
        places.emplace_back(other.file, other.what.at.file_line, other.what.at.column);
    return places;
}

bool is_same(const check::finding &a, const check::finding &b) {
    return std::string_view(a.code) == b.code && a.text == b.text && a.at.file_line == b.at.file_line &&
           a.at.column == b.at.column && places_elsewhere(a) == places_elsewhere(b);
}

std::string without_links(const std::string &path) {
    std::error_code failed;
    std::string target = std::filesystem::weakly_canonical(path, failed).string();
    return failed ? path : target;
}

} // namespace

bool workspace::is_in_folder(const std::string &path) const {
    return std::any_of(folders.begin(), folders.end(), [&](const std::string &each) {
        return path.starts_with(each) && path.find("/.", each.size() - 1) == std::string::npos;
    });
}

void workspace::add_folder(session &now, const std::string &path) {
    if (!folders.insert(with_slash(path)).second)
        return;
    source_list found = now.world.sources_in(path);
    for (const std::string &each : found.paths) {
        known.try_emplace(each);
        waiting.insert(each);
    }
    if (!found.is_complete)
        now.log(path + ": too many files; only " + std::to_string(found.paths.size()) + " sources are checked");
    ask_for_progress(now);
}

void workspace::remove_folder(session &now, const std::string &path) {
    folders.erase(with_slash(path));
    for (auto at = known.begin(); at != known.end();) {
        const std::string each = at->first;
        ++at;
        if (is_in_folder(each))
            continue;
        known.erase(each);
        waiting.erase(each);
        publish(now, report::uri_of(each));
    }
    uncompared = true;
}

void workspace::look_at_all() {
    for (const auto &[path, file] : known)
        waiting.insert(path);
}

void workspace::step(session &now) {
    if (waiting.empty())
        return compare(now);
    std::string path = *waiting.begin();
    waiting.erase(waiting.begin());
    check(now, path);
    report_progress(now);
}

/* Facts are needed only if there are several classes. */
void workspace::check(session &now, const std::string &path) {
    auto open = now.open.find(path);
    std::optional<std::string> text = open == now.open.end() ? now.world.read(path) : std::nullopt;
    if (open == now.open.end() && !text) {
        known.erase(path);
        uncompared = true;
        return publish(now, report::uri_of(path));
    }
    workspace_file &file = known[path];
    file.target = without_links(path);
    if (open != now.open.end()) {
        const compiled_source *made = known.size() > 1 ? open->second.compiled() : nullptr;
        file.facts = made == nullptr ? std::nullopt : std::optional(made->facts);
    } else {
        const std::string uri = report::uri_of(path);
        file.own = findings_of(*text, now.settings.wanted_in(uri));
        std::optional<compiled_source> made = known.size() > 1 ? compile(*text, uri) : std::nullopt;
        file.facts = made ? std::optional(std::move(made->facts)) : std::nullopt;
        publish(now, uri);
    }
    uncompared = true;
}

/* In the order of the paths, as a build of a directory compares them. A file that has several names because of links
 * is one source: that without a link or, if it is outside the folders, the first one. */
void workspace::compare(session &now) {
    uncompared = false;
    build::class_family family;
    std::set<std::string> compared;
    for (auto &[path, file] : known) {
        const std::string uri = report::uri_of(path);
        std::vector<check::finding> found;
        bool is_again = (file.target != path && known.contains(file.target)) || !compared.insert(file.target).second;
        if (file.facts && !is_again)
            found = family.add(path, *file.facts, now.settings.wanted_in(uri));
        if (std::equal(found.begin(), found.end(), file.across.begin(), file.across.end(), is_same))
            continue;
        file.across = std::move(found);
        publish(now, uri);
    }
}

void workspace::ask_for_progress(session &now) {
    scan_size = waiting.size();
    if (!in_progress && progress_request.empty() && now.client.shows_progress && scan_size > 0)
        progress_request = now.ask("window/workDoneProgress/create", {{"token", PROGRESS}});
}

/* If all sources have been checked meanwhile, the progress ends at once. */
void workspace::take_answer(session &now, const std::string &id, bool agreed) {
    if (id != progress_request)
        return;
    progress_request.clear();
    if (!agreed)
        return;
    in_progress = true;
    json value = {{"kind", "begin"}, {"title", "Checking sources"}, {"cancellable", true}, {"percentage", 0}};
    now.send(notification("$/progress", {{"token", PROGRESS}, {"value", std::move(value)}}));
    if (waiting.empty())
        report_progress(now);
}

void workspace::report_progress(session &now) {
    constexpr std::size_t REPORTED = 64; /* sources between two reports */
    if (!in_progress || (!waiting.empty() && waiting.size() % REPORTED != 0))
        return;
    json value = {{"kind", "end"}};
    if (!waiting.empty())
        value = {{"kind", "report"}, {"percentage", 100 - 100 * std::min(waiting.size(), scan_size) / scan_size}};
    in_progress = !waiting.empty();
    now.send(notification("$/progress", {{"token", PROGRESS}, {"value", std::move(value)}}));
}

void workspace::stop_scan(session &now) {
    waiting.clear();
    report_progress(now);
}

} // namespace lsp
