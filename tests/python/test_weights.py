"""Fractional weights: on a grid on which all sums are exact, the order of the rows and batches makes no difference."""

from __future__ import annotations

import json
import subprocess

import duckdb
import mcbinning as mb
import numpy as np
import pandas as pd
import polars as pl
import pyarrow as pa
import pyarrow.parquet as pq
import pytest
from conftest import IRIS

pytestmark = pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")


def weighted(seed: int, rows: int = 3000) -> pa.Table:
    """Values with ties, and weights over 20 powers of ten that no sum of doubles holds exactly."""
    rng = np.random.default_rng(seed)
    x = rng.integers(0, 60, rows) / 4
    y = np.array(["a", "b", "c"])[np.clip((x + rng.normal(0, 3, rows)) // 6, 0, 2).astype(int)]
    w = np.exp(rng.uniform(-40, 5, rows))
    w[rng.random(rows) < 0.05] = 0.0
    return pa.table({"x": x, "y": y, "w": pa.array(w, mask=rng.random(rows) < 0.02)})


def answers(data, **options) -> list[object]:
    """All that both procedures find, without what is about the source."""
    found = []
    for result in (
        mb.supervised_bins(data(), "y", ["x"], weight="w", **options),
        mb.equal_frequency_bins(data(), ["x"], weight="w", n_bins=7, **options),
    ):
        document = json.loads(result.to_json())
        weight = next(variable for variable in document["variables"] if variable["name"] == "w")
        found += [document["results"], weight["grid"], document["data"]["records_without_weight"]]
    return found


@pytest.mark.parametrize("closed", ["right", "left"])
def test_no_order_and_no_form_of_the_data_makes_a_difference(closed, tmp_path):
    seed = int(np.random.SeedSequence().generate_state(1)[0])
    table = weighted(seed)
    expected = answers(lambda: table, closed=closed)
    assert expected[1] is not None and expected[2] > 0, seed

    shuffled = table.take(np.random.default_rng(seed).permutation(len(table)))
    pq.write_table(shuffled, tmp_path / "rows.parquet", row_group_size=700)
    forms = {
        "reversed": lambda: table.take(np.arange(len(table))[::-1]),
        "single rows": lambda: pa.Table.from_batches(shuffled.to_batches(max_chunksize=1)),
        "reader": lambda: pa.RecordBatchReader.from_batches(table.schema, iter(shuffled.to_batches(max_chunksize=333))),
        "path": lambda: tmp_path / "rows.parquet",
        "relation": lambda: duckdb.sql(f"FROM '{tmp_path}/rows.parquet'"),
        "polars": lambda: pl.from_arrow(shuffled),
    }
    for name, data in forms.items():
        assert answers(data, closed=closed) == expected, (name, seed)


@pytest.mark.parametrize("rounding", ["none", "truncate", "closest"])
def test_the_command_line_tool_finds_the_same_bits(mcbin, tmp_path, rounding):
    for seed in range(3):
        path = tmp_path / "rows.csv"
        duckdb.from_arrow(weighted(seed)).write_csv(str(path))
        expected = []
        for method, options in (
            ("supervised", ["--target", "y"]),
            ("equal-frequency", ["--exclude", "y", "--bins", "7"]),
        ):
            call = [mcbin, method, path, "--weight", "w", "--round", rounding, "--format", "json", *options]
            document = json.loads(subprocess.run(call, capture_output=True, check=True).stdout)
            [weight] = [variable for variable in document["variables"] if variable["name"] == "w"]
            assert weight["rounding"] == rounding
            expected += [document["results"], weight["grid"], document["data"]["records_without_weight"]]

        assert json.loads(json.dumps(answers(lambda path=path: path, rounding=rounding))) == expected
        assert (expected[1] is None) == (rounding != "none")


def test_a_constant_weight_leaves_nothing_of_a_category_that_is_gone(iris):
    for closed in ("left", "right"):
        plain = mb.supervised_bins(iris, "species", ["petal_length"], closed=closed)["petal_length"]
        found = mb.supervised_bins(iris.assign(w=0.7), "species", ["petal_length"], weight="w", closed=closed)
        fitted = mb.SupervisedBinner(closed=closed).fit(
            iris[["petal_length"]], iris["species"], np.full(len(iris), 0.7)
        )

        assert found["petal_length"].cut_points.tolist() == plain.cut_points.tolist()
        assert fitted.cut_points_[0].tolist() == plain.cut_points.tolist()
        assert found.weight_grid == fitted.result_.weight_grid == 2.0 ** (7 - 52), "150 x 0.7 is below 2^7"


def test_the_estimators_weigh_by_the_same_grid():
    rows = [row for row in weighted(1).to_pylist() if row["w"] is not None]
    frame = pd.DataFrame(rows)
    expected = mb.supervised_bins(frame, "y", ["x"], weight="w")["x"]
    order = np.random.default_rng(1).permutation(len(frame))
    for X in (frame[["x"]], frame[["x"]].to_numpy()):
        fitted = mb.SupervisedBinner().fit(
            X[order] if isinstance(X, np.ndarray) else X.iloc[order], frame["y"][order], frame["w"][order]
        )
        assert fitted.result_.bins[0].target_weights.tolist() == expected.target_weights.tolist()
        assert fitted.result_.bins[0].model_entropy == expected.model_entropy
    rounded = mb.EqualFrequencyBinner(rounding="closest").fit([[1.0], [2.0], [3.0]], sample_weight=[0.5, 1.4, 0.2])
    assert rounded.result_.bins[0].weight == 2.0 and rounded.result_.weight_grid is None
    with pytest.raises(ValueError, match="rounding must be"):
        mb.EqualFrequencyBinner(rounding="up").fit([[1.0], [2.0]])


def test_records_without_a_weight_are_counted():
    table = pa.table({"x": [1.0, 2.0, 3.0, 4.0, 5.0], "w": [1.0, None, 0.0, 99.0, 2.0]})

    result = mb.equal_frequency_bins(table, ["x"], weight="w", missing={"w": 99})
    assert result.records == 5 and result.records_without_weight == 2
    assert result["x"].weight_with_missing == 3.0
    assert result.weight_grid is None, "whole numbers lie on every grid"
    assert mb.BinningResult.from_json(result.to_json()).records_without_weight == 2
    assert mb.equal_frequency_bins(table, ["x"]).records_without_weight is None
    with pytest.raises(ValueError, match="rounding must be 'none', 'truncate' or 'closest', not 'up'"):
        mb.equal_frequency_bins(IRIS, rounding="up")
