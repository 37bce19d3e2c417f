"""Test the project of examples/projects/bazel with Bazel: in copies of it, without a network, and with a cache in
nginx. Only script/test-bazel runs this."""

import contextlib
import json
import os
import shutil
import socket
import subprocess
import sys
import time

import pytest

from programs import PROGRAMS, PROJECT, environment

EXAMPLE = PROJECT / "examples/projects/bazel"
DISK = (EXAMPLE / "classes/Disk.cdefsrc").read_bytes()
WAIT = 300  # seconds; no build takes so long
CACHE = """
daemon off;
master_process off;
error_log stderr error;
pid {place}/nginx.pid;
events {{ }}
http {{
    access_log off;
    log_not_found off;
    client_body_temp_path {place}/body;
    proxy_temp_path {place}/proxy;
    fastcgi_temp_path {place}/fastcgi;
    uwsgi_temp_path {place}/uwsgi;
    scgi_temp_path {place}/scgi;
    server {{
        listen 127.0.0.1:{port};
        location / {{
            root {place}/cache;
            dav_methods PUT;
            create_full_put_path on;
            client_max_body_size 0;
        }}
    }}
}}
"""


class Workspace:
    """A copy of the example, and Bazel in it without a user's settings."""

    def __init__(self, directory, name):
        self.place = directory / name
        self.root = directory / "bazel"
        self.log = directory / f"{name}.log"
        shutil.copytree(EXAMPLE, self.place)

    def bazel(self, *options, cdef=PROGRAMS.cdef, **more):
        """Returns the exit status and what Bazel printed."""
        self.log.unlink(missing_ok=True)
        command = ["bazel", "--nohome_rc", "--batch", f"--output_user_root={self.root}", "build", "--nosandbox_debug",
                   f"--execution_log_json_file={self.log}", *options]
        done = subprocess.run(command, cwd=self.place, stdin=subprocess.DEVNULL, stdout=subprocess.PIPE,
                              stderr=subprocess.STDOUT, text=True, timeout=WAIT, check=False,
                              env={**os.environ, "CDEF": str(cdef), **more})
        return done.returncode, done.stdout

    def build(self, *options, **more):
        """Builds what must build. Returns the actions that ran cdef, or would have without the cache."""
        status, output = self.bazel(*options, **more)
        assert status == 0, output
        decoder, text, actions = json.JSONDecoder(), self.log.read_text(), []
        while text:
            action, end = decoder.raw_decode(text)
            actions.append(action)
            text = text[end:].lstrip()
        return [each for each in actions if each["mnemonic"] == "CdefBuild"]

    def database(self, name):
        """Its bytes."""
        return (self.place / "bazel-bin" / name).read_bytes()


@pytest.fixture
def workspace(directory):
    """A copy of the example."""
    return Workspace(directory, "workspace")


@contextlib.contextmanager
def cache(directory):
    """The address of a cache for Bazel, which nginx provides while the context is open."""
    with socket.socket() as free:
        free.bind(("127.0.0.1", 0))
        port = free.getsockname()[1]
    (directory / "cache").mkdir()
    (directory / "nginx.conf").write_text(CACHE.format(place=directory, port=port))
    with subprocess.Popen(["/usr/sbin/nginx", "-p", directory, "-c", directory / "nginx.conf"]) as server:
        try:
            wait_for(server, port)
            yield f"http://127.0.0.1:{port}"
        finally:
            server.terminate()


def wait_for(server, port):
    """Until the server answers."""
    for _ in range(300):
        assert server.poll() is None, "nginx has ended"
        with contextlib.suppress(ConnectionRefusedError), socket.create_connection(("127.0.0.1", port), 10):
            return
        time.sleep(0.1)
    raise AssertionError("nginx does not listen")


def compiled(directory, source, order):
    """The database that the compiler makes from a source, without a time."""
    (directory / "one.cdefsrc").write_bytes(source)
    options = [] if order == sys.byteorder else ["-s"]
    subprocess.run([PROGRAMS.cdgen, *options, "one.cdefsrc", "one.cdef"], cwd=directory, check=True, env=environment())
    return (directory / "one.cdef").read_bytes()


