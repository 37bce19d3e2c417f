/* cdef_fuzz: gives arbitrary bytes to what each of cdef's subcommands consists of (cdef_direct.h), and now and then to
 * cdef itself, by its command line.
 *
 * The first byte holds what is done: bits 0 to 3 the form, see forms; of a database, bit 4 sets length and checksum
 * right; of a source that is checked by form 12, bit 4 corrects it too; of a source that would be checked, bit 6 builds
 * it, or else bit 7 takes it as the name of a new class; of a comparison, bit 5 compares the file with itself, and bit
 * 7 takes the first file as the older version that the second one must not break. The rest is the file; of a
 * comparison, two bytes, the higher first, are the size of the one file, and what follows them is that file and the
 * other. Whatever the files say, the status is one that the documents name, what is shown is text that no terminal acts
 * upon, JSON is JSON, and what the subcommands say of the same file goes together.
 */

#include "build/image.h"
#include "captured.h"
#include "cdef/cdef.h"
#include "cdef/support/failure.h"
#include "cdef_direct.h"
#include "compiler/cdgen.h"
#include "fuzz.h"
#include "harmless.h"

#include <nlohmann/json.hpp>

#include <algorithm>
#include <array>
#include <charconv>
#include <cstddef>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <string>
#include <sys/mman.h>
#include <unistd.h>
#include <vector>

namespace {

using fuzz::bytes;
using fuzz::words;
using json = nlohmann::json;

/* A file in memory, by a name that can be opened. */
class memory_file {
public:
    explicit memory_file(const char *name) : fd(memfd_create(name, MFD_CLOEXEC)) {
        fuzz::require(fd >= 0, "no memory file");
        path = "/proc/self/fd/" + std::to_string(fd);
    }

    void fill(std::span<const std::byte> with) const {
        bool written =
            ftruncate(fd, 0) == 0 && pwrite(fd, with.data(), with.size(), 0) == static_cast<ssize_t>(with.size());
        fuzz::require(written, "a file cannot be filled");
    }

    std::string path;

private:
    int fd;
};

/* The result of a run of cdef. */
struct outcome {
    int status;
    std::string out;
    std::string err;
};

/* One of the two programs' drivers, with its arguments. */
outcome run(int (*program)(int, char **), words arguments) {
    arguments.insert(arguments.begin(), "program");
    std::vector<char *> argv;
    for (std::string &argument : arguments)
        argv.push_back(argument.data());
    argv.push_back(nullptr);
    int lowest_free = fuzz::probe();
    outcome came = {};
    {
        fuzz::captured out(stdout);
        fuzz::captured err(stderr);
        came.status = program(static_cast<int>(arguments.size()), argv.data());
        came.out = out.taken();
        came.err = err.taken();
    }
    fuzz::require(fuzz::probe() == lowest_free, "a descriptor stayed open");
    return came;
}

outcome cdef_says(words arguments) {
    return run(cdef::cdef_main, std::move(arguments));
}

json parsed(const std::string &text) {
    constexpr bool EXCEPTIONS = false;
    json data = json::parse(text, nullptr, EXCEPTIONS);
    fuzz::require(!data.is_discarded() && text.ends_with('\n'), "no JSON");
    return data;
}

/* ---- Databases --------------------------------------------------------------------------------------------------- */

struct judgement {
    bool found;    /* anything */
    bool sound;    /* no errors */
    bool readable; /* only errors that leave the rest readable */
};

judgement judge(const bytes &image) {
    judgement all = {false, true, true};
    for (const cdb::finding &f : cdb::verify(cdb::database(image))) {
        bool error = f.broken->level == cdb::severity::error;
        all.found = true;
        all.sound = all.sound && !error;
        all.readable =
            all.readable && (!error || f.broken->code == cdb::CODE_CHECKSUM || f.broken->code == cdb::CODE_RESERVED);
    }
    return all;
}

/* The files of a run. Standard output is then not a terminal, because cdef source does not write everything to a
 * terminal. */
struct files {
    files() : directory("/dev/shm/cdef-fuzz-XXXXXX") {
        int null = open("/dev/null", O_WRONLY | O_CLOEXEC);
        fuzz::require(dup2(null, STDOUT_FILENO) == STDOUT_FILENO, "no null device");
        close(null);
        fuzz::require(mkdtemp(directory.data()) != nullptr, "no directory");
        output = directory + "/class.cdef"; /* as check assumes */
    }
    files(const files &) = delete;
    files &operator=(const files &) = delete;
    ~files() {
        unlink(output.c_str());
        rmdir(directory.c_str());
    }

