"""A table that its engine reduces has the bins of a run over its rows, to the last bit."""

import warnings

import duckdb
import mcbinning as mb
import numpy as np
import pyarrow as pa
import pytest
from mcbinning import _buckets
from tables import KINDS, MISSING, figures, random_table


def relation_of(table):
    connection = duckdb.connect()
    connection.execute("SET TimeZone = 'UTC'")
    connection.register("rows_of_test", table)
    return connection.sql("SELECT * FROM rows_of_test")


def check_equal(function, table, *arguments, **options):
    """Over the rows and by DuckDB."""
    with warnings.catch_warnings():
        warnings.simplefilter("ignore", mb.BinningWarning)
        limits = {name: options.pop(name) for name in ("max_groups", "distinct") if name in options}
        rows = function(table, *arguments, **options)
        reduced = function(relation_of(table), *arguments, **options, **limits, reduce="engine")
    assert figures(reduced) == figures(rows)
    return reduced


@pytest.mark.parametrize("seed", range(8))
def test_random_tables_have_equal_figures(seed):
    rng = np.random.default_rng(seed)
    weights = ["none", "whole", "fractions", "cents"][seed % 4]
    table = random_table(rng, weights)
    common = {
        "weight": None if weights == "none" else "w",
        "closed": str(rng.choice(["right", "left"])),
        "rounding": str(rng.choice(["none", "truncate", "closest"])),
        "missing": dict(MISSING),
    }
    if weights != "none":
        common["missing"]["w"] = [0.5, (7, 8)]
    supervised = common | {
        "small_bin_ratio": float(rng.choice([0, 0.5])),
        "max_distinct": rng.choice([None, 20]),
        "n_bins": int(rng.choice([5, 50])),
    }
    check_equal(mb.supervised_bins, table, "t", KINDS, **supervised)
    check_equal(mb.equal_frequency_bins, table, KINDS, n_bins=int(rng.choice([2, 7, 300])), **common)
    pairs = [("free", "t"), ("cents", "u"), ("text", "u"), ("odd", "text"), ("u", "t")]
    check_equal(mb.supervised_bins, table, pairs=pairs, **supervised)


SHAPES = {
    "normal": lambda rng, n: rng.normal(0, 1, n),
    "decades": lambda rng, n: np.exp(rng.normal(0, 25, n)) * rng.choice([-1, 1], n),
    "heavy": lambda rng, n: np.where(rng.random(n) < 0.6, 3.5, 3.5 + rng.normal(0, 1e-9, n)),
    "crowded": lambda rng, n: np.where(
        rng.random(n) < 0.01, rng.normal(0, 1e9, n), 5 + 1e-13 * rng.integers(0, 3000, n)
    ),
    "whole": lambda rng, n: rng.integers(-2000, 2000, n),
    "instants": lambda rng, n: np.datetime64("2020-01-01", "us") + rng.integers(0, 10**9, n),
    "single": lambda rng, n: rng.normal(0, 1, n).astype(np.float32),
}


@pytest.mark.parametrize("shape", SHAPES)
@pytest.mark.parametrize("buckets", [600, 3000])
def test_many_valued_attributes_are_joined_without_loss(shape, buckets, monkeypatch):
    monkeypatch.setattr(_buckets, "_BUCKETS", buckets)
    monkeypatch.setattr(_buckets, "_FEW_ROWS", 300)
    rng = np.random.default_rng(buckets)
    n = 4000
    x = SHAPES[shape](rng, n)
    if x.dtype == float:
        x[:40] = [np.inf, -np.inf, np.nan, 0.0, -0.0, 1.7976931348623157e308, 5e-324, -5e-324] * 5
    t = rng.integers(0, 3, n)
    table = pa.table(
        {
            "x": pa.array(x, mask=rng.random(n) < 0.05),
            "t": pa.array(t, mask=rng.random(n) < 0.05),
            "w": pa.array(rng.integers(0, 12, n) / 4.0, mask=rng.random(n) < 0.05),
        }
    )
    missing = {"t": [2]} if shape == "instants" else {"t": [2], "x": [7, (100, 120)]}
    told = []
    for closed in ("right", "left"):
        for n_bins in (7, 60):
            options = {"weight": "w", "missing": missing, "closed": closed, "n_bins": n_bins, "max_groups": 1999}
            told.append(check_equal(mb.equal_frequency_bins, table, ["x"], **options))
            told.append(check_equal(mb.supervised_bins, table, "t", ["x"], **options, max_distinct=10))
    if buckets == 600 and shape != "heavy":
        assert min(bins.reduction.groups["x"] for bins in told) < 1000
