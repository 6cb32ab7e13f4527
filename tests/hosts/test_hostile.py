"""Names and categories that mean something to a terminal, a database, a browser, a spreadsheet: they stay names."""

from __future__ import annotations

import csv
import io
import json
import re
import sqlite3
import subprocess
import unicodedata

import mcbinning as mb
import pandas as pd
import pytest

NAMES = [
    'quoted "name"',
    "x'); DROP TABLE t; --",
    "<script>alert(1)</script>",
    "clear\x1b[2J and ring\x07",
    "older\x9b31m",
    "new\nline and\ttab",
    "safe\u202egnp.exe",
    "=1+1",
]
KINDS = ["o'k\x1b[31m", "</td><b>\\"]


@pytest.fixture(scope="module")
def table() -> pd.DataFrame:
    columns = {name: [float((i * (j + 3)) % 17 + 20 * (i > 60)) for i in range(120)] for j, name in enumerate(NAMES)}
    return pd.DataFrame({**columns, "kind": [KINDS[i > 60] for i in range(120)]})


@pytest.fixture
def run(mcbin, table, tmp_path):
    table.to_csv(tmp_path / "t.csv", index=False)

    def run(*arguments: str) -> str:
        done = subprocess.run([mcbin, *arguments], cwd=tmp_path, capture_output=True, timeout=60, check=True)
        return done.stdout.decode() + done.stderr.decode()

    return run


def test_the_terminal_gets_no_orders(run):
    shown = run("supervised", "t.csv", "--target", "kind")

    assert [c for c in shown if unicodedata.category(c) in ("Cc", "Cf") and c != "\n"] == []
    escaped = ("clear\\x1b[2J and ring\\x07", "new\\x0aline and\\x09tab", "safe\\u202egnp.exe")
    assert all(f"{name} by kind" in shown for name in escaped)


@pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")
def test_a_database_gets_the_columns_and_nothing_else(run, table):
    database = sqlite3.connect(":memory:")
    table.to_sql("t", database, index=False)
    bins = mb.supervised_bins(table, target="kind")
    expected = bins.transform(table).astype(int).to_numpy().tolist()

    for expressions in (run("supervised", "t.csv", "--target", "kind", "--format", "sql"), bins.to_sql("sqlite")):
        found = database.execute(f"SELECT {expressions} FROM t").fetchall()
        assert [list(row) for row in found] == expected
    kinds = mb.equal_frequency_bins(table, attributes=["kind"], n_bins=2)
    assert len(database.execute(f"SELECT {kinds.to_sql('sqlite')} FROM t").fetchall()) == len(table)


def test_a_browser_gets_text(run, table, tmp_path):
    run("supervised", "t.csv", "--target", "kind", "--report", "page.html")
    notebook = mb.supervised_bins(table, target="kind")._repr_html_()

    for page in ((tmp_path / "page.html").read_text(encoding="utf-8"), notebook):
        assert "<script" not in page and "<b>" not in page and "&lt;script&gt;" in page
    assert not re.search(r"(src|href)=[\"'](?!#)|url\(|@import", (tmp_path / "page.html").read_text(encoding="utf-8"))


def test_json_and_csv_give_the_names_back(run):
    found = json.loads(run("supervised", "t.csv", "--target", "kind", "--format", "json"))
    rows = list(
        csv.DictReader(io.StringIO(run("supervised", "t.csv", "--target", "kind", "--format", "csv"), newline=""))
    )

    assert {variable["name"] for variable in found["variables"]} == {*NAMES, "kind"}
    assert {row["attribute"] for row in rows} == set(NAMES)
    assert all(f"weight:{kind}" in rows[0] for kind in KINDS)
