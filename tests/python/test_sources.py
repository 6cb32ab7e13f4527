"""What the data may be, and what of it is left out."""

from __future__ import annotations

import datetime
import subprocess
import sys
import textwrap

import mcbinning as mb
import numpy as np
import pandas as pd
import polars as pl
import pyarrow as pa
import pyarrow.feather
import pyarrow.parquet as pq
import pytest

pytestmark = pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")

PEAK = """
    import sys, mcbinning as mb
    def memory():
        with open("/proc/self/status") as file:
            return next(int(line.split()[1]) for line in file if line.startswith("VmHWM")) / 1024
    mb.equal_frequency_bins(sys.argv[1], ["x0"], n_bins=2)  # what is loaded counts before
    before = memory()
    result = mb.equal_frequency_bins(sys.argv[1], n_bins=2)
    print(len(result), result["x0"].weight, memory() - before)
"""


@pytest.mark.parametrize(("rows", "columns", "allowed"), [(100_000, 201, 330), (1_000_000, 20, 110)])
def test_a_row_group_beyond_128_mb_is_read_without_holding_it(tmp_path, rows, columns, allowed):
    path = tmp_path / "one_group.parquet"
    values = np.random.default_rng(0).normal(size=(rows, columns))
    pd.DataFrame(values, columns=[f"x{i}" for i in range(columns)]).to_parquet(path, row_group_size=rows)
    assert pq.ParquetFile(path).metadata.row_group(0).total_byte_size > 128e6

    done = subprocess.run(
        [sys.executable, "-W", "ignore", "-c", textwrap.dedent(PEAK), path], capture_output=True, text=True, timeout=300
    )
    n, weight, peak = map(float, done.stdout.split())
    # A page of each column, in which pandas writes 1 MiB, beside a column's tuples.
    assert (n, weight) == (columns, rows) and peak < allowed, (peak, done.stderr[-2000:])


def test_memory_limit_bounds_the_reading_and_says_so(tmp_path):
    paths = {form: tmp_path / f"data.{form}" for form in ("parquet", "csv", "arrow")}
    frame = pd.DataFrame(np.random.default_rng(0).normal(size=(50_000, 30)), columns=[f"x{i}" for i in range(30)])
    frame.to_parquet(paths["parquet"])
    frame.to_csv(paths["csv"], index=False)
    pyarrow.feather.write_feather(frame, paths["arrow"])
    bins = mb.equal_frequency_bins(frame, ["x0"], n_bins=2)

    for path in paths.values():
        for call in (
            lambda limit, path=path: mb.equal_frequency_bins(path, memory_limit=limit),
            lambda limit, path=path: bins.transform(path, memory_limit=limit).read_all(),
        ):
            with pytest.raises(
                (mb.StreamError, mb.DataError), match=r"memory_limit is too small .*: 1000 bytes"
            ) as caught:
                call("1kB")
            assert "SET " not in str(caught.value)
            call(1_000_000_000)
    for limit in ("lots", "-1MB", "", 0, -5, True, 1.5, "12 XB", "0.0001B"):
        with pytest.raises(ValueError, match=f"memory_limit must be a number of bytes or a text .*, not {limit!r}"):
            mb.equal_frequency_bins(paths["csv"], memory_limit=limit)
    with pytest.raises(ValueError, match="memory_limit bounds the reading of files, and a DataFrame is none"):
        mb.equal_frequency_bins(frame, memory_limit="1GB")


@pytest.mark.parametrize(
    ("limit", "number"),
    [("512MB", 512_000_000), ("2GiB", 2 << 30), (" 1.5 kb", 1500), ("7 B", 7), ("8", 8), (9, 9), ("1TiB", 1 << 40)],
)
def test_a_limit_is_a_number_of_bytes(limit, number):
    from mcbinning._files import parse_memory

    assert parse_memory(limit) == number


@pytest.fixture
def halves(mixed, tmp_path):
    """The data in two parts, in files of every form, with the name of the form."""
    paths: dict[str, list[object]] = {}
    for number, part in enumerate([mixed[:700], mixed[700:]]):
        table = pa.Table.from_pandas(part, preserve_index=False)
        for name in ("csv", "parquet", "arrow", "arrows", "feather", "odd"):
            path = tmp_path / f"part {number}.{name}"
            paths.setdefault(name, []).append(path)
            if name == "csv":
                part.to_csv(path, index=False)
            elif name == "parquet":
                pq.write_table(table, path)
            elif name == "feather":
                pyarrow.feather.write_feather(table, path, compression="lz4")
            else:
                make = pa.ipc.new_stream if name == "arrows" else pa.ipc.new_file
                with make(path, table.schema) as writer:
                    writer.write_table(table, max_chunksize=100)
    return paths


