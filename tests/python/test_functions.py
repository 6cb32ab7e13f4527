"""Binning of tables, streams and files."""

from __future__ import annotations

import datetime
import decimal
import json
import pickle
import re
import subprocess
import warnings

import duckdb
import mcbinning as mb
import numpy as np
import pandas as pd
import polars as pl
import pyarrow as pa
import pyarrow.compute as pc
import pyarrow.dataset as ds
import pyarrow.parquet as pq
import pytest
from conftest import IRIS

pytestmark = pytest.mark.filterwarnings("ignore::mcbinning.NoCutPointsWarning")


class OnlyStream:
    """Something that has the stream protocol and nothing else."""

    def __init__(self, reader: pa.RecordBatchReader) -> None:
        self._reader = reader

    def __arrow_c_stream__(self, requested_schema: object = None) -> object:
        return self._reader.__arrow_c_stream__()


def figures(result: mb.BinningResult) -> list[object]:
    document = json.loads(result.to_json())
    return [document["results"], [variable["categories"] for variable in document["variables"]]]


def test_every_kind_of_source_gives_the_same_bits(mixed, tmp_path):
    table = pa.Table.from_pandas(mixed)
    parquet = tmp_path / "data's.parquet"
    pq.write_table(table, parquet, row_group_size=300)
    connection = duckdb.connect()
    sources = {
        "arrow": table,
        "reader": table.to_reader(max_chunksize=77),
        "stream": OnlyStream(table.to_reader(max_chunksize=77)),
        "polars": pl.from_arrow(table),
        "polars categories": pl.from_arrow(table).with_columns(pl.col("y").cast(pl.Categorical)),
        "pandas categories": mixed.assign(y=pd.Categorical(mixed["y"], ["c", "unused", "b", "a"])),
        "dictionary": table.set_column(7, "y", table["y"].dictionary_encode()).to_reader(max_chunksize=50),
        "dataset": ds.dataset(parquet),
        "scanner": ds.dataset(parquet).scanner(),
        "duckdb": connection.sql("SELECT * FROM mixed"),
        "parquet": str(parquet),
        "glob": tmp_path / "*.parquet",
    }
    expected = figures(mb.supervised_bins(mixed, "y"))

    for name, source in sources.items():
        assert figures(mb.supervised_bins(source, "y")) == expected, name


def test_order_of_rows_changes_no_cut_point_and_no_category(mixed):
    shuffled = mixed.sample(frac=1, random_state=3)

    assert figures(mb.supervised_bins(mixed, "y")) == figures(mb.supervised_bins(shuffled, "y"))
    assert mb.supervised_bins(mixed, "y")["x"].target.category_names() == ["a", "b", "c"]


@pytest.mark.parametrize("closed", ["right", "left"])
def test_same_bits_as_the_command_line_tool(mcbin, tmp_path, closed):
    def run(*arguments: str) -> dict[str, object]:
        call = subprocess.run([mcbin, *arguments, "--format", "json"], capture_output=True, text=True, check=True)
        return json.loads(call.stdout)

    supervised = run("supervised", str(IRIS), "--target", "species", "--closed", closed)
    rounded = run("supervised", str(IRIS), "--target", "species", "--closed", closed, "--round-cuts")
    equal = run("equal-frequency", str(IRIS), "--bins", "7", "--closed", closed)

    for native, own in (
        (supervised, mb.supervised_bins(IRIS, "species", closed=closed)),
        (rounded, mb.supervised_bins(IRIS, "species", closed=closed, round="auto")),
        (equal, mb.equal_frequency_bins(IRIS, n_bins=7, closed=closed)),
    ):
        ours = json.loads(own.to_json())["results"]
        by_name = {entry["attribute"]: entry for entry in ours}
        for entry in native["results"]:
            assert by_name[entry["attribute"]] == entry
        assert json.loads(mb.BinningResult.from_json(json.dumps(native)).to_json())["results"] == native["results"]


def test_the_command_line_tool_applies_what_the_package_wrote(mcbin, tmp_path):
    result = mb.supervised_bins(IRIS, "species", closed="left")
    result.to_json(tmp_path / "bins.json")
    subprocess.run([mcbin, "apply", tmp_path / "bins.json", IRIS, "-o", tmp_path / "out.csv"], check=True)

    expected = result.transform(pd.read_csv(IRIS))
    applied = pd.read_csv(tmp_path / "out.csv")
    assert all(applied[f"{name}_bin"].tolist() == expected[f"{name}_bin"].tolist() for name in result)


