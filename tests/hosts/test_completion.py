"""What a shell offers for a command line that ends within a word."""

from __future__ import annotations

import os
import pty
import select
import shutil
import subprocess
import time
from pathlib import Path

import pytest

CASES = {
    "": {"supervised", "equal-frequency", "show", "evaluate", "apply", "--help", "--version", "--completion"},
    "ev": {"evaluate"},
    "supervised --category": {"--category-order"},
    "supervised --category-order ": {"rate", "text"},
    "supervised x.csv --closed=l": {"left"},
    "apply --out": {"--output"},
    "supervised --target ": set(),
    "supervised --temp-dir d": {"directory"},
    "supervised --report d": {"data.csv", "directory"},
    "supervised d": {"data.csv", "directory"},
}
FILES = {"supervised --report d", "supervised d"}
"""These are left to bash's own completion of files."""


@pytest.fixture
def directory(tmp_path) -> Path:
    (tmp_path / "data.csv").touch()
    (tmp_path / "directory").mkdir()
    return tmp_path


def script(mcbin: str, shell: str) -> str:
    return subprocess.run([mcbin, "--completion", shell], capture_output=True, text=True, check=True).stdout


@pytest.mark.parametrize("line", CASES)
def test_bash_offers_what_can_follow(mcbin, directory, line):
    words = ["mcbin", *line.replace("=", " = ").split()]
    if line == "" or line.endswith(" "):
        words.append("")
    ask = script(mcbin, "bash") + 'COMP_WORDS=("$@") COMP_CWORD=$(($# - 1)); _mcbin; printf "%s\\n" "${COMPREPLY[@]}"'
    call = subprocess.run(
        ["bash", "-c", ask, "bash", *words], cwd=directory, capture_output=True, text=True, check=True
    )
    assert call.stderr == ""
    assert set(call.stdout.split()) == (set() if line in FILES else CASES[line])


class Zsh:
    """A shell on a terminal, in which somebody types."""

    def __init__(self, directory: Path) -> None:
        self.process, self.terminal = pty.fork()
        if self.process == 0:
            os.chdir(directory)
            os.execvpe("zsh", ["zsh", "-f", "-i"], {**os.environ, "TERM": "dumb", "PS1": "", "HOME": str(directory)})

    def type(self, text: str, awaited: str) -> str:
        """What the shell shows up to `awaited`."""
        os.write(self.terminal, text.encode())
        shown, end = "", time.monotonic() + 20
        while awaited not in shown:
            assert time.monotonic() < end, f"{awaited!r} did not come: {shown!r}"
            if select.select([self.terminal], [], [], 0.1)[0]:
                shown += os.read(self.terminal, 65536).decode(errors="replace")
        return shown

    def close(self) -> None:
        os.close(self.terminal)
        os.waitpid(self.process, 0)


def test_zsh_completes_commands_options_words_and_files(mcbin, directory):
    if shutil.which("zsh") is None:
        pytest.skip("there is no zsh")
    (directory / "_mcbin").write_text(script(mcbin, "zsh"))
    zsh = Zsh(directory)
    try:
        zsh.type("fpath=($PWD $fpath); autoload -Uz compinit; compinit -u -D; echo rea''dy\n", "ready")
        for typed, completed in (
            ("ev", "evaluate "),
            ("supervised --category", "supervised --category-order="),
            ("supervised --closed=l", "supervised --closed=left "),
            ("supervised dat", "supervised data.csv "),
            ("supervised data.csv --temp-dir=d", "supervised data.csv --temp-dir=directory"),
            ("apply --out", "apply --output="),
        ):
            zsh.type(f"mcbin {typed}\t", completed.split()[-1])
            os.write(zsh.terminal, b"\x15")  # which empties the line
    finally:
        zsh.close()