    /* The contents of the output; empty if it does not exist. */
    bytes built() const {
        std::error_code error;
        return cdb::read_file(output.c_str(), error);
    }
    bool has_temporary() const {
        return access((directory + "/.class.cdef.cdef-new").c_str(), F_OK) == 0;
    }

    memory_file first{"first"};
    memory_file second{"second"};
    std::string directory;
    std::string output;
};

files &all_files() {
    static files f;
    return f;
}

/* The result of compiling a source: the database in its file, or a message. */
outcome compiled(const memory_file &source, words options = {}) {
    options.insert(options.end(), {"-n", source.path, all_files().output});
    return run(cdgen_main, options);
}

/* True if the format word is in the header, in either byte order. */
bool has_format_word(const bytes &file) {
    constexpr std::size_t AT = offsetof(orb_cdb_header_t, cdb_hdr_format);
    if (file.size() < AT + 4)
        return false;
    std::string_view word(reinterpret_cast<const char *>(file.data()) + AT, 4);
    return word == "fmt1" || word == "1tmf";
}

/* Text where a database is expected: no format word, and no zero byte in the first kilobyte. */
bool is_text(const bytes &file) {
    std::size_t beginning = std::min<std::size_t>(file.size(), 1024);
    return !file.empty() && !has_format_word(file) && std::memchr(file.data(), 0, beginning) == nullptr;
}

/* A consequence comes after its cause, and a cause is not a consequence itself. */
void expect_causes(const json &findings) {
    for (std::size_t i = 0; i < findings.size(); ++i) {
        const json &cause = findings[i].at("cause");
        bool right = cause.is_null() || (cause < i && findings[cause.get<std::size_t>()].at("cause").is_null());
        fuzz::require(right, "a consequence without a cause");
    }
}

void look_at_verify(const outcome &came, const bytes &image, const words &form) {
    auto has = [&](const char *word) { return std::find(form.begin(), form.end(), word) != form.end(); };
    if (is_text(image)) {
        bool says_so = has("--json") || has("--format"); /* the other forms have an entry for it */
        fuzz::require(came.status == cdef::FAILED && came.out.empty() != says_so, "a text is verified");
        fuzz::require(came.err.find("a text, not a database") != std::string::npos, "a text is not called one");
        return;
    }
    judgement is = judge(image);
    bool passes = has("--werror") ? !is.found : is.sound;
    fuzz::require(came.status == (passes ? cdef::OK : cdef::FOUND) && came.err.empty(), "another verdict");
    if (has("--json")) {
        json file = parsed(came.out).at("files").at(0);
        fuzz::require(file.at("sound") == passes, "another verdict in JSON");
        expect_causes(file.at("findings"));
    } else if (has("sarif"))
        fuzz::require(parsed(came.out).at("runs").at(0).at("results").empty() != is.found, "other results in SARIF");
    else
        fuzz::require(came.out.empty() != (has("--quiet") ? !is.sound : is.found), "findings are not told, or none");
}

void look_at_dump(const outcome &came, const bytes &image, const words &form) {
    bool shown = came.status == cdef::OK;
    fuzz::require(shown == judge(image).readable && came.out.empty() != shown, "the wrong databases are shown");
    if (!shown || std::find(form.begin(), form.end(), "--json") == form.end())
        return;
    fuzz::require(parsed(came.out).at("size") == image.size(), "another size in JSON");
}

std::size_t hexadecimal(std::string_view digits) {
    std::size_t number = 0;
    auto [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), number, 16);
    fuzz::require(error == std::errc() && end == digits.data() + digits.size(), "no hexadecimal number");
    return number;
}