@pytest.mark.parametrize("name", ["csv", "parquet", "arrow", "arrows", "feather", "odd"])
def test_files_one_behind_the_other_are_the_whole_data(halves, mixed, tmp_path, name):
    expected = mb.supervised_bins(mixed, "y", ["x", "whole"])

    for data in (halves[name], tuple(map(str, halves[name])), [tmp_path / f"part*.{name}"]):
        result = mb.supervised_bins(data, "y", ["x", "whole"])
        assert [found.cut_points.tolist() for found in result.bins] == [
            found.cut_points.tolist() for found in expected.bins
        ]
        assert result.records == 1500
        assert (
            result.transform(data)
            .read_all()
            .equals(pa.Table.from_pandas(expected.transform(mixed)).replace_schema_metadata())
        )


def test_a_lazy_frame_is_read_as_it_comes(mixed):
    query = pl.LazyFrame(pl.from_pandas(mixed)).with_columns(twice=pl.col("x") * 2).filter(pl.col("whole") > -5)
    result = mb.supervised_bins(query, "y")

    expected = mb.supervised_bins(query.collect(), "y")
    assert list(result) == list(expected) and "twice" in result
    assert [found.cut_points.tolist() for found in result.bins] == [
        found.cut_points.tolist() for found in expected.bins
    ]
    assert pl.DataFrame(result.transform(query).read_all()).equals(expected.transform(query.collect()))


def test_files_that_do_not_go_together_or_are_broken_say_so(halves, mixed, tmp_path):
    cut = tmp_path / "cut.arrow"
    cut.write_bytes(halves["arrows"][0].read_bytes()[:-4000])
    (tmp_path / "empty.feather").write_bytes(b"")
    pyarrow.feather.write_feather(pa.table({"other": [1]}), tmp_path / "other.arrow")

    for data, error, message in [
        ([halves["csv"][0], halves["parquet"][1]], mb.DataError, "of different forms: .csv, .parquet"),
        ([halves["csv"][0], halves["arrow"][1]], mb.DataError, "of different forms"),
        ([halves["arrow"][0], tmp_path / "other.arrow"], mb.DataError, "other.arrow has other columns than"),
        ([halves["csv"][0], tmp_path / "none.csv"], FileNotFoundError, "none.csv"),
        (tmp_path / "empty.feather", mb.DataError, "no Arrow IPC file or stream"),
        (cut, mb.StreamError, r"the stream failed behind \d+ rows: .*cut.arrow"),
        ([], TypeError, "neither a path, nor a list of paths"),
    ]:
        with pytest.raises(error, match=message):
            mb.equal_frequency_bins(data)


UNUSUAL = {
    "gap": pd.to_timedelta([1, 2] * 10, unit="s"),
    "raw": [b"a", b"b"] * 10,
    "clock": [datetime.time(1), datetime.time(2)] * 10,
    "nested": [[1], [2]] * 10,
    "text": ["a", "b"] * 10,
    "mixed": [1, "a"] * 10,
    "complex": np.array([1j, 2j] * 10),
    "things": [object(), object()] * 10,
    "cut": pd.cut(np.arange(20.0), 4),
}
PLAIN = {
    "x": np.arange(20.0),
    "month": pd.period_range("2020-01", periods=20, freq="M"),
    "sparse": pd.arrays.SparseArray([0.0, 1.0] * 10),
}


@pytest.mark.parametrize("form", ["pandas", "arrow", "polars", "lazy", "parquet"])
def test_columns_that_cannot_be_binned_are_named_and_stop_nothing(form, tmp_path):
    frame = pd.DataFrame(PLAIN | UNUSUAL)
    if form != "pandas":  # what pandas alone has
        frame = frame.drop(columns=["mixed", "complex", "things", "cut", "month", "sparse"])
    data = {
        "pandas": lambda: frame,
        "arrow": lambda: pa.Table.from_pandas(frame),
        "polars": lambda: pl.from_pandas(frame).with_columns(thing=pl.Series([object()] * 20, dtype=pl.Object)),
        "lazy": lambda: pl.from_pandas(frame).lazy(),
        "parquet": lambda: frame.to_parquet(tmp_path / "data.parquet") or tmp_path / "data.parquet",
    }[form]()
    result = mb.equal_frequency_bins(data, n_bins=2)

    left_out = [name for name in UNUSUAL if name in frame] + ["thing"] * (form == "polars")
    if form == "parquet":
        left_out.remove("gap")  # Parquet has no durations, and pandas writes numbers
    assert set(left_out) <= set(result.left_out) and not set(result.left_out) & {"x", "month", "sparse"}
    assert all(result[name].variable.kind == "timestamp" for name in result if name == "month")
    statuses = dict(zip(result.summary()["attribute"], result.summary()["status"]))
    for name in left_out:
        assert statuses[name] == f"left out: {result.left_out[name]}"
        assert name in repr(result) and f"<td>{name}</td>" in result._repr_html_()
    assert "<NA>" not in repr(result) and "NaN" not in repr(result) and "columns left out" in repr(result)
    named = "clock"
    with pytest.raises(mb.DataError, match=f"column {named!r}: .*time of day"):
        mb.equal_frequency_bins(data, [named])
