from __future__ import annotations

import os
from pathlib import Path

import numpy as np
import pandas as pd
import pytest

ROOT = Path(__file__).resolve().parents[2]
IRIS = ROOT / "examples" / "data" / "iris.csv"

os.environ.setdefault("MPLBACKEND", "Agg")


@pytest.fixture
def iris() -> pd.DataFrame:
    return pd.read_csv(IRIS)


@pytest.fixture
def mixed() -> pd.DataFrame:
    """Columns of many types, all made from one number whose mean moves with the target."""
    rng = np.random.default_rng(1)
    y = rng.choice(["c", "a", "b"], 1500, p=[0.3, 0.3, 0.4])
    x = rng.normal(size=1500) + 2.0 * (y == "a")
    start = pd.Timestamp("2020-01-01")
    return pd.DataFrame(
        {
            "x": x,
            "whole": (x * 10).astype(int),
            "single": x.astype(np.float32),
            "flag": x > 0,
            "stamp": start + pd.to_timedelta((x * 1e5).round(), unit="s"),
            "zoned": start.tz_localize("Europe/Berlin") + pd.to_timedelta((x * 1e5).round(), unit="s"),
            "day": [(start + pd.Timedelta(days=int(value * 10))).date() for value in x],
            "y": y,
        }
    )
