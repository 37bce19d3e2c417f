"""Write the seeds and the dictionary of the fuzzers.

DIRECTORY/source gets the golden sources and generated ones, each after a byte of options. DIRECTORY/image gets the
databases that cdgen makes from them, in both byte orders, and the images of tests/image. DIRECTORY/cdef gets all of
these, each after a byte that selects the subcommand. DIRECTORY/lsp gets conversations with the language server.
DIRECTORY/source.dict gets the words of the language, from the compiler's own catalogue.
"""

import argparse
import json
import os
import pathlib
import subprocess
import sys

TESTS = pathlib.Path(__file__).resolve().parent.parent
sys.path.insert(0, str(TESTS / "support"))

import generate_sources  # noqa: E402

GENERATED = 50
OPTIONS = (0x00, 0x08, 0x07, 0x0E, 0x10, 0x20)  # see source_fuzz.cpp
# See cdef_fuzz.cpp.
DATABASE_FORMS = range(9)
DIFF_FORMS = range(9, 12)
CHECK_FORMS = range(12, 16)
BUILD, NEW, GATE = 0x40, 0x80, 0x80
WHOLE = 0x10
MORE_WORDS = (
    "0x", "-1", "0", "4294967296", "9223372036854775807", "18446744073709551616", "1e39", "1e-46", "nan", "inf", "0x1p-149",
    ",", "1,2", '""', '"', "\\\\", "\\377", "//", "/*", "#", "SBS", "UNKNOWN", "\0", "\r\n", "1.2.3.4", "SDDefinition",
)


def sources():
    """The texts of all sources that are used as seeds."""
    for path in sorted(TESTS.rglob("*.cdefsrc")):
        yield path.read_bytes()
    for seed in range(GENERATED):
        yield generate_sources.source(seed)[0]


def compile_sources(command, directory, texts):
    """Writes the databases of the sources that compile, in both byte orders, all in one process."""
    for number, text in enumerate(texts):
        (directory / f"{number}.cdefsrc").write_bytes(text)
    jobs = [f"{number}.cdefsrc\t{number}.cdef\n-s\t{number}.cdefsrc\t{number}-turned.cdef\n" for number in range(len(texts))]
    environment = {**os.environ, "VX_CDB_FORCE_EMPTY_TIMESTAMP": ""}
    run = subprocess.run(command, cwd=directory, env=environment, input="".join(jobs).encode(), stdout=subprocess.PIPE, check=True)
    if run.stdout.count(b"\n") != 2 * len(texts):
        sys.exit("make_seeds.py: the compiler has not answered about each source")
    for number in range(len(texts)):
        (directory / f"{number}.cdefsrc").unlink()


