"""Bins that go from the package to the command-line tool, and back."""

from __future__ import annotations

import csv
import json
import sqlite3
import subprocess
from pathlib import Path

import numpy as np
import pandas as pd
import pytest

import mcbinning as mb

pytestmark = pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")

MISSING_CODES = {"age": [3, (95, 99)], "kind": "?"}


@pytest.fixture
def people(tmp_path) -> Path:
    """Numbers with codes for missing values, texts, whole numbers that are categories, and empty fields."""
    rng = np.random.default_rng(8)
    age = rng.integers(0, 100, 800)
    frame = pd.DataFrame(
        {
            "age": age,
            "paid": [f"{value / 10:.1f}" if value % 10 else "" for value in age],
            "kind": np.where(age % 13 == 0, "?", np.array(["k'1", "k,2", "ü"])[age // 34]),
            "grade": age // 30,
            "y": np.where(age + rng.normal(size=800) * 9 > 50, "yes", "no"),
        }
    )
    path = tmp_path / "people.csv"
    frame.to_csv(path, index=False)
    return path


def apply(mcbin: str, bins: str, data: Path) -> pd.DataFrame:
    file = data.with_suffix(".json")
    file.write_text(bins, encoding="utf-8")
    out = data.with_suffix(".out")
    subprocess.run([mcbin, "apply", file, data, "-o", out, "--quiet"], check=True)
    return pd.read_csv(out)


@pytest.mark.parametrize("closed", ["right", "left"])
def test_the_tool_puts_every_row_where_the_package_does(mcbin, people, closed):
    names = ["age", "paid", "kind", "grade"]
    result = mb.supervised_bins(people, "y", names, missing=MISSING_CODES, closed=closed)
    applied = apply(mcbin, result.to_json(), people)

    expected = result.transform(people).read_all().to_pandas()
    for name in names:
        assert result[name].n_bins > 1 and result[name].missing_weight == (0.0 if name == "grade" else expected[name].isna().sum())
        assert applied[f"{name}_bin"].equals(expected[name].astype(applied[f"{name}_bin"].dtype)), name


def test_the_package_puts_every_row_where_the_tool_does(mcbin, people):
    text = subprocess.run(
        [mcbin, "supervised", people, "--target", "y", "--attributes", "age,paid,kind,grade", "--format", "json", "--quiet"]
        + ["--categorical", "kind,grade", "--missing", "age=3,95:99", "--missing-text", "?,k'1"],
        capture_output=True,
        check=True,
    ).stdout.decode()
    result = mb.BinningResult.from_json(text)
    applied = apply(mcbin, text, people)

    assert result["kind"].missing_weight > 0 and result["grade"].variable.categories == ("0", "1", "2", "3")
    for data in (people, pd.read_csv(people), duckdb_frame(people)):
        bins = result.transform(data)
        frame = bins if isinstance(bins, pd.DataFrame) else bins.read_all().to_pandas()
        for name in result:
            column = applied[f"{name}_bin"]
            assert column.equals(frame[name].astype(column.dtype)), name
    with pytest.raises(mb.DataError, match="column 'kind': the column holds no texts, but its categories are texts"):
        result.transform(pd.read_csv(people).assign(kind=1.0))


def duckdb_frame(path: Path) -> object:
    import duckdb

    return duckdb.sql(f"SELECT * REPLACE (grade::VARCHAR AS grade) FROM '{path}'")


def test_json_of_the_tool_comes_back_with_what_its_numbers_are_and_nothing_else_changed(mcbin, people):
    call = [mcbin, "supervised", people, "--target", "y", "--weight", "grade", "--missing", "age=3,95:99", "--format", "json"]
    document = json.loads(subprocess.run(call, capture_output=True, check=True).stdout)
    again = json.loads(mb.BinningResult.from_json(json.dumps(document)).to_json())

    added = [(variable.pop("value_kind"), variable.pop("time_zone")) for variable in again["variables"]]
    assert added == [("float", ""), ("float", ""), ("float", ""), ("text", "")]
    assert again == document


def test_json_of_the_package_says_what_its_numbers_are(mixed):
    result = mb.supervised_bins(mixed, "y")
    kinds = {variable["name"]: (variable["value_kind"], variable["time_zone"]) for variable in json.loads(result.to_json())["variables"]}
    again = mb.BinningResult.from_json(result.to_json())

    assert kinds == {
        "x": ("float", ""),
        "whole": ("integer", ""),
        "single": ("float", ""),
        "flag": ("boolean", ""),
        "stamp": ("timestamp", ""),
        "zoned": ("timestamp", "Europe/Berlin"),
        "day": ("date", ""),
        "y": ("text", ""),
    }
    assert [found.labels for found in again.values()] == [found.labels for found in result.values()]
    assert again.summary().equals(result.summary())
    assert again.transform(mixed).equals(result.transform(mixed))


NAMES = ['od"d', "new\nline", "ü", " outer ", "it's", "*", "a,b", "--target"]
NUMBERS_AS_TEXTS = ["1", "01", "1.0", "1e3", "-0", " 1", "nan", "ü\n"]
ROWS = np.arange(80)
Y = np.where(ROWS < 40, "a", "b")

ODD_TABLES = {
    "a last category in rows without weight alone": (
        {"x": ROWS, "w": pd.array([0, None, *[1.0] * 78], "Float64"), "y": ["z", "z", *Y[2:]]},
        {"target": "y", "weight": "w"},
    ),
    "a single bin": ({"x": ROWS, "y": Y[ROWS % 2 * 40]}, {"target": "y"}),
    "errors and warnings": (
        {
            "x": ROWS,
            "void": np.full(80, np.nan),
            "flat": np.ones(80),
            "of a alone": np.where(ROWS < 40, ROWS, np.nan),
            "of b alone": np.where(ROWS < 40, np.nan, ROWS),
            "y": Y,
        },
        {"target": "y"},
    ),
    "pairs": ({"x": ROWS, "v": -ROWS, "y": Y, "z": np.where(ROWS < 9, "q", "p")}, {"pairs": [("x", "y"), ("x", "z"), ("v", "z")]}),
    "texts that look like numbers": (
        {"x": np.array(NUMBERS_AS_TEXTS)[ROWS // 10], "y": np.array(["1e1", "10"])[ROWS // 40]},
        {"target": "y", "attributes": ["x"]},
    ),
    "exponents": ({"x": 10.0 ** (ROWS * 7 - 280), "v": -(10.0 ** (ROWS - 320)), "y": Y}, {"target": "y"}),
    "odd names": ({name: ROWS + i for i, name in enumerate(NAMES)} | {"y": np.where(ROWS < 40, 'a"', "\\ü\n")}, {"target": "y"}),
}


def run_tool(mcbin: str, path: Path, options: dict) -> str:
    arguments = [f"--{name}={options[name]}" for name in ("target", "weight") if name in options]
    arguments += [f"--pairs={','.join(map(':'.join, options['pairs']))}"] if "pairs" in options else []
    arguments += [f"--{what}={name}" for name in options.get("attributes", []) for what in ("attributes", "categorical")]
    call = [mcbin, "supervised", path, *arguments, "--format", "json", "--quiet"]
    return subprocess.run(call, capture_output=True, check=True).stdout.decode()


@pytest.mark.parametrize("name", ODD_TABLES)
def test_what_a_host_writes_every_host_reads(mcbin, tmp_path, name):
    columns, options = ODD_TABLES[name]
    frame, path, bins = pd.DataFrame(columns), tmp_path / "data.csv", tmp_path / "bins.json"
    frame.to_csv(path, index=False, quoting=csv.QUOTE_NONNUMERIC)
    by_tool = run_tool(mcbin, path, options)
    by_package = mb.supervised_bins(frame, n_bins=np.int64(1000), small_bin_ratio=np.float32(0), **options).to_json()

    for text in (by_tool, by_package, mb.BinningResult.from_json(by_tool).to_json()):
        bins.write_text(text, encoding="utf-8")
        result = mb.BinningResult.from_json(bins)
        applied = subprocess.run([mcbin, "apply", bins, path, "-o", tmp_path / "out.csv"], capture_output=True, text=True)
        binned = [found for found in result.bins if len(found.cut_points)]
        if not binned:
            assert name == "a single bin" and "nothing to apply" in applied.stderr
            continue
        assert applied.returncode == 0, applied.stderr
        added = pd.read_csv(tmp_path / "out.csv").iloc[:, frame.shape[1] :].astype("Int32")
        assert added.shape == (80, len(binned))
        if name != "pairs":
            assert added.set_axis([found.attribute for found in binned], axis=1).equals(
                result.transform(frame)[[found.attribute for found in binned]]
            )


def test_what_is_missing_in_one_column_is_a_category_of_another(mcbin, tmp_path):
    texts = ["unknown" if i % 7 == 0 else "-9.0" if i % 11 == 0 else "-9" if i % 13 == 0 else str(i) for i in ROWS]
    frame = pd.DataFrame({"x": texts, "kind": np.where(ROWS < 40, "k", "unknown"), "y": Y})
    path = tmp_path / "data.csv"
    frame.to_csv(path, index=False)
    call = [mcbin, "supervised", path, "--target=y", "--attributes=x,kind", "--categorical=kind", "--missing=x=unknown"]
    text = subprocess.run([*call, "--missing-text=-9", "--format=json"], capture_output=True, check=True).stdout.decode()
    result = mb.BinningResult.from_json(text)

    applied = apply(mcbin, text, path)[["x_bin", "kind_bin"]].astype("Int32")
    is_missing = [not value.isdigit() for value in texts]
    assert applied["x_bin"].isna().tolist() == is_missing and applied["kind_bin"].tolist() == [0] * 40 + [1] * 40
    numbers = frame.assign(x=pd.to_numeric(frame["x"], errors="coerce"))
    database = sqlite3.connect(":memory:")
    numbers.to_sql("t", database)
    by_tool = subprocess.run([*call, "--missing-text=-9", "--format=sql"], capture_output=True, check=True).stdout.decode()
    for bins in (
        result.transform(path).read_all().to_pandas(),
        result.transform(numbers),
        pd.read_sql(result.to_sql("sqlite", table="t") + " ORDER BY 1", database).iloc[:, -2:],
        pd.read_sql(f"SELECT {by_tool} FROM t ORDER BY t.rowid", database),
    ):
        assert bins.astype("Int32").set_axis(applied.columns, axis=1).equals(applied)
    old = json.loads(text) | {"schema_version": 1}
    for variable in old["variables"]:
        variable["missing"] = {"values": [], "interval": None}
    assert mb.BinningResult.from_json(json.dumps(old)).transform(numbers)["x"].isna().tolist() == is_missing
