/* check.cpp: reads a source line by line, and drives the compiler, the recovery and the warnings over it. */

#include "check/check.h"

#include "check/edits.h"
#include "check/recovery.h"

#include <algorithm>
#include <fcntl.h>
#include <memory>
#include <new>
#include <optional>
#include <unistd.h>
#include <utility>
#include <vector>

namespace check {

namespace {

/* To limit memory, at most this many carriage returns are removed together, or one for each of so many lines. */
constexpr size_t RETURNS_MAX = 8192;
constexpr size_t LINES_FOR_RETURN = 128;

/* One check of one source, whose name must outlive it. */
struct source_check {
    source_check(const std::string &name, const warning_set &wanted, const sink &handed_to, const compile_job *compile)
        : job(compile), compiler(name.c_str(), job == nullptr ? nullptr : job->output.c_str()), known(wanted, key),
          to(handed_to), warned(wanted, found, key) {}

    totals run();
    bool read_line();
    void take_line();
    bool take_returns();
    void hand_over(finding &&each);
    bool is_open(warning_id id, int at_line) const;
    void finish();

    const compile_job *job; /* null: the source is only checked */
    const text::hash_key key = text::random_key();
    compilation compiler;
    current_line line;
    knowledge known;
    const sink &to;
    findings found{[this](finding &&each) { hand_over(std::move(each)); },
                   [this](warning_id id, int at_line) { return is_open(id, at_line); }};
    const view see = {compiler, line, known, found};
    watchers warned;
    std::vector<edit> returns; /* what removes carriage returns at the ends of lines */
    recovery recover = {compiler, line, known, found, see, warned};
};

/* Notes how to remove the carriage returns at the end of the line. True if the last one is to be ignored. */
[[gnu::noinline]] bool source_check::take_returns() {
    size_t most = std::max(RETURNS_MAX, static_cast<size_t>(line.number) / LINES_FOR_RETURN);
    if (std::optional<edit> removal = line.without_returns(); removal && returns.size() < most)
        returns.push_back(std::move(*removal));
    return recover.strips_returns() && line.raw.ends_with('\r');
}

/* Reads the next line and finds its text; false at the end of the source. All that it calls is inlined, as it is in the
 * compiler's own loop, where it is also called for every line. */
[[gnu::flatten]] bool source_check::read_line() {
    source_line source = compiler.next_line();
    if (source.begin == nullptr)
        return false;
    line.read(source, compiler.line_number());
    if (line.carriage_return() < line.raw.size() && take_returns())
        --source.end;
    warned.line(see);
    line.text = text_of(source);
    return true;
}

void source_check::take_line() {
    if (line.text.end == nullptr)
        return;
    if (line.text.name == line.text.line)
        recover.take_header(line.text, false);
    else
        recover.take_attribute();
}

bool removes_returns(const edit &each) {
    return each.text.empty() && each.removed.starts_with('\r');
}

/* Passes on a finding with its places in the file. The first finding about a carriage return gets the edits that remove
 * those of all lines read so far. */
void source_check::hand_over(finding &&each) {
    line.find_in_file(each.at);
    for (note &more : each.notes)
        line.find_in_file(more.at);
    bool about_returns = std::string_view(each.code) == warnings[CARRIAGE_RETURN].code ||
                         std::any_of(each.fix.edits.begin(), each.fix.edits.end(), removes_returns);
    if (about_returns)
        add(each.fix, {certainty::certain, std::exchange(returns, {})});
    to(std::move(each));
}

/* True if a finding may still change. */
bool source_check::is_open(warning_id id, int at_line) const {
    return id == CARRIAGE_RETURN || recover.may_retract(id, at_line);
}

totals source_check::run() {
    while (read_line())
        take_line();
    compiler.close();
    line.end_source();
    recover.close_all();
    finish();
    return found.close();
}

void source_check::finish() {
    if (job == nullptr || found.errors() > 0)
        return;
    try {
        job->finish(compiler, see);
    } catch (const fatal_exit &failure) {
        throw cannot_check(std::string(compiler.name()) + ": " + text_of(failure));
    }
}

} // namespace

totals check_bytes(std::string_view bytes, const std::string &name, const warning_set &wanted, const sink &to,
                   const compile_job *job) {
    auto one = std::make_unique<source_check>(name, wanted, to, job);
    one->compiler.open_bytes(bytes);
    return one->run();
}

totals check_file(const std::string &path, const warning_set &wanted, const sink &to, const compile_job *job) {
    auto one = std::make_unique<source_check>(path, wanted, to, job);
    try {
        if (path == "-") /* by its descriptor, because it may be a pipe, or a part of it may have been read */
            one->compiler.open(fcntl(STDIN_FILENO, F_DUPFD_CLOEXEC, STDERR_FILENO + 1));
        else
            one->compiler.open();
        return one->run();
    } catch (const fatal_exit &failure) {
        throw cannot_check(text_of(failure));
    }
}

} // namespace check
