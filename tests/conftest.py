"""What the tests of all hosts share."""

from __future__ import annotations

import os
import shutil
from pathlib import Path

import pytest

ROOT = Path(__file__).resolve().parents[1]


#: How reasons begin that name equipment, and the one that scikit-learn's checks have to leave out an experiment of
#: SciPy's. In ./test, which sets NO_SKIPS, no other reason is good.
GOOD_REASONS = ("needs ", "SCIPY_ARRAY_API is not set")


@pytest.hookimpl(hookwrapper=True)
def pytest_runtest_makereport(item, call):
    outcome = yield
    report = outcome.get_result()
    is_skip = call.excinfo is not None and call.excinfo.errisinstance(pytest.skip.Exception)
    if is_skip and os.environ.get("NO_SKIPS") and not str(call.excinfo.value).startswith(GOOD_REASONS):
        report.outcome = "failed"
        report.longrepr = f"skipped, which would hide a fault: {call.excinfo.value}"


@pytest.fixture(scope="session")
def mcbin() -> str:
    """The command-line tool: the one in MCBIN, on the path, or in a build directory."""
    built = sorted(ROOT.glob("build/*/hosts/mcbin/mcbin"))
    found = os.environ.get("MCBIN") or shutil.which("mcbin") or (str(built[0]) if built else None)
    if not found:
        pytest.skip("there is no mcbin to compare with: name it in MCBIN")
    return found