/* Each line has its offset in front, then bytes. */
void look_at_hex(const outcome &came, const bytes &image, const words & /*form*/) {
    constexpr std::size_t OFFSET = 8;
    constexpr std::size_t BYTES_AT = 10;
    constexpr std::size_t BYTES_A_LINE = 16;
    fuzz::require(came.status == cdef::OK, "bytes cannot be shown");
    bytes shown;
    for (std::string_view rest = came.out; !rest.empty();) {
        std::string_view line = rest.substr(0, rest.find('\n'));
        rest.remove_prefix(std::min(line.size() + 1, rest.size()));
        fuzz::require(line.size() > BYTES_AT && hexadecimal(line.substr(0, OFFSET)) == shown.size(),
                      "an offset is wrong");
        std::string_view part = line.substr(BYTES_AT, 3 * BYTES_A_LINE);
        for (std::size_t at = 0; at < part.size() && part[at] != ' '; at += 3)
            shown.push_back(static_cast<std::byte>(hexadecimal(part.substr(at, 2))));
    }
    fuzz::require(shown == image, "other bytes are shown than the file has");
}

/* A source that needs an output of a certain name is not compiled. */
void look_at_source(const outcome &came, const bytes &image, const words & /*form*/) {
    bool refused = came.err.find(": no source: ") != std::string::npos;
    fuzz::require(came.status == (judge(image).readable && !refused ? cdef::OK : cdef::FAILED), "no source, no reason");
    fuzz::require(came.out.empty() == (came.status != cdef::OK), "half a source");
    if (came.status != cdef::OK || came.out.find("called after the output file") != std::string::npos)
        return;
    const files &f = all_files();
    f.second.fill(std::as_bytes(std::span(came.out)));
    fuzz::require(compiled(f.second).status == 0, "the source does not compile");
    outcome compared = cdef_says({"diff", f.first.path, f.output});
    if (compared.status != cdef::OK)
        fuzz::fail("the source means something else: " + compared.out + compared.err);
}

/* ---- Two databases ----------------------------------------------------------------------------------------------- */

void look_at_diff(const outcome &came, const bytes &before, const bytes &after, const words &form) {
    bool readable = judge(before).readable && judge(after).readable;
    bool too_often = came.err.find("too many references lead to the same") != std::string::npos;
    fuzz::require((came.status == cdef::FAILED) == (!readable || too_often), "another status");
    fuzz::require(before != after || came.status != cdef::FOUND, "a file differs from itself");
    fuzz::require(before != after || !too_often, "a comparison without differences is refused");
    if (came.status == cdef::FAILED) {
        fuzz::require(came.out.empty(), "half a comparison");
        return;
    }
    bool as_json = std::find(form.begin(), form.end(), "--json") != form.end();
    bool none = as_json ? parsed(came.out).at("differences").empty() : came.out.empty();
    fuzz::require(none == (came.status == cdef::OK), "differences are not told, or none");
}

void look_at_gate(const outcome &came, const bytes &before, const bytes &after, const words &form) {
    bool too_often = came.err.find("too many references lead to the same") != std::string::npos;
    bool refused = before.empty() || (!is_text(before) && !judge(before).readable);
    if (is_text(before) || is_text(after) || after.empty()) { /* the other tests compile sources */
        fuzz::require(before != after || came.status != cdef::FOUND, "a source breaks itself");
        return;
    }
    bool readable = !refused && judge(after).readable;
    fuzz::require((came.status == cdef::FAILED) == (!readable || too_often), "another status");
    fuzz::require(before != after || came.status != cdef::FOUND, "a file breaks itself");
    if (came.status == cdef::FAILED || form.back() != "json")
        return;
    bool none = parsed(came.out).at("sources").at(0).at("findings").empty();
    fuzz::require(none == (came.status == cdef::OK), "findings are not told, or none");
}

/* ---- Sources ------------------------------------------------------------------------------------------------------
 */

/* The text as JSON has it: bytes that are not UTF-8 are replaced. */
std::string told(const std::string &text) {
    return json::parse(json(text).dump(-1, ' ', false, json::error_handler_t::replace)).get<std::string>();
}

/* The line in which the compiler found an error. If the error is reported at its cause, a note has this line. */
json line_of(const json &error) {
    for (const json &note : error.at("notes"))
        if (note.at("message").get<std::string>().starts_with("the compiler stops here"))
            return note.at("line");
    return error.at("line");
}

