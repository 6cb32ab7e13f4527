"""kill -9 in the middle: what is left is for its user alone, and the next run is undisturbed."""

from __future__ import annotations

import signal
import stat
import subprocess
import sys
import textwrap

import mcbinning as mb
import numpy as np
import pandas as pd
import pytest

KILLED = """
    import os, signal, sys, numpy as np, pandas as pd, mcbinning as mb
    phase, directory = sys.argv[1:]
    os.umask(0)
    frame = pd.DataFrame({"x": np.arange(250_000.0), "kind": np.where(np.arange(250_000) < 70_000, "b", "a")})

    def die(now, index):
        if now == phase:
            os.kill(os.getpid(), signal.SIGKILL)

    mb.supervised_bins(frame, "kind", temp_dir=directory, progress=die)
"""


@pytest.mark.parametrize("phase", ["records", "attributes"])
def test_a_killed_process_leaves_files_for_its_user_alone(tmp_path, phase):
    script = textwrap.dedent(KILLED)
    done = subprocess.run([sys.executable, "-c", script, phase, str(tmp_path)], capture_output=True, timeout=120)
    assert done.returncode == -signal.SIGKILL, done.stderr

    left = sorted(tmp_path.iterdir())
    assert len(left) == 2 and {stat.S_IMODE(path.stat().st_mode) for path in left} == {0o600}
    frame = {"x": np.arange(100.0), "kind": np.array(["a"] * 50 + ["b"] * 50)}
    assert mb.supervised_bins(pd.DataFrame(frame), "kind", temp_dir=tmp_path)["x"].cut_points.tolist() == [49.0]
    assert sorted(tmp_path.iterdir()) == left
