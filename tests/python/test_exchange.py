"""Bins that go from the package to the command-line tool, and back."""

from __future__ import annotations

import json
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
