"""Categories with an order of their own."""

from __future__ import annotations

import duckdb
import mcbinning as mb
import numpy as np
import pandas as pd
import polars as pl
import pyarrow as pa
import pytest

SIZES = ["small", "medium", "large", "unused", "huge"]
GRADES = ["good", "fair", "bad"]
SIZE = [SIZES[i] for i in (0, 1, 2, 4) for _ in range(15)]
GRADE = [GRADES[i // 2] for i in (0, 1, 2, 4) for _ in range(15)]


def ordered(values: list[str], categories: list[str]) -> pa.DictionaryArray:
    return pa.array(pd.Categorical(values, categories, ordered=True))


def forms() -> dict[str, object]:
    frame = pd.DataFrame(
        {"size": pd.Categorical(SIZE, SIZES, ordered=True), "grade": pd.Categorical(GRADE, GRADES, ordered=True)}
    )
    enums = {"size": pl.Enum(SIZES), "grade": pl.Enum(GRADES)}
    table = pa.Table.from_pandas(frame)
    # A later batch may know further categories, or list them in part.
    parts = [
        pa.record_batch({"size": ordered(SIZE[i:j], sizes), "grade": ordered(GRADE[i:j], GRADES)})
        for i, j, sizes in [(0, 30, SIZES[:2]), (30, 45, SIZES[1:3]), (45, 60, SIZES[2:])]
    ]
    return {
        "pandas": frame,
        "shuffled": frame.sample(frac=1, random_state=1),
        "polars": pl.DataFrame({"size": SIZE, "grade": GRADE}, schema=enums),
        "lazy": pl.LazyFrame({"size": SIZE, "grade": GRADE}, schema=enums),
        "arrow": table,
        "reader": table.to_reader(max_chunksize=7),
        "growing": pa.RecordBatchReader.from_batches(parts[0].schema, parts),
    }


@pytest.mark.parametrize("name", forms())
def test_the_declared_order_is_that_of_the_codes_in_bins_tables_and_json(name):
    data = forms()[name]
    result = mb.supervised_bins(data, "grade", ["size"])

    for found in (result["size"], mb.BinningResult.from_json(result.to_json())["size"]):
        assert found.variable.categories == ("small", "medium", "large", "huge")
        assert found.labels == ["{small, medium}", "{large}", "{huge}"]
        assert [column for column in found.to_pandas() if column.startswith("weight[")] == [
            f"weight[{g}]" for g in GRADES
        ]
        assert found.target_weights.tolist() == [[30, 0, 0], [0, 15, 0], [0, 0, 15]]
    frame = pd.DataFrame({"size": SIZE})
    expected = [0] * 30 + [1] * 15 + [2] * 15
    assert result.transform(frame)["size_bin"].tolist() == expected
    assert [row[-1] for row in duckdb.sql(result.to_sql("duckdb", "frame")).fetchall()] == expected


def test_batches_that_contradict_each_other_are_refused():
    parts = [pa.record_batch({"y": ordered(["a", "b"], order), "x": [1, 2]}) for order in (["a", "b"], ["b", "a"])]
    reader = pa.RecordBatchReader.from_batches(parts[0].schema, parts)

    with pytest.raises(mb.DataError, match="column 'y': two batches declare the categories in different orders"):
        mb.supervised_bins(reader, "y")


@pytest.mark.parametrize(
    ("categories", "labels"), [([1, 2, 3, 4], ["(-inf, 2]", "(2, +inf)"]), ([1, 4, 2, 3], ["{1, 4}", "{2, 3}"])]
)
def test_numbers_are_categories_where_their_order_is_another(categories, labels):
    x = [1, 2, 3, 4] * 12
    y = [value in categories[:2] for value in x]
    frame = pd.DataFrame({"x": pd.Categorical(x, categories, ordered=True), "y": y})

    for data in (frame, pa.Table.from_pandas(frame)):
        result = mb.supervised_bins(data, "y", ["x"])
        assert result["x"].labels == labels
        assert pa.table(result.transform(data))["x_bin"].to_pylist() == [0 if flag else 1 for flag in y]


@pytest.mark.parametrize(
    "form", [lambda y: pd.Categorical(y, GRADES, ordered=True), lambda y: pl.Series(y, dtype=pl.Enum(GRADES))]
)
def test_classes_of_a_binner_have_the_declared_order(form):
    binner = mb.SupervisedBinner().fit(np.arange(60.0)[:, None], form(GRADE))

    assert binner.classes_.tolist() == GRADES
    assert binner.result_["x0"].target_weights.tolist() == [[30, 0, 0], [0, 15, 0], [0, 0, 15]]
