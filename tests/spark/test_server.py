"""Frames of a session on a server have the bins of those of a session in this process."""

import os
import subprocess
import sys
from pathlib import Path

import numpy as np
import pyarrow.parquet as pq
import pytest
from tables import random_table

HERE = Path(__file__).parent


def test_a_server_reduces_frames(tmp_path):
    pytest.importorskip("grpc")
    table = tmp_path / "wide.parquet"
    pq.write_table(random_table(np.random.default_rng(6), "fractions"), table)
    client = [sys.executable, "-W", "ignore", HERE / "client.py", table, tmp_path]
    run = subprocess.run(
        client, env=os.environ | {"PYTHONPATH": str(HERE.parent)}, stderr=subprocess.PIPE, text=True, timeout=240
    )
    assert run.returncode == 0, run.stderr[-3000:]