def test_dates_decimals_and_flags_are_what_the_user_knows():
    rows = 40
    table = pa.table(
        {
            "day": [datetime.date(2024, 1, 1 + i % 20) for i in range(rows)],
            "paid": pa.array([decimal.Decimal(i % 20) / 10 for i in range(rows)], pa.decimal128(5, 1)),
            "at": pa.array([i % 20 for i in range(rows)], pa.timestamp("s", "UTC")),
            "flag": [i % 20 >= 10 for i in range(rows)],
        }
    )
    result = mb.supervised_bins(table, "flag")

    assert result["day"].labels == ["(-inf, 2024-01-10]", "(2024-01-10, +inf)"]
    assert result["paid"].cut_points.tolist() == [0.9]
    assert result["at"].labels[0] == "(-inf, 1970-01-01 00:00:09+00:00]"
    assert result["day"].target.category_names() == [False, True]
    assert result.transform(table)["day_bin"].to_pylist() == [int(i % 20 >= 10) for i in range(rows)]


TENS = [i % 20 for i in range(60)]


@pytest.mark.parametrize(
    ("values", "expected"),
    [
        (pa.array(TENS, pa.uint64()), ["(-inf, 9]", "(9, +inf)"]),
        (pa.array(np.array(TENS, np.float16) / 4), ["(-inf, 2.25]", "(2.25, +inf)"]),
        (pa.array(TENS, pa.date32()), ["(-inf, 1970-01-10]", "(1970-01-10, +inf)"]),
        (
            pa.array(TENS, pa.timestamp("s", "Asia/Tokyo")),
            ["(-inf, 1970-01-01 09:00:09+09:00]", "(1970-01-01 09:00:09+09:00, +inf)"],
        ),
        (
            pa.array([i * 10**9 for i in TENS], pa.timestamp("ns")),
            ["(-inf, 1970-01-01 00:00:09]", "(1970-01-01 00:00:09, +inf)"],
        ),
        (
            pa.array([i * 10**3 for i in TENS], pa.timestamp("ms")),
            ["(-inf, 1970-01-01 00:00:09]", "(1970-01-01 00:00:09, +inf)"],
        ),
        (pa.array([i * 86_400_000 for i in TENS], pa.date64()), ["(-inf, 1970-01-10]", "(1970-01-10, +inf)"]),
        (pa.array(TENS, pa.int32()).dictionary_encode(), ["(-inf, 9]", "(9, +inf)"]),
        (pa.array(TENS, pa.date32()).dictionary_encode(), ["(-inf, 1970-01-10]", "(1970-01-10, +inf)"]),
        (pa.array([i > 9 for i in TENS]).dictionary_encode(), ["(-inf, false]", "(false, +inf)"]),
        (pa.array(["ab"[i // 10] for i in TENS], pa.large_string()), ["{a}", "{b}"]),
        (pa.array(["ab"[i // 10] for i in TENS]).dictionary_encode(), ["{a}", "{b}"]),
    ],
    ids=lambda value: str(value.type) if isinstance(value, pa.Array) else "",
)
def test_every_type_is_read_with_its_nulls_wherever_its_batch_begins(values, expected):
    valid = pa.array([i % 7 != 0 for i in range(60)])
    column = pc.if_else(valid, values, None)
    table = pa.table({"x": column, "y": ["ab"[i // 10] for i in TENS]})
    pieces = pa.concat_tables([table.slice(0, 13), table.slice(13, 3), table.slice(16)])
    result = mb.supervised_bins(pieces, "y", ["x"])

    assert result["x"].labels == expected
    assert result["x"].missing_weight == 9.0
    assert result.transform(pieces)["x_bin"].to_pylist() == [
        i // 10 if ok else None for i, ok in zip(TENS, valid.to_pylist())
    ]


@pytest.mark.parametrize(
    "column",
    [
        pd.array([*TENS, None], dtype="Int8"),
        pd.array([*TENS, None], dtype="Float32"),
        pd.array([*TENS, None], dtype="int64[pyarrow]"),
        pd.Series([*TENS, np.nan]),
        pd.Series([*map(decimal.Decimal, TENS), None], dtype=object),
        pd.Series(pd.Categorical([*TENS, None])),
        pl.Series([*TENS, None]),
        pl.Series([*map(float, TENS), float("nan")]),
    ],
    ids=lambda column: str(column.dtype),
)
def test_what_stands_for_missing_in_a_frame_is_missing(column):
    frame = (pl.DataFrame if isinstance(column, pl.Series) else pd.DataFrame)({"x": column})
    result = mb.equal_frequency_bins(frame, n_bins=2)

    assert result["x"].cut_points.tolist() == [9.5] and result["x"].missing_weight == 1.0
    assert pl.DataFrame(result.transform(frame))["x_bin"].to_list() == [i // 10 for i in TENS] + [None]


def test_declared_values_and_intervals_are_missing():
    frame = pd.DataFrame(
        {"x": [1, 2, 3, 11, 12, 13, 99, -5, -7] * 4, "y": ["a", "a", "a", "b", "b", "b", "a", "b", "?"] * 4}
    )
    result = mb.supervised_bins(frame, "y", missing={"x": [99, (-6, -1)], "y": "?"})

    assert result["x"].weights.tolist() == [12.0, 12.0]
    assert result["x"].missing_weight == 12.0
    assert result["x"].target.category_names() == ["a", "b"]
    assert result.transform(frame)["x_bin"][:9].tolist() == [0, 0, 0, 1, 1, 1, pd.NA, pd.NA, 0]


def test_pairs_bin_against_many_targets_in_one_pass(mixed):
    result = mb.supervised_bins(
        pa.Table.from_pandas(mixed).to_reader(), pairs=[("x", "y"), ("x", "flag"), ("whole", "flag")]
    )

    assert list(result) == [("x", "y"), ("x", "flag"), ("whole", "flag")]
    assert result["x", "y"].cut_points.tolist() == mb.supervised_bins(mixed, "y")["x"].cut_points.tolist()
    placed = result.transform(mixed)
    assert list(placed) == ["x_by_y_bin", "x_by_flag_bin", "whole_by_flag_bin"]
    for name, found in zip(placed, result.bins):
        assert placed[name].tolist() == found.bin_numbers(mixed[found.attribute].to_numpy(float)).tolist()


def test_columns_of_a_pandas_frame_need_no_texts_as_names():
    frame = pd.DataFrame(np.arange(40.0).reshape(20, 2), columns=pd.Index([2020, ("a", "b")], dtype=object))

    assert list(mb.equal_frequency_bins(frame, n_bins=2)) == ["2020", "('a', 'b')"]
    assert (
        mb.equal_frequency_bins(frame, ["2020"], n_bins=2).transform(frame)["2020_bin"].tolist() == [0] * 10 + [1] * 10
    )
    result = mb.supervised_bins(frame.assign(y=frame[2020] > 20), "y", [2020, ("a", "b")], missing={2020: 0})
    assert list(mb.equal_frequency_bins(frame, 2020, n_bins=2)) == ["2020"]
    assert result[2020] is result["2020"] and result[2020].missing_weight == 1.0
    assert result[("a", "b")] is result["('a', 'b')"] and result[2020, "y"] is result[2020]
    with pytest.raises(mb.DataError, match="column '0': there is no such column") as caught:
        mb.supervised_bins(frame, 0)
    assert caught.value.column == "0"
    with pytest.raises(mb.DataError, match="column 'a': there are several columns of this name"):
        mb.equal_frequency_bins(frame.set_axis(["a", "a"], axis=1))


def test_bins_of_text_are_found_again_in_other_tables(mixed):
    frame = mixed[["x", "y"]].assign(kind=mixed["y"].str.upper())

    result = mb.supervised_bins(frame, "y", ["kind"], category_order="text")
    assert result["kind"].labels == ["{A}", "{B}", "{C}"]
    assert result.transform(frame)["kind_bin"].tolist() == [ord(text) - ord("a") for text in frame["y"]]
    news = pd.DataFrame({"kind": ["A", "C", "D", None, "B"]})
    for data in (news, news.astype("category"), pl.from_pandas(news)):
        with pytest.raises(mb.DataError, match="column 'kind', row 2: the category 'D' is not among") as caught:
            result.transform(data)
        assert (caught.value.column, caught.value.row) == ("kind", 2)
        assert pl.DataFrame(result.transform(data, unseen="missing"))["kind_bin"].to_list() == [0, 2, None, None, 1]
    with pytest.raises(ValueError, match="unseen must be 'error' or 'missing', not 'ignore'"):
        result.transform(news, unseen="ignore")


def failing_reader(table: pa.Table) -> pa.RecordBatchReader:
    def batches():
        yield from table.to_batches(max_chunksize=1000)[:1]
        raise KeyError("line dropped")

    return pa.RecordBatchReader.from_batches(table.schema, batches())


@pytest.mark.parametrize(
    ("data", "options", "error", "message"),
    [
        ({"x": [], "y": []}, {"target": "y"}, mb.DataError, "column 'y': no row has a category"),
        ({"x": []}, {}, mb.DataError, "the data have no rows"),
        ({"x": [1.0], "w": [0.0]}, {"weight": "w"}, mb.BinningError, "no record of positive weight"),
        ({"x": [1.0, 2.0], "y": ["a", "a"]}, {"target": "y"}, mb.DataError, "'y': there is a single category, 'a'"),
        ({"x": [1.0, 2.0], "y": ["a", "b"]}, {"target": "z"}, mb.DataError, "column 'z': there is no such column"),
        ({"x": [1.0], "w": [-0.5]}, {"weight": "w"}, mb.DataError, "column 'w', row 0: the weight is negative"),
        ({"x": [1.0] * 2, "w": [1.0, np.nan]}, {"weight": "w"}, mb.DataError, "column 'w', row 1: the weight is NaN"),
        ({"x": [1.0], "w": [np.inf]}, {"weight": "w"}, mb.DataError, "column 'w', row 0: the weight is infinite"),
        ({"x": range(300), "y": range(300)}, {"target": "y"}, mb.DataError, "'y', row 256: there are more than 256"),
        ({"x": [[1.0], [2.0]]}, {"attributes": ["x"]}, mb.DataError, "column 'x': .*nested"),
        ({"x": [datetime.time(1, 30)]}, {"attributes": ["x"]}, mb.DataError, "column 'x': .*time of day"),
        ({"": [datetime.time(1, 30)]}, {}, mb.DataError, r"nothing to bin.*'' \(time of day\)"),
        ({"x": [1.0], "": [1]}, {"attributes": [0]}, mb.DataError, "column '0': there is no such column"),
        ({"x": [1.0], "": [-1]}, {"weight": ""}, mb.DataError, "column '', row 0: the weight is negative"),
        ({"x": [1.0]}, {"attributes": []}, mb.DataError, "no attribute is named"),
        ({"x": [1.0]}, {"missing": {"x": "none"}}, mb.DataError, "column 'x': what is declared missing.*'none'"),
        ({"x": [1.0]}, {"missing": {"x": (9, 1)}}, mb.DataError, r"column 'x': .*\(9, 1\) begins above its end"),
        ({"x": [1.0, 2.0]}, {"temp_dir": "/nowhere/at/all"}, mb.BinningError, "directory for temporary files"),
        ({"x": ["a", "b"]}, {}, mb.DataError, "nothing to bin"),
    ],
)
def test_bad_data_are_refused_with_column_and_row(data, options, error, message):
    run = mb.supervised_bins if "target" in options else mb.equal_frequency_bins
    for source in (pa.table(data), pa.table(data).to_reader()):
        with pytest.raises(error, match=message):
            run(source, **options)


def test_a_tmpdir_that_cannot_be_used_is_refused_unless_a_directory_is_named(monkeypatch, tmp_path):
    monkeypatch.setenv("TMPDIR", str(tmp_path / "nowhere"))
    x = [[1.0], [2.0], [3.0], [4.0]]
    table = pa.table({"x": [1.0, 2.0, 3.0, 4.0], "y": ["a", "a", "b", "b"]})

    for run in (
        lambda **options: mb.equal_frequency_bins(table, **options),
        lambda **options: mb.supervised_bins(table, "y", **options),
        lambda **options: mb.EqualFrequencyBinner(n_bins=2, **options).fit(x),
        lambda **options: mb.SupervisedBinner(**options).fit(x, [0, 0, 1, 1]),
    ):
        with pytest.raises(mb.BinningError, match=r"TMPDIR is .*nowhere.* or give temp_dir=") as refused:
            run()
        assert refused.value.status.code == 120001
        run(temp_dir=tmp_path)
    assert list(tmp_path.iterdir()) == []


def test_a_path_or_a_frame_that_cannot_be_read_says_why(tmp_path):
    (tmp_path / "broken.parquet").write_text("no such thing")
    (tmp_path / "late.csv").write_text("x\n" + "1\n" * 30_000 + "oops\n")

    for name in ("none.csv", "none*.parquet"):
        with pytest.raises(FileNotFoundError, match=re.escape(name)) as caught:
            mb.equal_frequency_bins(tmp_path / name)
        assert caught.value.filename == str(tmp_path / name)
    with pytest.raises(mb.DataError, match=r"broken\.parquet can't be read"):
        mb.equal_frequency_bins(tmp_path / "broken.parquet")
    with pytest.raises(mb.StreamError, match="Line: 30002"):
        mb.equal_frequency_bins(tmp_path / "late.csv")
    with pytest.raises(mb.DataError, match="column 'mixed'") as refused:
        mb.equal_frequency_bins(pd.DataFrame({"x": [1, 2], "mixed": [1, "a"]}), attributes=["mixed"])
    assert refused.value.column == "mixed"
    with pytest.raises(mb.DataError, match="a table with named columns is needed"):
        mb.equal_frequency_bins(pl.Series("x", [1.0, 2.0]))


def test_a_record_without_a_weight_is_left_out_as_by_the_command_line_tool(mcbin, tmp_path):
    path = tmp_path / "weighted.csv"
    rows = [f"{i % 20},{'ab'[i % 20 > 12]},{i % 3 or ''}" for i in range(60)]
    path.write_text("x,y,w\n" + "\n".join(rows) + "\n")
    call = [mcbin, "supervised", path, "--target", "y", "--weight", "w", "--format", "json"]
    expected = json.loads(subprocess.run(call, capture_output=True, text=True, check=True).stdout)["results"]
    nullable = pd.read_csv(path, dtype={"w": "Int64"})

    assert expected[0]["weight_with_missing"] == sum(i % 3 for i in range(60))
    for data in (path, nullable, pl.read_csv(path), duckdb.sql(f"FROM '{path}'")):
        assert json.loads(mb.supervised_bins(data, "y", weight="w").to_json())["results"] == expected
    with pytest.raises(mb.DataError, match="column 'w', row 0: the weight is NaN"):
        mb.supervised_bins(pd.read_csv(path), "y", weight="w")  # where pandas has no other word for missing


def test_a_stream_that_fails_midway_says_so_and_leaves_no_file(mixed, tmp_path):
    table = pa.Table.from_pandas(mixed)

    with pytest.raises(KeyError, match="line dropped"):
        mb.equal_frequency_bins(failing_reader(table), temp_dir=tmp_path)
    with pytest.raises(KeyError, match="line dropped"):
        mb.supervised_bins(failing_reader(table), "y", temp_dir=tmp_path)
    with pytest.raises(mb.StreamError, match=r"behind 1000 rows: .*line dropped") as caught:
        mb.equal_frequency_bins(OnlyStream(failing_reader(table)), temp_dir=tmp_path)
    assert caught.value.row == 1000
    assert list(tmp_path.iterdir()) == []


@pytest.mark.parametrize(
    ("x", "weights", "warning"),
    [
        ([1.0] * 20, [1.0] * 20, mb.SingleValueWarning),
        ([None] * 20, [1.0] * 20, mb.NoValidValuesWarning),
        (list(range(20)), [1.0, 0.0] * 10, mb.SingleCategoryWarning),
        (list(range(20)), [1.0] * 20, mb.NoCutPointsWarning),
    ],
)
def test_what_is_odd_about_an_attribute_is_a_warning_of_its_own_class(x, weights, warning):
    table = pa.table({"odd": pa.array(x, pa.float64()), "y": ["a", "b"] * 10, "w": weights})
    with warnings.catch_warnings(record=True) as caught:
        warnings.simplefilter("always")
        result = mb.supervised_bins(table, "y", weight="w")

    assert [type(entry.message) for entry in caught] == [warning]
    assert caught[0].message.attribute == "odd" and caught[0].message.status == result["odd"].status
    assert caught[0].filename == __file__


@pytest.mark.parametrize(
    "error",
    [
        mb.DataError("odd", "x", 3),
        mb.StreamError("line dropped", 7),
        mb.BinningError(mb.Status(120001, "error")),
        mb.SingleValueWarning("x", mb.Status(120014, "warning")),
    ],
)
def test_errors_and_warnings_come_back_whole_from_another_process(error):
    again = pickle.loads(pickle.dumps(error))

    assert type(again) is type(error) and str(again) == str(error) and vars(again) == vars(error)
