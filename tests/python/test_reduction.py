"""A table that its engine reduces has the bins of a run over its rows, to the last bit."""

import datetime
import decimal
import json
import warnings

import duckdb
import mcbinning as mb
import numpy as np
import pyarrow as pa
import pytest
from mcbinning import _buckets

KINDS = ["whole", "cents", "free", "odd", "single", "long", "money", "day", "instant", "text", "flag"]


def random_table(rng, weights):
    """Attributes of many kinds, of which `odd` has what doubles have that numbers have not."""
    n = int(rng.integers(300, 1500))
    t = rng.integers(0, rng.integers(2, 5), n)
    odd = [0.0, -0.0, np.inf, -np.inf, np.nan, 1.0, -1.0, 5e-324, 1.7976931348623157e308, -1.7976931348623157e308]
    days = np.datetime64("2020-01-01") + rng.integers(0, 300, n) + 40 * t
    columns = {
        "whole": rng.integers(-20, 40, n) + t * rng.integers(0, 8),
        "cents": np.round(rng.normal(0, 3, n) + t, 2),
        "free": rng.normal(0, 1, n) + t * 0.7,
        "odd": rng.choice(odd, n),
        "single": rng.normal(0, 1, n).astype(np.float32),
        "long": rng.integers(2**53 - 8, 2**53 + 8, n),
        "day": days,
        "instant": days.astype("datetime64[us]") + rng.integers(0, 10**11, n),
        "flag": rng.random(n) < 0.3 + 0.1 * t,
    }
    table = {name: pa.array(values, mask=rng.random(n) < rng.choice([0, 0.1])) for name, values in columns.items()}
    cents = [decimal.Decimal(int(c)).scaleb(-2) for c in rng.integers(-500, 500, n)]
    table["money"] = pa.array(cents, pa.decimal128(12, 2))
    table["text"] = pa.array([f"c{c}" for c in (t + rng.integers(0, 3, n)) % 5])
    table["t"] = pa.array(np.array(["red", "", "blue", "é", "o'"])[t].tolist(), mask=rng.random(n) < 0.05)
    table["u"] = pa.array(rng.integers(0, 3, n).astype(float), mask=rng.random(n) < 0.05)
    make = {
        "none": lambda: np.ones(n),
        "whole": lambda: rng.integers(0, 9, n).astype(float),
        "fractions": lambda: rng.random(n) * np.exp(rng.normal(0, 5, n)) * (rng.random(n) < 0.9),
        "cents": lambda: np.round(rng.random(n) * 3, 2),
    }
    table["w"] = pa.array(make[weights](), mask=rng.random(n) < 0.1)
    return pa.table({name: table[name] for name in [*KINDS, "t", "u", "w"]})


def relation_of(table):
    connection = duckdb.connect()
    connection.execute("SET TimeZone = 'UTC'")
    connection.register("rows_of_test", table)
    return connection.sql("SELECT * FROM rows_of_test")


def figures(bins):
    """All that the result tells, but for how the rows were reduced."""
    document = json.loads(bins.to_json())
    del document["reduction"]
    return document


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
        "missing": {"whole": [3, (10, 12)], "odd": [1.0], "t": ["blue"], "u": [2], "day": [datetime.date(2020, 2, 3)]},
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
