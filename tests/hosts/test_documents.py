"""What the documents show is what the tool prints."""

from __future__ import annotations

import os
import re
import subprocess
from pathlib import Path

import pytest

ROOT = Path(__file__).resolve().parents[2]


def read_blocks(document: str) -> list[str]:
    text = (ROOT / document).read_text(encoding="utf-8")
    return re.findall(r"^```console\n(.*?)^```", text, re.M | re.S)


def read_commands(block: str) -> list[tuple[str, str]]:
    """The commands of a block, each with the output that stands below it."""
    return re.findall(r"^\$ (.*)\n((?:(?!\$ ).*\n)*)", block, re.M)


@pytest.fixture
def shell(mcbin, tmp_path):
    """Runs a command where the examples and mcbin are, as the reader would. It has to succeed."""
    (tmp_path / "examples").symlink_to(ROOT / "examples")
    environment = {**os.environ, "PATH": f"{Path(mcbin).parent}:{os.environ['PATH']}"}

    def run(command: str) -> str:
        done = subprocess.run(["bash", "-c", command], cwd=tmp_path, env=environment, capture_output=True, text=True)
        assert done.returncode == 0, done.stderr
        return done.stdout

    return run


@pytest.mark.parametrize(("document", "least"), [("docs/walkthrough.md", 7), ("docs/workbench.md", 7)])
def test_a_guide_shows_what_its_commands_print(shell, document, least):
    blocks = read_blocks(document)

    assert len(blocks) >= least
    for block in blocks:
        for command, output in read_commands(block):
            assert shell(command).rstrip("\n") == output.rstrip("\n"), command


def test_the_readme_shows_what_quickstart_prints(shell):
    [(_, output)] = read_commands(read_blocks("README.md")[0])
    announced, *shown, page = output.splitlines()

    command = announced.removeprefix("== ").split(" --report")[0]
    assert command in (ROOT / "quickstart").read_text(encoding="utf-8").replace("$mcbin", "mcbin")
    assert shell(command).splitlines() == shown
    assert page.startswith("The same as a page")


def test_the_tests_that_hold_a_promise_are_there():
    named = re.findall(r"`(tests(?:/[\w.]+)+|test)`", (ROOT / "SECURITY.md").read_text(encoding="utf-8"))

    assert len(named) > 20 and [path for path in named if not (ROOT / path).exists()] == []
