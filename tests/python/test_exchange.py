"""Bins that go from the package to the command-line tool, and back."""

from __future__ import annotations

import csv
import json
import sqlite3
import subprocess
from pathlib import Path

import mcbinning as mb
import numpy as np
import pandas as pd
import pytest

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
        assert result[name].n_bins > 1 and result[name].missing_weight == (
            0.0 if name == "grade" else expected[f"{name}_bin"].isna().sum()
        )
        name = f"{name}_bin"
        assert applied[name].equals(expected[name].astype(applied[name].dtype)), name


def test_the_package_puts_every_row_where_the_tool_does(mcbin, people):
    text = subprocess.run(
        [
            mcbin,
            "supervised",
            people,
            "--target",
            "y",
            "--attributes",
            "age,paid,kind,grade",
            "--format",
            "json",
            "--quiet",
            "--categorical",
            "kind,grade",
            "--missing",
            "age=3,95:99",
            "--missing-text",
            "?,k'1",
        ],
        capture_output=True,
        check=True,
    ).stdout.decode()
    result = mb.BinningResult.from_json(text)
    applied = apply(mcbin, text, people)

    assert result["kind"].missing_weight > 0 and result["grade"].variable.categories == (0.0, 1.0, 2.0, 3.0)
    for data in (people, pd.read_csv(people)):
        bins = result.transform(data)
        frame = bins if isinstance(bins, pd.DataFrame) else bins.read_all().to_pandas()
        for name in result:
            column = applied[f"{name}_bin"]
            assert column.equals(frame[f"{name}_bin"].astype(column.dtype)), name
    with pytest.raises(mb.DataError, match="column 'kind': the column holds no texts, but its categories are texts"):
        result.transform(pd.read_csv(people).assign(kind=1.0))
    with pytest.raises(mb.DataError, match="column 'grade': the column holds texts, but its categories are numbers"):
        result.transform(pd.read_csv(people, dtype={"grade": str}))