def numbered(number):
    """A source that differs from all other numbers' sources."""
    return DISK.replace(b"Name=Disk\n", b"Name=Disk%d\n" % number).replace(b"4096", b"%d" % (4096 + number))


def test_second_workspace_compiles_nothing(directory):
    """200 databases of 100 classes that one workspace has made reach another one through the cache. Neither the time
    nor the path of the workspace changes a byte."""
    sources = {f"Disk{number}": numbered(number) for number in range(1, 101)}
    with cache(directory) as address:
        found = []
        for name, date in (("first", "1"), ("second", "2")):
            place = Workspace(directory, name)
            (place.place / "classes/Disk.cdefsrc").unlink()
            for stem, source in sources.items():
                (place.place / "classes" / f"{stem}.cdefsrc").write_bytes(source)
            actions = place.build(f"--remote_cache={address}", "//:databases", SOURCE_DATE_EPOCH=date)
            found.append((len(actions), sum(each["remoteCacheHit"] for each in actions)))
            for stem, source in sources.items():
                for order in ("little", "big"):
                    assert place.database(f"{order}/{stem}.cdef") == compiled(directory, source, order)
    assert found == [(200, 0), (200, 200)]


def test_action_sees_named_files_only(workspace):
    """The program, the source and the project file, and no environment variable."""
    (workspace.place / "cdef.toml").write_text("[warnings]\nwerror = true\n")
    build = workspace.place / "BUILD"
    build.write_text(build.read_text().replace("src = source,", 'src = source, config = "cdef.toml",'))
    for action in workspace.build("//:databases"):
        assert [each["path"] for each in action["inputs"]] == ["cdef.toml", "classes/Disk.cdefsrc", "external/cdef/cdef"]
        assert action["environmentVariables"] == []


def test_another_program_builds_again(workspace, directory):
    """Bytes after the end of a program change its contents, but not what it does."""
    program = directory / "cdef"
    shutil.copy(PROGRAMS.cdef, program)
    assert len(workspace.build("//:databases", cdef=program)) == 2
    assert not workspace.build("//:databases", cdef=program)
    with program.open("ab") as end:
        end.write(b"\n")
    assert len(workspace.build("//:databases", cdef=program)) == 2


def test_class_needs_a_name(workspace):
    """Whatever the project file says. Other warnings are errors too, unless the project file turns them off."""
    (workspace.place / "cdef.toml").write_text('[warnings]\noff = ["no-name", "octal"]\nwerror = false\n')
    (workspace.place / "nameless.cdefsrc").write_bytes(DISK.replace(b"\tName=Disk\n", b""))
    (workspace.place / "octal.cdefsrc").write_bytes(DISK.replace(b"LastKey=100", b"LastKey=0144"))
    (workspace.place / "BUILD").write_text("""
load("//:cdef.bzl", "cdef_database")
cdef_database(name = "nameless", src = "nameless.cdefsrc")
cdef_database(name = "nameless_allowed", src = "nameless.cdefsrc", config = "cdef.toml")
cdef_database(name = "octal", src = "octal.cdefsrc")
cdef_database(name = "octal_allowed", src = "octal.cdefsrc", config = "cdef.toml")
""")
    status, output = workspace.bazel("--keep_going", "//...")
    assert status == 1, output
    assert output.count("nameless.cdefsrc:5:1: warning: ") == 2, output
    assert output.count("octal.cdefsrc:35:10: warning: ") == 1, output
    assert [each.name for each in (workspace.place / "bazel-bin").glob("*.cdef")] == ["octal_allowed.cdef"]


def test_says_that_there_is_no_program(workspace):
    """The message says what to do."""
    path = [each for each in os.environ["PATH"].split(":") if not os.path.exists(os.path.join(each, "cdef"))]
    if not shutil.which("bazel", path=":".join(path)):
        pytest.skip("Bazel and cdef are in the same directory")
    status, output = workspace.bazel("//:databases", cdef="", PATH=":".join(path))
    assert status == 1
    assert "there is no cdef on the PATH; the environment variable CDEF can name it" in output
