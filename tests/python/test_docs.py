"""The code in the guide runs as it stands."""

from __future__ import annotations

import re

import matplotlib.pyplot as plt
import pytest
from conftest import ROOT

BLOCKS = re.findall(r"^```python\n(.*?)^```", (ROOT / "docs" / "python.md").read_text(encoding="utf-8"), re.M | re.S)


@pytest.mark.parametrize("code", BLOCKS, ids=lambda code: code.splitlines()[0])
def test_code_of_the_guide_runs(code, tmp_path, monkeypatch):
    (tmp_path / "examples").symlink_to(ROOT / "examples")
    monkeypatch.chdir(tmp_path)

    exec(compile(code, "docs/python.md", "exec"), {})
    plt.close("all")


def test_the_guide_has_its_five_walks():
    assert len(BLOCKS) == 5 and len(BLOCKS[0].splitlines()) == 10