/* The first error is the compiler's. */
void expect_first(const json &findings, const std::string &message) {
    auto first = std::find_if(findings.begin(), findings.end(), [](const json &f) { return f["severity"] == "error"; });
    fuzz::require((first == findings.end()) == message.empty(), "check and the compiler disagree about an error");
    if (message.empty())
        return;
    std::string text = first->at("message");
    std::string with_line = line_of(*first).dump() + ": " + text;
    if (told(message) != text && told(message) != with_line)
        fuzz::fail("the compiler says " + message + ", check " + with_line);
}

void look_at_check(const outcome &came, const bytes &source, const words &form) {
    if (has_format_word(source)) {
        fuzz::require(came.status == cdef::FAILED, "a database is checked");
        fuzz::require(came.err.find("a database, not a source") != std::string::npos, "a database is not called one");
        return;
    }
    auto has = [&](const char *word) { return std::find(form.begin(), form.end(), word) != form.end(); };
    outcome compiler = compiled(all_files().first);
    bool compiles = compiler.status == 0;
    fuzz::require(came.status != cdef::FAILED, "a source cannot be checked");
    if (has("--werror"))
        fuzz::require(came.err.empty() == (came.status == cdef::OK), "another status");
    else
        fuzz::require(came.status == (compiles ? cdef::OK : cdef::FOUND), "check and compiler differ");
    if (has("json"))
        expect_first(parsed(came.out).at("sources").at(0).at("findings"), compiler.err);
    else if (has("sarif"))
        fuzz::require(parsed(came.out).at("version") == "2.1.0", "no SARIF");
    else if (has("--fix"))
        fuzz::require(came.out.empty() || came.out.starts_with("--- "), "no diff");
    else
        fuzz::require(came.out.empty(), "findings on standard output");
}

/* The result of building a source into a file that does not exist, with --timestamp none. */
void look_at_build(const outcome &came, const bytes &source, const words &form) {
    const files &f = all_files();
    auto has = [&](const char *word) { return std::find(form.begin(), form.end(), word) != form.end(); };
    bytes built = f.built();
    fuzz::require((came.status == cdef::OK) == !built.empty(), "a database without success, or none");
    fuzz::require(!f.has_temporary(), "a temporary file is left");
    if (has_format_word(source)) {
        fuzz::require(came.status == cdef::FAILED, "a database is built");
        return;
    }
    outcome compiler = has("big") ? compiled(f.first, {"-s"}) : compiled(f.first);
    bool compiles = compiler.status == 0;
    bool has_warning = has("--werror") && came.err.find(": warning: ") != std::string::npos;
    fuzz::require(came.status == (compiles && !has_warning ? cdef::OK : cdef::FOUND), "build and compiler differ");
    if (came.status == cdef::OK)
        fuzz::require(build::is_same_but_time(built, f.built()), "build and compiler make different databases");
    if (has("json"))
        expect_first(parsed(came.out).at("sources").at(0).at("findings"), compiler.err);
    else
        fuzz::require(came.out.empty(), "findings on standard output");
}

/* A first source compiles. The class is called after the bytes before the first zero. */
void look_at_new(const outcome &came, const bytes & /*name*/, const words & /*form*/) {
    fuzz::require(came.status == cdef::OK || came.status == cdef::FAILED, "another status");
    fuzz::require(came.out.empty() == (came.status != cdef::OK), "half a source");
    if (came.status != cdef::OK)
        return;
    const files &f = all_files();
    f.second.fill(std::as_bytes(std::span(came.out)));
    fuzz::require(compiled(f.second).status == 0, "a first source does not compile");
}

/* ---- The forms ----------------------------------------------------------------------------------------------------
 */

struct form {
    words arguments;
    void (*look)(const outcome &, const bytes &, const words &); /* null: two files */
};