def test_json_says_what_numbers_stand_for_where_that_is_no_number(mixed):
    result = mb.supervised_bins(mixed, "y")
    document = json.loads(result.to_json())
    kinds = {variable["name"]: (variable["value_kind"], variable["time_zone"]) for variable in document["variables"]}
    again = mb.BinningResult.from_json(result.to_json())

    assert {name: kind for name, kind in kinds.items() if kind != (None, "")} == {
        "flag": ("boolean", ""),
        "stamp": ("timestamp", ""),
        "zoned": ("timestamp", "Europe/Berlin"),
        "day": ("date", ""),
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
    "pairs": (
        {"x": ROWS, "v": -ROWS, "y": Y, "z": np.where(ROWS < 9, "q", "p")},
        {"pairs": [("x", "y"), ("x", "z"), ("v", "z")]},
    ),
    "texts that look like numbers": (
        {"x": np.array(NUMBERS_AS_TEXTS)[ROWS // 10], "y": np.array(["1e1", "1e0"])[ROWS // 40]},
        {"target": "y", "attributes": ["x"]},
    ),
    "exponents": ({"x": 10.0 ** (ROWS * 7 - 280), "v": -(10.0 ** (ROWS - 320)), "y": Y}, {"target": "y"}),
    "odd names": (
        {name: ROWS + i for i, name in enumerate(NAMES)} | {"y": np.where(ROWS < 40, 'a"', "\\ü\n")},
        {"target": "y"},
    ),
}


def run_tool(mcbin: str, path: Path, options: dict, *form: str) -> str:
    arguments = [f"--{name}={options[name]}" for name in ("target", "weight") if name in options]
    arguments += [f"--pairs={','.join(map(':'.join, options['pairs']))}"] if "pairs" in options else []
    for name, missing in options.get("missing", {}).items():
        ranges = [":".join(map(str, value)) if isinstance(value, tuple) else str(value) for value in missing]
        arguments.append(f"--missing={name}={','.join(ranges)}")
    arguments += [
        f"--{what}={name}" for name in options.get("attributes", []) for what in ("attributes", "categorical")
    ]
    call = [mcbin, "supervised", path, *arguments, "--format", *form, "--quiet"]
    return subprocess.run(call, capture_output=True, check=True).stdout.decode()


@pytest.mark.parametrize("name", ODD_TABLES)
def test_what_a_host_writes_every_host_reads(mcbin, tmp_path, name):
    columns, options = ODD_TABLES[name]
    frame, path, bins = pd.DataFrame(columns), tmp_path / "data.csv", tmp_path / "bins.json"
    frame.to_csv(path, index=False, quoting=csv.QUOTE_NONNUMERIC)
    by_tool = run_tool(mcbin, path, options, "json")
    by_package = mb.supervised_bins(frame, n_bins=np.int64(1000), small_bin_ratio=np.float32(0), **options).to_json()

    for text in (by_tool, by_package, mb.BinningResult.from_json(by_tool).to_json()):
        bins.write_text(text, encoding="utf-8")
        expected = mb.BinningResult.from_json(bins).transform(frame)
        call = [mcbin, "apply", bins, path, "-o", tmp_path / "out.csv", "--quiet"]
        subprocess.run(call, capture_output=True, check=True)
        added = pd.read_csv(tmp_path / "out.csv").iloc[:, frame.shape[1] :].astype("Int32")
        assert added.equals(expected)


def test_what_is_missing_in_one_column_is_a_category_of_another(mcbin, tmp_path):
    texts = ["unknown" if i % 7 == 0 else "-9.0" if i % 11 == 0 else "-9" if i % 13 == 0 else str(i) for i in ROWS]
    frame = pd.DataFrame({"x": texts, "kind": np.where(ROWS < 40, "k", "unknown"), "y": Y})
    path = tmp_path / "data.csv"
    frame.to_csv(path, index=False)
    call = [mcbin, "supervised", path, "--target=y", "--attributes=x,kind", "--categorical=kind", "--missing=x=unknown"]
    text = subprocess.run(
        [*call, "--missing-text=-9", "--format=json"], capture_output=True, check=True
    ).stdout.decode()
    result = mb.BinningResult.from_json(text)

    applied = apply(mcbin, text, path)[["x_bin", "kind_bin"]].astype("Int32")
    is_missing = [not value.isdigit() for value in texts]
    assert applied["x_bin"].isna().tolist() == is_missing and applied["kind_bin"].tolist() == [0] * 40 + [1] * 40
    numbers = frame.assign(x=pd.to_numeric(frame["x"], errors="coerce"))
    database = sqlite3.connect(":memory:")
    numbers.to_sql("t", database)
    by_tool = subprocess.run(
        [*call, "--missing-text=-9", "--format=sql"], capture_output=True, check=True
    ).stdout.decode()
    for bins in (
        result.transform(path).read_all().to_pandas(),
        result.transform(numbers),
        pd.read_sql(result.to_sql("sqlite", table="t") + " ORDER BY 1", database).iloc[:, -2:],
        pd.read_sql(f"SELECT {by_tool} FROM t ORDER BY t.rowid", database),
    ):
        assert bins.astype("Int32").set_axis(applied.columns, axis=1).equals(applied)
    old = json.loads(text) | {"schema_version": 1}
    old["settings"] |= {"bins": 1000, "distinct_threshold": None, "small_bins": 0}
    for variable in old["variables"]:
        variable["missing"] = {"values": [], "interval": None}
    assert mb.BinningResult.from_json(json.dumps(old)).transform(numbers)["x_bin"].isna().tolist() == is_missing


BYTES = {
    "numbers": ({"x": ROWS % 37 / 4, "v": ROWS * 0.1, "y": Y}, {"target": "y"}),
    "weights": ({"x": ROWS, "w": ROWS % 7 + 0.3, "y": Y}, {"target": "y", "weight": "w"}),
    "a weight that is missing": (
        {"x": ROWS, "w": np.where(ROWS % 9, 0.1, np.nan), "y": Y},
        {"target": "y", "weight": "w"},
    ),
    "missing values": ({"x": np.where(ROWS % 5, ROWS, 999), "y": Y}, {"target": "y", "missing": {"x": [999, (3, 7)]}}),
    "a target of numbers": ({"x": ROWS, "y": ROWS // 27}, {"target": "y"}),
    "three categories": ({"x": ROWS, "y": np.array(["ü", "b", "a"])[ROWS // 30]}, {"target": "y"}),
    "one bin": ({"x": ROWS, "y": Y[ROWS % 2 * 40]}, {"target": "y"}),
    "errors and warnings": ({"x": ROWS, "flat": np.ones(80), "y": Y}, {"target": "y"}),
    "pairs": ODD_TABLES["pairs"],
    "exponents": ODD_TABLES["exponents"],
    "names that are taken": ({"x": ROWS, "x_bin": ROWS[::-1], "Größe": ROWS, "a b": ROWS, "y": Y}, {"target": "y"}),
    "texts": ({"x": np.array(["k'1", "k,2", 'ü"', "k4"])[ROWS // 20], "y": Y}, {"target": "y", "attributes": ["x"]}),
}


@pytest.mark.parametrize("closed", ["right", "left"])
@pytest.mark.parametrize("name", BYTES)
def test_the_tool_and_the_package_write_equal_bytes(mcbin, tmp_path, name, closed):
    columns, options = BYTES[name]
    path = tmp_path / "data.csv"
    pd.DataFrame(columns).to_csv(path, index=False)
    result = mb.supervised_bins(str(path), **options, closed=closed)

    for form, text in (
        (["json"], result.to_json()),
        (["csv"], result.to_csv()),
        (["sql"], result.to_sql()),
        (["sql", "--dialect", "duckdb"], result.to_sql("duckdb")),
    ):
        assert run_tool(mcbin, path, options, *form, "--closed", closed) == text, form


FAULTS = [
    (lambda text: text.replace('"schema_version": 3', '"schema_version": 4'), "schema_version: version 4 is not known"),
    (lambda text: text.replace('"left": "-inf"', '"left": 3', 1), r"results\[0\].bins\[0\]: the bin does not lie"),
    (lambda text: text.replace('"cut_points"', '"cuts"'), "results\\[0\\]: the member 'cut_points' is missing"),
    (lambda text: '{"schema": "x"}', "this is not a document of bins"),
    (lambda text: '{"schema":' + "[" * 5000 + "]" * 5000 + "}", "this is not a document of bins"),
    (lambda text: '{"schema":' + "[" * 500000 + "]" * 500000 + "}", "this is not a document of bins"),
    (lambda text: text[: len(text) // 2], r"line \d+: this is not JSON"),
    (lambda text: text.replace('"weight": ', '"weight": NaN, "x": ', 1), r"line \d+: this is not JSON"),
    (lambda text: text.replace('"records": 80', '"records": 1e999'), r"line \d+: this is not JSON"),
    (lambda text: text.replace('"data.csv"', '"\\ud800"'), r"line \d+: this is not JSON"),
]


@pytest.mark.parametrize(("spoil", "message"), FAULTS)
def test_both_readers_say_the_same_of_what_is_wrong(mcbin, tmp_path, spoil, message):
    frame = pd.DataFrame({"x": ROWS, "y": Y})
    result = mb.supervised_bins(frame, "y")
    path, data = tmp_path / "bins.json", tmp_path / "data.csv"
    frame.to_csv(data, index=False)
    text = result.to_json().replace('"name": null', '"name": "data.csv"')
    path.write_text(spoil(text), encoding="utf-8")
    told = subprocess.run([mcbin, "apply", path, data], capture_output=True, text=True).stderr

    with pytest.raises(ValueError, match=message) as caught:
        mb.BinningResult.from_json(path)
    assert str(caught.value).startswith(f"{path}: ") and str(caught.value) in told
    with pytest.raises(ValueError, match="^the text: .*" + message):
        mb.BinningResult.from_json(spoil(text))


def test_a_file_may_begin_with_a_mark_and_must_be_utf_8(tmp_path):
    text = mb.equal_frequency_bins(pd.DataFrame({"x": ROWS}), n_bins=2).to_json()
    path = tmp_path / "bins.json"
    path.write_bytes(b"\xef\xbb\xbf" + text.encode())

    assert mb.BinningResult.from_json(path).to_json() == text == mb.BinningResult.from_json("\ufeff" + text).to_json()
    extended = json.loads(text) | {"more": 1}
    assert mb.BinningResult.from_json(json.dumps(extended)).to_json() == text
    path.write_bytes(text.encode().replace(b'"schema_version"', b'"\xff"'))
    with pytest.raises(ValueError, match="line 3: this is not JSON"):
        mb.BinningResult.from_json(path)


@pytest.mark.parametrize("encode", ["woe", "rate"])
def test_evidence_is_equal_in_the_package_the_tool_and_sql(mcbin, people, encode, tmp_path):
    names = ["age", "paid", "kind"]
    result = mb.supervised_bins(people, "y", names, missing=MISSING_CODES)
    expected = result.transform(people, encode=encode).read_all().to_pandas()
    columns = [f"{name}_{encode}" for name in names]
    assert list(expected) == columns and expected.notna().all(axis=None)

    (tmp_path / "bins.json").write_text(result.to_json(), encoding="utf-8")
    call = [mcbin, "apply", tmp_path / "bins.json", people, "--encode", encode]
    applied = subprocess.run(call, capture_output=True, check=True, text=True).stdout.splitlines()
    cells = [[float(row[field]) for field in columns] for row in csv.DictReader(applied)]
    assert cells == expected.to_numpy().tolist()
    call = [
        mcbin,
        "show",
        tmp_path / "bins.json",
        "--format",
        "sql",
        "--encode",
        encode,
        "--cast",
        "--select",
        "people",
    ]
    sql = subprocess.run(call, capture_output=True, check=True, text=True).stdout
    assert sql == result.to_sql("", "people", encode=encode, cast=True)
    database = sqlite3.connect(":memory:")
    pd.read_csv(people, dtype=str, keep_default_na=False).to_sql("people", database, index=False)
    assert pd.read_sql(sql, database)[columns].to_numpy().tolist() == cells


def test_infinite_evidence_has_no_form_in_sql(people):
    result = mb.supervised_bins(pd.DataFrame({"x": range(20), "y": 10 * [0] + 10 * [1]}), "y", smoothing=0.0)
    assert result.transform(pd.DataFrame({"x": [1]}), encode="woe")["x_woe"].tolist() == [-np.inf]
    with pytest.raises(ValueError, match="infinite weight of evidence"):
        result.to_sql(encode="woe")
    with pytest.raises(ValueError, match="encode must be 'number'"):
        result.to_sql(encode="odds")
