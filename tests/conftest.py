"""What the tests of all hosts share."""

from __future__ import annotations

import os
import shutil
from pathlib import Path

import pytest

ROOT = Path(__file__).resolve().parents[1]


@pytest.fixture(scope="session")
def mcbin() -> str:
    """The command-line tool: the one in MCBIN, on the path, or in a build directory."""
    built = sorted(ROOT.glob("build/*/hosts/mcbin/mcbin"))
    found = os.environ.get("MCBIN") or shutil.which("mcbin") or (str(built[0]) if built else None)
    if not found:
        pytest.skip("there is no mcbin to compare with: name it in MCBIN")
    return found