const std::array<form, 16> forms = {{
    {{"verify"}, look_at_verify},
    {{"verify", "--json"}, look_at_verify},
    {{"verify", "--werror", "--quiet"}, look_at_verify},
    {{"dump"}, look_at_dump},
    {{"dump", "--offsets"}, look_at_dump},
    {{"dump", "--json"}, look_at_dump},
    {{"dump", "--json", "--offsets"}, look_at_dump},
    {{"dump", "--hex"}, look_at_hex},
    {{"source"}, look_at_source},
    {{"diff"}, nullptr},
    {{"diff", "--compat=stored"}, nullptr},
    {{"diff", "--json"}, nullptr},
    {{"check"}, look_at_check},
    {{"check", "--format", "json"}, look_at_check},
    {{"check", "--format", "sarif"}, look_at_check},
    {{"check", "--werror"}, look_at_check},
}};

/* Taken in the place of the forms of check, by bit 6. */
constexpr unsigned FIRST_CHECK = 12;
constexpr unsigned BUILD = 0x40;
const std::array<form, 4> build_forms = {{
    {{"build"}, look_at_build},
    {{"build", "--werror"}, look_at_build},
    {{"build", "--byte-order", "big"}, look_at_build},
    {{"build", "--format", "json"}, look_at_build},
}};

/* Taken in the place of the forms of check, by bit 7. */
constexpr unsigned OTHER = 0x80;
const form beginning = {{"new", "class"}, look_at_new};

/* Taken in the place of the forms of diff, by bit 7. */
constexpr unsigned FIRST_DIFF = 9;
const std::array<form, 3> gate_forms = {{
    {{"gate", "--level", "readers"}, nullptr},
    {{"gate", "--level", "stored"}, nullptr},
    {{"gate", "--level", "clients", "--format", "json"}, nullptr},
}};

/* Taken in the place of the form "verify" by some bytes. */
constexpr std::uint8_t OTHERWISE = 0x60;
const std::array<form, 2> other_forms = {{
    {{"verify", "--format", "sarif"}, look_at_verify},
    {{"verify", "--format", "github"}, look_at_verify},
}};

/* A source's findings are those of the file as it is, whatever would be corrected. */
const form correcting = {{"check", "--fix", "--dry-run"}, look_at_check};
constexpr unsigned CORRECTING = 0x1C; /* the first form of check, with bit 4 */

/* An input that is also passed to the program through its command line takes ten times as long. */
constexpr std::uint32_t COMMAND_LINE_ONE_IN = 256;

constexpr unsigned WHOLE = 0x10;
constexpr unsigned SAME = 0x20;

bytes database_of(std::span<const std::byte> data, unsigned options) {
    bytes image(data.begin(), data.end());
    if ((options & WHOLE) != 0 && image.size() >= sizeof(orb_cdb_header_t))
        fuzz::make_whole(image, cdb::database(image).order());
    return image;
}

outcome shown(words arguments, const words &paths) {
    bool is_source = arguments.front() == "source" || arguments.front() == "new" || arguments == correcting.arguments;
    arguments.insert(arguments.end(), paths.begin(), paths.end());
    outcome came = cdef_says(arguments);
    if (!is_source) /* it contains texts unchanged */
        fuzz::expect_harmless(came.out);
    fuzz::expect_harmless(came.err);
    return came;
}

/* The two files of a comparison. */
struct pair_of_files {
    bytes before;
    bytes after;
};

pair_of_files pair_in(std::span<const std::byte> data, unsigned options) {
    std::size_t told_size = std::to_integer<std::size_t>(data[0]) << 8 | std::to_integer<std::size_t>(data[1]);
    std::size_t size = std::min(told_size, data.size() - 2);
    bytes before = database_of(data.subspan(2, size), options);
    return {before, (options & SAME) != 0 ? before : database_of(data.subspan(2 + size), options)};
}

void try_comparison(const form &with, const pair_of_files &both, bool by_command_line) {
    bool is_gate = with.arguments.front() == "gate";
    is_gate ? fuzz::gate_directly(both.before, both.after) : fuzz::compare_directly(both.before, both.after);
    if (!by_command_line)
        return;
    const files &f = all_files();
    f.first.fill(both.before);
    f.second.fill(both.after);
    if (is_gate)
        look_at_gate(shown(with.arguments, {"--no-config", "--against", f.first.path, f.second.path}), both.before,
                     both.after, with.arguments);
    else
        look_at_diff(shown(with.arguments, {f.first.path, f.second.path}), both.before, both.after, with.arguments);
}

