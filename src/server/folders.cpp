/* folders.cpp: messages about the client's folders, and about the files and settings in them. */

#include "server/folders.h"

#include "report/places.h"
#include "server/symbols.h"
#include "server/uris.h"

#include <optional>

namespace lsp {

namespace {

/* The paths in a list of objects with a URI. */
std::vector<std::string> paths_in(const json *list) {
    std::vector<std::string> paths;
    if (list != nullptr && list->is_array())
        for (const json &each : *list)
            if (std::optional<std::string> path = path_of(text_member(each, "uri")))
                paths.push_back(*path);
    return paths;
}

} // namespace

std::vector<std::string> folders_in(const json &initialize) {
    if (const json *all = optional_member(initialize, "workspaceFolders"))
        return paths_in(all);
    const json *root = optional_member(initialize, "rootUri");
    std::optional<std::string> path =
        root != nullptr && root->is_string() ? path_of(root->get<std::string>()) : std::nullopt;
    return path ? std::vector{*path} : std::vector<std::string>();
}

void begin_watching(session &now, const std::vector<std::string> &folders) {
    for (const std::string &each : folders)
        now.sources.add_folder(now, each);
    if (!now.client.watches_files)
        return;
    json watchers = json::array({{{"globPattern", "**/*.cdefsrc"}}, {{"globPattern", "**/cdef.toml"}}});
    json wanted = {{"id", "cdef/files"},
                   {"method", "workspace/didChangeWatchedFiles"},
                   {"registerOptions", {{"watchers", std::move(watchers)}}}};
    now.ask("client/registerCapability", {{"registrations", json::array({std::move(wanted)})}});
}

void did_change_folders(session &now, const json &params) {
    const json &event = member(params, "event");
    for (const std::string &each : paths_in(optional_member(event, "removed")))
        now.sources.remove_folder(now, each);
    for (const std::string &each : paths_in(optional_member(event, "added")))
        now.sources.add_folder(now, each);
}

void did_change_settings(session &now, const json & /*params*/) {
    now.settings.forget();
    for (auto &[key, each] : now.open) {
        each.forget();
        now.unpublished.insert(key);
    }
    now.sources.look_at_all();
}

void did_change_files(session &now, const json &params) {
    bool settings = false;
    for (const std::string &path : paths_in(&member(params, "changes"))) {
        settings = settings || path.ends_with("/" + std::string(config::FILE_NAME));
        bool is_source = path.ends_with(".cdefsrc") && now.sources.is_in_folder(path);
        if (is_source && !now.open.contains(path))
            now.sources.look_at(path);
    }
    if (settings)
        did_change_settings(now, params);
}

void did_cancel_progress(session &now, const json & /*params*/) {
    now.sources.stop_scan(now);
}

json workspace_symbols(session &now, const json &params) {
    std::string query = text_member(params, "query");
    json found = json::array();
    auto add = [&](document &in) {
        for (json &each : symbols_called(in, query, now.client.units))
            found.push_back(std::move(each));
    };
    for (auto &[key, each] : now.open)
        add(each);
    for (const auto &[path, file] : now.sources.files())
        if (!now.open.contains(path))
            if (std::optional<std::string> text = now.world.read(path)) {
                document stored(report::uri_of(path), 0, std::move(*text));
                add(stored);
            }
    return found;
}

} // namespace lsp
