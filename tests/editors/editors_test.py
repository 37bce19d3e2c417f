"""The editors themselves, each with its configuration from editors/ and the server: a diagnostic is shown, an attribute
is completed, a name is changed, the text is formatted. Only script/test-editors runs this."""

import os
import pathlib
import subprocess
import time

import pytest

from compare import same
from programs import PROGRAMS, PROJECT

HERE = pathlib.Path(__file__).resolve().parent
WAIT = 60  # seconds; none of the answers takes so long
BEFORE = (HERE / "before.cdefsrc").read_text()
# "Description" has been completed, "Host" renamed, and all formatted.
AFTER = (HERE / "after.cdefsrc").read_text()
MESSAGE = "Attribute name not defined in table (name/table): DescrResourceClass"


@pytest.fixture
def place(directory):
    """A directory with the source, and an empty home directory."""
    (directory / "pump.cdefsrc").write_text(BEFORE)
    (directory / "home").mkdir()
    return directory


def environment(place):
    """The environment, in which the program cdef is on the PATH."""
    return {**os.environ, "HOME": str(place / "home"), "XDG_CONFIG_HOME": str(place / "home"), "TERM": "dumb",
            "XDG_DATA_HOME": str(place / "home"), "PATH": f"{PROGRAMS.build}:{os.environ['PATH']}", "LC_ALL": "C.UTF-8"}


class Neovim:
    """A Neovim without a screen, into which the test types."""

    def __init__(self, place):
        self.place = place
        self.home = place / "home"
        configuration = PROJECT / "editors/neovim/cdef.lua"
        self.process = subprocess.Popen(
            ["nvim", "--headless", "--clean", "--listen", "socket", "-c", f"luafile {configuration}", "-c", "edit ../pump.cdefsrc"],
            cwd=self.home, env=environment(place), stdin=subprocess.DEVNULL, stdout=subprocess.DEVNULL, stderr=subprocess.STDOUT)

    def remote(self, *words):
        """What another Neovim makes this one do. An early version prints values to standard error."""
        done = subprocess.run(["nvim", "--server", "socket", *words], cwd=self.home, env=environment(self.place),
                              stdin=subprocess.DEVNULL, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True,
                              timeout=WAIT, check=False)
        return done.stdout

    def type(self, keys):
        """Keys, as in a mapping."""
        self.remote("--remote-send", keys)

    def expect(self, expression, wanted):
        """Wait until an expression has a value."""
        end, value = time.monotonic() + WAIT, None
        while value != wanted and time.monotonic() < end:
            value = self.remote("--remote-expr", expression).rstrip("\n")
            time.sleep(0.05)
        same(value, wanted, expression)


def test_neovim(place):
    """Version 0.7 or later, by its keys and commands."""
    nvim = Neovim(place)
    try:
        nvim.expect("luaeval('(vim.lsp.get_active_clients()[1] or { config = {} }).config.root_dir')", str(place))
        nvim.expect("luaeval('(vim.diagnostic.get(0)[1] or { message = \"\" }).message')", MESSAGE)
        nvim.type("4Gf=DA<C-x><C-o>")
        nvim.expect("trim(getline(4))", "Description=")
        nvim.type("1<Esc>")
        nvim.expect("luaeval('#vim.diagnostic.get(0)')", "0")
        nvim.type(":19<CR>f=l:lua vim.lsp.buf.rename('HostName')<CR>")
        nvim.expect("trim(getline(9))", "Locator=HostName")
        nvim.type(":lua vim.lsp.buf.formatting_sync()<CR>")
        nvim.expect("getline(4)", "ResourceClass")  # an empty line has been put in front
        nvim.type(":write<CR>:quitall!<CR>")
        same(nvim.process.wait(WAIT), 0, "status")
    finally:
        nvim.process.kill()
        nvim.process.wait()
    same((place / "pump.cdefsrc").read_text(), AFTER, "source")


def test_neovim_completes_the_header_of_a_stanza(place):
    """Neovim 0.7 would insert the newlines of the required lines as zero bytes. A code action adds the lines."""
    nvim = Neovim(place)
    try:
        nvim.expect("luaeval('(vim.diagnostic.get(0)[1] or { message = \"\" }).message')", MESSAGE)
        nvim.type("Go<C-u>ResourceV<C-x><C-o>")
        nvim.expect("getline('$')", "ResourceVariableClass")
        nvim.type("<C-y><Esc>:write<CR>")
        nvim.expect("&modified", "0")
        same((place / "pump.cdefsrc").read_text(), BEFORE + "ResourceVariableClass\n", "source")
        nvim.type(":lua vim.ui.select = function(offers, _, choose) choose(offers[1]) end<CR>")
        nvim.type(":lua vim.lsp.buf.code_action()<CR>")
        nvim.expect("trim(getline('$'))", "ReportingInterval=0")
        nvim.type(":write<CR>:quitall!<CR>")
        same(nvim.process.wait(WAIT), 0, "status")
    finally:
        nvim.process.kill()
        nvim.process.wait()
    lines = "\tVariableClass=NewVariableClass\n\tObservationInterval=0\n\tReportingInterval=0\n"
    same((place / "pump.cdefsrc").read_text(), BEFORE + "ResourceVariableClass\n" + lines, "source")


def test_emacs(place):
    """Version 28 with eglot, by its commands."""
    command = ["emacs", "--batch", "--no-site-file", "-f", "package-initialize", "-l", PROJECT / "editors/emacs/cdef.el",
               "-l", HERE / "eglot.el"]
    done = subprocess.run(command, cwd=place, env=environment(place), stdin=subprocess.DEVNULL, capture_output=True,
                          text=True, timeout=4 * WAIT, check=False)
    same(done.returncode, 0, done.stdout + done.stderr)
    said = [line for line in done.stdout.splitlines() if line.startswith("diagnostic: ")]
    same(said, [f"diagnostic: cdef [S106]: {MESSAGE}", "diagnostic: none"], "diagnostics")
    same((place / "pump.cdefsrc").read_text(), AFTER, "source")
