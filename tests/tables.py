"""Random tables of columns of many kinds, and what is compared of the bins of two runs."""

import datetime
import decimal
import json

import numpy as np
import pyarrow as pa

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


def figures(bins):
    """All that the result tells, but for how the rows were reduced."""
    document = json.loads(bins.to_json())
    del document["reduction"]
    return document


#: For `missing`: of several kinds of columns.
MISSING = {"whole": [3, (10, 12)], "odd": [1.0], "t": ["blue"], "u": [2], "day": [datetime.date(2020, 2, 3)]}