def write_cdef_seeds(directory):
    """One seed for each source and each image; and for each image its comparison with the next one."""
    seeds = directory / "cdef"
    for path in sorted((directory / "source").iterdir()):
        form = CHECK_FORMS[int(path.name) % len(CHECK_FORMS)]
        (seeds / f"source-{path.name}").write_bytes(bytes([form]) + path.read_bytes()[1:])
        (seeds / f"build-{path.name}").write_bytes(bytes([form | BUILD]) + path.read_bytes()[1:])
    for number, name in enumerate((b"Disk", b'a "b"', b"\\", b"#,=", b"\xff", b"")):
        (seeds / f"new-{number}").write_bytes(bytes([CHECK_FORMS[0] | NEW]) + name)
    images = [path.read_bytes() for path in sorted((directory / "image").rglob("*")) if path.is_file()]
    for number, image in enumerate(images):
        whole = WHOLE * (number // len(DATABASE_FORMS) % 2)
        form = DATABASE_FORMS[number % len(DATABASE_FORMS)] | whole
        (seeds / f"image-{number}").write_bytes(bytes([form]) + image)
        if len(image) < 1 << 16:
            form = DIFF_FORMS[number % len(DIFF_FORMS)] | whole
            pair = len(image).to_bytes(2, "big") + image + images[(number + 1) % len(images)]
            (seeds / f"pair-{number}").write_bytes(bytes([form]) + pair)
            (seeds / f"gate-{number}").write_bytes(bytes([form | GATE]) + pair)


def conversation(text, line, character):
    """Messages about a source, with a request of each kind about a place in it."""
    about = {"textDocument": {"uri": "file:///a.cdefsrc"}}
    place = {"line": line, "character": character}
    whole = {"start": {"line": 0, "character": 0}, "end": {"line": line + 9, "character": 0}}
    yield "textDocument/didOpen", {"textDocument": {"uri": "file:///a.cdefsrc", "languageId": "cdefsrc", "version": 1,
                                                    "text": text.decode(errors="replace")}}
    for method in ("hover", "completion", "definition", "references", "documentHighlight", "prepareRename"):
        yield f"textDocument/{method}", {**about, "position": place, "context": {"includeDeclaration": True}}
    yield "textDocument/rename", {**about, "position": place, "newName": "New"}
    yield "textDocument/codeAction", {**about, "range": whole, "context": {"diagnostics": []}}
    for method in ("documentSymbol", "foldingRange", "semanticTokens/full", "diagnostic", "formatting"):
        yield f"textDocument/{method}", about
    yield "textDocument/rangeFormatting", {**about, "range": whole}
    yield "workspace/symbol", {"query": "a"}
    yield "textDocument/didChange", {"textDocument": {**about["textDocument"], "version": 2}, "contentChanges": [
        {"range": {"start": place, "end": place}, "text": "\n\tId=1"}]}
    yield "textDocument/didClose", about
    yield "shutdown", {}


def write_lsp_seeds(directory):
    """Conversations about small sources, as bodies and as a stream."""
    texts = [text for text in sources() if len(text) < 1500]
    for number, text in enumerate(texts):
        place = number % (text.count(b"\n") + 1), number % 20
        bodies = [json.dumps({"jsonrpc": "2.0", "method": method, "params": params,
                              **({} if method.split("/")[-1].startswith("did") else {"id": count})}).encode()
                  for count, (method, params) in enumerate(conversation(text, *place))]
        (directory / "lsp" / f"bodies-{number}").write_bytes(b"\0" + b"\0".join(bodies))
    initialize = b'{"jsonrpc":"2.0","id":1,"method":"initialize","params":{"capabilities":{}}}'
    stream = b"".join(b"Content-Length: %d\r\n\r\n%s" % (len(body), body) for body in (initialize, *bodies))
    (directory / "lsp" / "stream").write_bytes(b"\1" + stream)


def escaped(word):
    """A dictionary entry."""
    text = "".join(c if c.isalnum() or c in "=,._-" else f"\\x{ord(c):02x}" for c in word)
    return f'"{text}"\n'


def words(command):
    """Every word of the language, with the characters that can surround it."""
    listed = subprocess.run(command, capture_output=True, text=True, check=True).stdout
    for line in listed.splitlines():
        what, *rest = line.split()
        if what == "stanza":
            yield f"\n{rest[0]}\n"
        elif what == "attribute":
            yield f"\n\t{rest[1]}="
        elif what == "property":
            yield rest[1]
        elif what in ("type", "variable", "permission"):
            yield rest[0]
    yield from MORE_WORDS


def main():
    """Writes all seeds and dictionaries."""
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("--compile-many", type=pathlib.Path, required=True)
    parser.add_argument("--list-names", type=pathlib.Path, required=True)
    parser.add_argument("--runner", default="", help="the words, separated by ;, that programs of another machine need")
    parser.add_argument("directory", type=pathlib.Path)
    options = parser.parse_args()
    runner = [word for word in options.runner.split(";") if word]
    for name in ("source", "image", "cdef", "lsp"):
        (options.directory / name).mkdir(parents=True, exist_ok=True)
    texts = list(sources())
    for number, text in enumerate(texts):
        (options.directory / "source" / str(number)).write_bytes(bytes([OPTIONS[number % len(OPTIONS)]]) + text)
    compile_sources([*runner, options.compile_many.resolve()], options.directory / "image", texts)
    command = [sys.executable, "-B", TESTS / "support" / "make_images.py", "--out", options.directory / "image"]
    subprocess.run(command, check=True)
    write_cdef_seeds(options.directory)
    write_lsp_seeds(options.directory)
    dictionary = sorted({escaped(word) for word in words([*runner, options.list_names.resolve()])})
    (options.directory / "source.dict").write_text("".join(dictionary))


if __name__ == "__main__":
    main()
