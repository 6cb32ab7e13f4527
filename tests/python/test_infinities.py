"""An infinity is the value beyond all others of its sign, in every form that the bins take."""

from __future__ import annotations

import json
import math
import sqlite3
import subprocess

import duckdb
import mcbinning as mb
import numpy as np
import pandas as pd
import pytest
from hypothesis import given, settings
from hypothesis import strategies as st

pytestmark = pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")

INF = math.inf
LARGEST = float(np.finfo(np.float64).max)
SECOND = math.nextafter(LARGEST, 0.0)
THIRD = math.nextafter(SECOND, 0.0)
VALUES = st.sampled_from(
    [-INF, -LARGEST, -SECOND, -THIRD, -9e307, -1.0, 0.0, 2.0, 3.0, 9e307, THIRD, SECOND, LARGEST, INF]
)


def results(frame: pd.DataFrame, closed: str) -> list[mb.BinningResult]:
    return [
        mb.supervised_bins(frame, "y", ["x"], closed=closed),
        mb.supervised_bins(frame, "y", ["x"], closed=closed, max_distinct=2, n_bins=4),
        mb.equal_frequency_bins(frame, ["x"], closed=closed, n_bins=4),
    ]


@settings(max_examples=150, deadline=None)
@given(
    rows=st.lists(st.tuples(VALUES, st.sampled_from("ab")), min_size=4, max_size=40),
    closed=st.sampled_from(["right", "left"]),
)
def test_bins_recount_to_the_table_and_every_form_places_alike(rows, closed):
    frame = pd.DataFrame([*rows, (-1.0, "a"), (2.0, "b")], columns=["x", "y"])
    for result in results(frame, closed):
        found = result["x"]
        placed = result.transform(frame)["x_bin"].to_numpy(dtype=int)

        assert np.bincount(placed, minlength=found.n_bins).tolist() == found.weights.tolist()
        assert found.bin_numbers(frame["x"].to_numpy()).tolist() == placed.tolist()
        assert len(set(found.labels)) == found.n_bins
        assert mb.BinningResult.from_json(result.to_json())["x"].cut_points.tolist() == found.cut_points.tolist()
        assert (found.minimum, found.maximum) == tuple(
            np.sign(v) * LARGEST if THIRD <= abs(v) < INF else v for v in (frame["x"].min(), frame["x"].max())
        )
        in_duckdb = duckdb.sql(result.to_sql("duckdb", table="frame")).df()["x_bin"]
        assert in_duckdb.tolist() == placed.tolist()
        with sqlite3.connect(":memory:") as database:
            database.execute("CREATE TABLE t (x REAL)")
            database.executemany("INSERT INTO t VALUES (?)", [(value,) for value in frame["x"].tolist()])
            rows_of_sqlite = database.execute(result.to_sql("sqlite", table="t")).fetchall()
        assert [row[-1] for row in rows_of_sqlite] == placed.tolist()


def test_one_infinity_costs_a_column_nothing():
    x = np.arange(1000.0)
    y = np.where(x < 300, "a", np.where(x < 600, "b", "c"))
    for closed, cuts in (("right", [299.0, 599.0]), ("left", [300.0, 600.0])):
        for infinity, at in ((INF, 2), (-INF, 0)):
            frame = pd.DataFrame({"x": [*x, infinity], "y": [*y, "abc"[at]]})
            found = mb.supervised_bins(frame, "y", closed=closed)["x"]
            assert found.cut_points.tolist() == cuts
            assert found.weights.tolist()[at] == [300.0, 300.0, 400.0][at] + 1
            assert infinity in (found.minimum, found.maximum)
            fitted = mb.SupervisedBinner(closed=closed).fit(frame[["x"]].to_numpy(), frame["y"])
            assert fitted.cut_points_[0].tolist() == cuts
            assert fitted.transform([[infinity]]).tolist() == [[at]]


def test_an_infinity_that_is_a_cut_point_has_a_bin_for_itself(mcbin, tmp_path):
    cases = [
        ("right", -INF, ["[-inf, -inf]", "(-inf, +inf)"], -INF),
        ("left", INF, ["(-inf, +inf)", "[+inf, +inf]"], INF),
    ]
    for closed, infinity, labels, cut in cases:
        frame = pd.DataFrame({"x": [1.0, infinity] * 10, "y": ["finite", "infinite"] * 10})
        path = tmp_path / "data.csv"
        frame.to_csv(path, index=False)
        result = mb.supervised_bins(frame, "y", closed=closed)
        call = [mcbin, "supervised", path, "--target", "y", "--closed", closed, "--format"]
        document = json.loads(subprocess.run([*call, "json"], capture_output=True, check=True).stdout)
        sql = subprocess.run([*call, "sql"], capture_output=True, check=True, text=True).stdout

        assert result["x"].cut_points.tolist() == [cut] and result["x"].labels == labels
        assert json.loads(result.to_json())["results"] == document["results"]
        assert document["results"][0]["cut_points"] == ["inf" if cut > 0 else "-inf"]
        placed = [int(value == infinity) if infinity > 0 else int(value != infinity) for value in frame["x"]]
        assert duckdb.sql(f"SELECT {sql} FROM frame").df().iloc[:, 0].tolist() == placed
        assert result.transform(frame, labels=True)["x_bin"].tolist() == [labels[i] for i in placed]
        assert "-inf" in result.to_sql(labels=True)
        result.plot()


def test_the_most_negative_number_is_a_value_and_infinities_can_be_missing():
    frame = pd.DataFrame({"x": [-LARGEST, 1.0, 2.0, INF, -INF, None]})

    assert mb.equal_frequency_bins(frame, n_bins=2)["x"].missing_weight == 1.0
    assert mb.equal_frequency_bins(frame, n_bins=2)["x"].minimum == -INF
    assert mb.equal_frequency_bins(frame, n_bins=2, missing={"x": -LARGEST})["x"].missing_weight == 2.0
    for missing, weight in (([INF], 2.0), ([INF, -INF], 3.0), ([(2.0, INF)], 3.0), ([(-INF, 1.0)], 4.0)):
        result = mb.equal_frequency_bins(frame, n_bins=2, missing={"x": missing})
        placed = result.transform(frame)["x_bin"]
        in_duckdb = duckdb.sql(result.to_sql("duckdb", table="frame")).df()["x_bin"]

        assert result["x"].missing_weight == weight == placed.isna().sum(), missing
        assert in_duckdb.astype("Int32").tolist() == placed.tolist(), missing
