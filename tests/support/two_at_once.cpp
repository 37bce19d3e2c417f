/* two_at_once: does the same work first alone and then in several threads at once, and ends with 1 if any
 * result differs. It compiles sources, each in a thread of its own, checks them, in two threads each, and verifies and
 * reads their databases, in two threads each. ThreadSanitizer ends the program if threads share state.
 *
 *     two_at_once DIRECTORY SOURCE...
 */

#include "cdb_view.h"
#include "check/check.h"
#include "compiler/cdgen.h"
#include "reader/read_everything.h"

#include <cstdlib>
#include <fstream>
#include <functional>
#include <iostream>
#include <iterator>
#include <string>
#include <thread>
#include <vector>

namespace {

constexpr int ROUNDS = 30;

using work = std::function<std::string()>;

std::string contents_of(const std::string &path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

/* The database's bytes, or the message. */
std::string compiled(const std::string &source, const std::string &output) {
    auto cx = std::make_unique<cdgen>();
    cx->options.cdefsrc = source.c_str();
    cx->options.cdefname = output.c_str();
    cx->options.explanations = nullptr;
    try {
        compile(*cx);
    } catch (const fatal_exit &failure) {
        std::string message = std::to_string(failure.line) + ": ";
        for (const char *part : words_of(failure))
            message += part;
        return message;
    }
    return contents_of(output);
}

std::string checked(const std::string &text) {
    check::warning_set all;
    all.fill(true);
    std::string findings;
    check::check_bytes(text, "source", all, [&](check::finding &&found) {
        findings += std::to_string(found.at.line) + ": " + found.code + " " + found.text + "\n";
    });
    return findings;
}

std::string verified_and_read(const std::string &image) {
    cdb::database db(std::as_bytes(std::span(image)));
    std::vector<cdb::finding> findings = cdb::verify(db);
    std::string said = std::to_string(cdb::regions(db).size()) + " regions";
    for (const cdb::finding &f : findings)
        said += " " + std::string(f.broken->code) + " " + std::to_string(f.offset);
    reading::everything all(cdb::is_sound(findings));
    all.read(db);
    return said + " " + std::to_string(all.sum);
}

/* Each piece of work alone, and then all of them at once, again and again. */
bool same_at_once(const std::vector<work> &pieces) {
    std::vector<std::string> alone, at_once(pieces.size());
    for (const work &piece : pieces)
        alone.push_back(piece());
    for (int round = 0; round < ROUNDS; ++round) {
        std::vector<std::thread> threads;
        for (std::size_t i = 0; i < pieces.size(); ++i)
            threads.emplace_back([&, i] { at_once[i] = pieces[i](); });
        for (std::thread &each : threads)
            each.join();
        if (at_once != alone)
            return false;
    }
    return true;
}

} // namespace

int main(int argc, char **argv) {
    if (argc < 3)
        return 2;
    std::string directory = argv[1];
    std::vector<std::string> sources(argv + 2, argv + argc), texts, images;
    std::vector<work> compilations, checks, readings;
    for (std::size_t i = 0; i < sources.size(); ++i) {
        std::string output = directory + "/" + std::to_string(i) + ".cdef";
        compilations.emplace_back([source = sources[i], output] { return compiled(source, output); });
        texts.push_back(contents_of(sources[i]));
        images.push_back(compiled(sources[i], output));
    }
    for (std::size_t i = 0; i < sources.size(); ++i)
        for (int twice = 0; twice < 2; ++twice) {
            checks.emplace_back([&text = texts[i]] { return checked(text); });
            readings.emplace_back([&image = images[i]] { return verified_and_read(image); });
        }
    const std::pair<const char *, const std::vector<work> *> kinds[] = {
        {"compilations", &compilations}, {"checks", &checks}, {"readings", &readings}};
    for (auto [name, pieces] : kinds)
        if (!same_at_once(*pieces)) {
            std::cout << name << " at once give something else than alone\n";
            return 1;
        }
    return 0;
}
