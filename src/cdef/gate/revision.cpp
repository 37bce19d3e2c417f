/* revision.cpp: the files at a revision of a git repository. */

#include "cdef/gate/revision.h"

#include "cdef/gate/git.h"
#include "cdef/support/failure.h"

#include <algorithm>
#include <filesystem>
#include <string_view>
#include <utility>

namespace cdef::gate_command {

namespace {

namespace fs = std::filesystem;

constexpr std::string_view LINK = "120000 ";
constexpr std::string_view DIRECTORY = "040000 ";
constexpr int MOST_LINKS = 40; /* as many links as Linux follows */

/* Texts that git has put a zero byte after. */
std::vector<std::string> texts_in(std::string_view output) {
    std::vector<std::string> texts;
    for (std::size_t end = output.find('\0'); end != output.npos; end = output.find('\0')) {
        texts.emplace_back(output.substr(0, end));
        output.remove_prefix(end + 1);
    }
    return texts;
}

bool is_relative(std::string_view path) {
    return path == "." || path == ".." || path.starts_with("./") || path.starts_with("../");
}

/* Without dots and without a slash at its end; empty for the directory at which it begins. */
std::string normal(const fs::path &path) {
    std::string text = path.lexically_normal().string();
    if (text.ends_with('/') && text.size() > 1)
        text.pop_back();
    return text == "." ? "" : text;
}

bool leads_out(std::string_view path) {
    return path.starts_with('/') || path == ".." || path.starts_with("../");
}

/* what: "MODE TYPE ID" */
revision::entry entry_of(const std::string &what) {
    return {what.starts_with(DIRECTORY), what.substr(what.rfind(' ') + 1)};
}

/* True if the branch that HEAD names has no commit yet. */
bool is_unborn(const std::string &directory) {
    return git(directory, {"symbolic-ref", "--quiet", "HEAD"}).has_value() &&
           !git(directory, {"rev-parse", "--quiet", "--verify", "HEAD"}).has_value();
}

} // namespace

revision::revision(std::string called, std::string in, const std::string &about)
    : name(std::move(called)), directory(std::move(in)) {
    std::optional<std::string> said = git(directory, {"rev-parse", "--show-prefix", "--verify", name + "^{tree}"});
    if (!said && name == "HEAD" && is_unborn(directory))
        return;
    std::size_t end = said ? said->find_last_of('\n', said->size() - 2) : std::string::npos;
    if (end == std::string::npos)
        throw failure(about + ": not in a git repository, or the repository has no revision " + name);
    prefix = said->substr(0, end);
    tree = said->substr(end + 1, said->size() - end - 2);
}

std::string revision::top() const {
    fs::path up = directory;
    for (auto levels = std::count(prefix.begin(), prefix.end(), '/'); levels > 0; --levels)
        up /= "..";
    return up.string();
}

void revision::fail(const std::string &path, const std::string &why) const {
    throw failure("git:" + name + ":" + path + ": " + why);
}

std::string revision::required(const std::optional<std::string> &output, const std::string &path) const {
    if (!output)
        fail(path, "git cannot read it");
    return *output;
}

std::string revision::listed(const std::string &place, const std::string &path) const {
    std::vector<std::string> found = texts_in(
        required(git(directory, {"--literal-pathspecs", "ls-tree", "-z", "--full-tree", "--", tree, place}), path));
    return found.empty() ? "" : found.front().substr(0, found.front().find('\t'));
}

std::optional<std::string> revision::with_link_followed(const std::string &place, const std::string &path) const {
    for (fs::path link = place; !link.empty(); link = link.parent_path()) {
        std::string what = listed(link.string(), path);
        if (what.empty())
            continue;
        if (!what.starts_with(LINK))
            return std::nullopt;
        fs::path rest = fs::path(place).lexically_relative(link);
        return normal(link.parent_path() / contents_of(entry_of(what), path) / rest);
    }
    return std::nullopt;
}

std::optional<revision::entry> revision::find(const std::string &path) const {
    if (!has_commit())
        return std::nullopt;
    std::string place = normal(is_relative(path) ? fs::path(prefix) / path : fs::path(path));
    bool is_link = false;
    for (int links = 0; links < MOST_LINKS; ++links) {
        if (place.empty())
            return entry{true, tree};
        if (leads_out(place) && links > 0)
            fail(path, "a symbolic link that leads out of the repository");
        std::string what = leads_out(place) ? "" : listed(place, path);
        if (!what.empty() && !what.starts_with(LINK))
            return entry_of(what);
        is_link = is_link || !what.empty();
        std::optional<std::string> next = leads_out(place) ? std::nullopt : with_link_followed(place, path);
        if (!next && is_link)
            fail(path, "a symbolic link that leads nowhere at that revision");
        if (!next)
            return std::nullopt;
        place = *next;
    }
    fail(path, "too many symbolic links");
}

std::string revision::contents_of(const entry &file, const std::string &path) const {
    return required(git(directory, {"cat-file", "blob", file.id}), path);
}

std::vector<std::string> revision::names_in(const entry &in, const std::string &path) const {
    return texts_in(required(git(directory, {"ls-tree", "-z", "--name-only", "--full-tree", in.id}), path));
}

std::vector<std::string> revision::names_below() const {
    if (!has_commit())
        return {};
    return texts_in(required(git(directory, {"ls-tree", "-z", "-r", "--name-only", name}), "./"));
}

} // namespace cdef::gate_command
