"""The code in the guides runs as it stands."""

from __future__ import annotations

import re

import matplotlib.pyplot as plt
import pytest
from conftest import ROOT

GUIDES = [(ROOT / "docs" / name).read_text(encoding="utf-8") for name in ("python.md", "engines.md")]
BLOCKS = [block for guide in GUIDES for block in re.findall(r"^```python\n(.*?)^```", guide, re.M | re.S)]


WORKBENCH = re.findall(
    r"^```python\n(.*?)^```", (ROOT / "docs" / "workbench.md").read_text(encoding="utf-8"), re.M | re.S
)


@pytest.mark.parametrize("code", [*BLOCKS, "".join(WORKBENCH)], ids=lambda code: code.splitlines()[0])
def test_code_of_the_guide_runs(code, tmp_path, monkeypatch):
    (tmp_path / "examples").symlink_to(ROOT / "examples")
    monkeypatch.chdir(tmp_path)

    exec(compile(code, "docs", "exec"), {})
    plt.close("all")


def test_the_guides_have_their_eight_walks():
    assert len(WORKBENCH) >= 6
    assert len(BLOCKS) == 8 and len(BLOCKS[0].splitlines()) == 10
