/* git.cpp: what the program git says of a repository. */

#include "cdef/gate/git.h"

#include "cdef/support/failure.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstddef>
#include <cstring>
#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>
#include <utility>

namespace cdef::gate_command {

namespace {

[[noreturn]] void fail(int error) {
    throw failure(std::string("git: cannot run: ") + std::strerror(error));
}

std::string all_of(int fd) {
    constexpr std::size_t STEP = 65536;
    std::array<char, STEP> portion;
    std::string text;
    for (;;) {
        ssize_t got = read(fd, portion.data(), portion.size());
        if (got < 0 && errno == EINTR)
            continue;
        if (got <= 0)
            return text;
        text.append(portion.data(), static_cast<std::size_t>(got));
    }
}

/* What a started program is given: nothing to read, its output to a pipe, its messages to nobody. */
class redirections {
public:
    explicit redirections(int out) {
        posix_spawn_file_actions_init(&actions);
        posix_spawn_file_actions_addopen(&actions, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
        posix_spawn_file_actions_adddup2(&actions, out, STDOUT_FILENO);
        posix_spawn_file_actions_addopen(&actions, STDERR_FILENO, "/dev/null", O_WRONLY, 0);
    }
    redirections(const redirections &) = delete;
    redirections &operator=(const redirections &) = delete;
    ~redirections() {
        posix_spawn_file_actions_destroy(&actions);
    }

    posix_spawn_file_actions_t actions;
};

/* Pointers to texts, as a started program is given them. */
std::vector<char *> pointers_to(std::vector<std::string> &texts) {
    std::vector<char *> all;
    all.reserve(texts.size() + 1);
    for (std::string &text : texts)
        all.push_back(text.data());
    all.push_back(nullptr);
    return all;
}

/* Standard output; nothing if the exit status is not 0. */
std::optional<std::string> output_of(std::vector<std::string> words, std::vector<std::string> environment) {
    std::array<int, 2> ends = {};
    if (pipe2(ends.data(), O_CLOEXEC) != 0)
        fail(errno);
    pid_t child = 0;
    int error = 0;
    {
        redirections to(ends[1]);
        error = posix_spawnp(&child, "git", &to.actions, nullptr, pointers_to(words).data(),
                             pointers_to(environment).data());
    }
    close(ends[1]);
    std::string text = error == 0 ? all_of(ends[0]) : "";
    close(ends[0]);
    if (error != 0)
        fail(error);
    int status = 0;
    while (waitpid(child, &status, 0) < 0 && errno == EINTR)
        ;
    return WIFEXITED(status) && WEXITSTATUS(status) == 0 ? std::optional(std::move(text)) : std::nullopt;
}

std::vector<std::string> whole_environment() {
    std::vector<std::string> all;
    for (char **each = environ; *each != nullptr; ++each)
        all.emplace_back(*each);
    return all;
}

/* The environment without the variables that describe a single repository, such as GIT_DIR. Git sets them for hooks and
 * aliases; with them it would not look for the repository of the directory in which it is run. */
std::vector<std::string> environment_of_no_repository() {
    std::vector<std::string> all = whole_environment();
    std::optional<std::string> names = output_of({"git", "rev-parse", "--local-env-vars"}, all);
    if (!names)
        throw failure("git: cannot list the variables of a repository");
    std::string listed = "\n" + *names;
    all.erase(std::remove_if(all.begin(), all.end(),
                             [&](const std::string &variable) {
                                 std::string name = variable.substr(0, variable.find('='));
                                 return listed.find("\n" + name + "\n") != std::string::npos;
                             }),
              all.end());
    return all;
}

} // namespace

std::optional<std::string> git(const std::string &directory, const std::vector<std::string> &arguments) {
    static const std::vector<std::string> environment = environment_of_no_repository();
    std::vector<std::string> words = {"git", "-C", directory.empty() ? "." : directory, "--no-pager"};
    words.insert(words.end(), arguments.begin(), arguments.end());
    return output_of(std::move(words), environment);
}

} // namespace cdef::gate_command