/* True for one in so many inputs. Only the input decides this. A replay has time for all of them. */
bool is_one_in([[maybe_unused]] std::uint32_t number, [[maybe_unused]] std::span<const std::byte> input) {
#ifdef CDGEN_FUZZ
    std::uint32_t hash = 2166136261;
    for (std::byte byte : input)
        hash = (hash ^ std::to_integer<std::uint32_t>(byte)) * 16777619;
    return (hash >> 12) % number == 0;
#else
    return true;
#endif
}

/* The part of a source that is checked. The whole takes long if it has many unknown names, because near ones are looked
 * for, so most inputs give their beginning only. */
bytes beginning_of(const bytes &source) {
    constexpr std::uint32_t WHOLE_ONE_IN = 8;
    constexpr std::size_t MOST = 128;
    if (is_one_in(WHOLE_ONE_IN, source))
        return source;
    return {source.begin(), source.begin() + static_cast<std::ptrdiff_t>(std::min(source.size(), MOST))};
}

void try_build(const form &with, const bytes &file, bool by_command_line) {
    const files &f = all_files();
    fuzz::check_directly(beginning_of(file), f.output, with.arguments);
    if (!by_command_line)
        return;
    f.first.fill(file);
    unlink(f.output.c_str());
    with.look(shown(with.arguments, {"--no-config", "--timestamp", "none", "-o", f.output, f.first.path}), file,
              with.arguments);
}

void try_new(const form &with, const bytes &file, bool by_command_line) {
    constexpr std::size_t MOST = 64;
    std::string name(reinterpret_cast<const char *>(file.data()), std::min(file.size(), MOST));
    fuzz::start_directly(name);
    if (by_command_line)
        with.look(shown(with.arguments, {"-o", "-", "--", name.c_str()}), file, with.arguments);
}

void try_file(const form &with, const bytes &file, bool by_command_line) {
    const files &f = all_files();
    if (with.arguments.front() == "check")
        fuzz::check_directly(beginning_of(file), f.output, with.arguments);
    else
        fuzz::read_directly(file, with.arguments);
    if (!by_command_line)
        return;
    f.first.fill(file);
    with.look(shown(with.arguments, {f.first.path}), file, with.arguments);
}

const form &form_for(std::uint8_t choice) {
    unsigned low = choice & 0xFU;
    if (low >= FIRST_CHECK && (choice & BUILD) != 0)
        return build_forms.at(low - FIRST_CHECK);
    if (low >= FIRST_CHECK && (choice & OTHER) != 0)
        return beginning;
    if (low >= FIRST_DIFF && low < FIRST_CHECK && (choice & OTHER) != 0)
        return gate_forms.at(low - FIRST_DIFF);
    if ((choice & 0x1F) == CORRECTING)
        return correcting;
    bool is_verify = (choice & 0xF) == 0;
    return is_verify && (choice & OTHERWISE) == OTHERWISE ? other_forms.at(choice >> 7) : forms.at(choice & 0xF);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size) {
    if (size == 0)
        return 0;
    const form &with = form_for(data[0]);
    std::span<const std::byte> rest = std::as_bytes(std::span(data, size)).subspan(1);
    bool by_command_line = is_one_in(COMMAND_LINE_ONE_IN, std::as_bytes(std::span(data, size)));
    if (with.look == nullptr && rest.size() >= 2)
        try_comparison(with, pair_in(rest, data[0]), by_command_line);
    else if (with.look == look_at_build)
        try_build(with, bytes(rest.begin(), rest.end()), by_command_line);
    else if (with.look == look_at_new)
        try_new(with, bytes(rest.begin(), rest.end()), by_command_line);
    else if (with.look != nullptr && with.arguments.front() == "check")
        try_file(with, bytes(rest.begin(), rest.end()), by_command_line);
    else if (with.look != nullptr)
        try_file(with, database_of(rest, data[0]), by_command_line);
    return 0;
}

#ifdef CDGEN_FUZZ
/* The innermost caller is enough to know where memory was taken; to note all of them takes long. A replay, without this
 * option, shows them. */
extern "C" const char *__asan_default_options() {
    return "malloc_context_size=1";
}
#endif
