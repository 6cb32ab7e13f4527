"""Under a locale that writes 1.234,5 all is read and written as ever: numbers of data and of JSON are no country's."""

from __future__ import annotations

import os
import shutil
import subprocess
import sys
import textwrap
from collections.abc import Mapping
from pathlib import Path

import pytest

ROOT = Path(__file__).resolve().parents[2]
DATA = ROOT / "examples" / "data"


@pytest.fixture(scope="session")
def german(tmp_path_factory) -> dict[str, str]:
    """The environment of a user in Germany, whose locale is made here, as systems rarely have it."""
    if not Path("/usr/share/i18n/locales/de_DE").exists() or shutil.which("localedef") is None:
        pytest.skip("there is nothing to make a locale from: Debian's package locales")
    locales = tmp_path_factory.mktemp("locales")
    subprocess.run(["localedef", "-i", "de_DE", "-f", "UTF-8", locales / "de_DE.UTF-8"], check=True)
    environment = {**os.environ, "LOCPATH": str(locales), "LC_ALL": "de_DE.UTF-8"}
    shown = subprocess.run(["locale", "decimal_point"], env=environment, capture_output=True, text=True)
    assert shown.stdout == ",\n", "the locale is not in force"
    return environment


def files_of(directory: Path) -> dict[str, bytes]:
    return {path.name: path.read_bytes() for path in directory.iterdir() if path.name != "many.csv"}


COMMANDS = [
    f"supervised '{DATA}/iris.csv' --target species --report page.html",
    f"supervised '{DATA}/iris.csv' --target species --format json >bins.json",
    f"supervised '{DATA}/iris.csv' --target species --format csv",
    f"supervised '{DATA}/iris.csv' --target species --format sql",
    f"apply bins.json '{DATA}/iris.csv' --labels -o out.csv",
    f"equal-frequency '{DATA}/young_men.csv' --bins 7 --report young.html",
    # More than a thousand rows, bins and codes, which German groups; numbers that only the C library can tell.
    "equal-frequency many.csv --bins 1500 --format sql",
    "equal-frequency many.csv --bins 1500 --format json",
    "equal-frequency many.csv --bins 1500 --report many.html",
    "equal-frequency no.csv",
    "equal-frequency many.csv --bins 1,5",
    "--help",
]


def test_the_tool_writes_the_same_bytes(mcbin, german, tmp_path):
    many = "x,y\n" + "".join(f"{i}.25,1e-{i % 400}\n" for i in range(3000))

    def run(name: str, environment: Mapping[str, str]) -> tuple[list[tuple[int, bytes, bytes]], dict[str, bytes]]:
        directory = tmp_path / name
        directory.mkdir()
        (directory / "many.csv").write_text(many)
        outcomes = []
        for command in COMMANDS:
            done = subprocess.run(
                ["sh", "-c", f"'{mcbin}' {command}"], cwd=directory, env=environment, capture_output=True
            )
            outcomes.append((done.returncode, done.stdout, done.stderr))
        return outcomes, files_of(directory)

    plain = {**german, "LC_ALL": "C.UTF-8"}
    expected, files = run("plain", plain)
    found, german_files = run("german", german)

    for command, one, other in zip(COMMANDS, expected, found):
        assert one == other, command
    assert [code for code, _, _ in expected] == [0] * 9 + [1, 2, 0]
    assert files == german_files and len(files) == 5


PACKAGE = r"""
    import locale, sys
    if sys.argv[1] == "german":
        assert locale.setlocale(locale.LC_ALL, "de_DE.UTF-8") and locale.localeconv()["decimal_point"] == ","
    import pandas as pd, mcbinning as mb
    iris = pd.read_csv(sys.argv[2])
    many = pd.DataFrame({"x": [i + 0.25 for i in range(2400)]})
    for bins, data in (
        (mb.supervised_bins(sys.argv[2], target="species"), iris),
        (mb.supervised_bins(iris, target="species"), iris),
        (mb.equal_frequency_bins(many, n_bins=1100), many),
    ):
        print(bins, bins.summary(), bins._repr_html_(), bins.to_json(), sep="\n")
        first = bins.bins[0]
        print(first.labels, first.to_pandas(), bins.transform(data), sep="\n")
        if data is iris:
            print(bins.to_sql("duckdb", table="t"))
"""

#: Makes the locale of C++ streams German, as another module of the process may.
STREAMS = """
    #include "tests/support/groupeddigits.h"
    namespace { const GroupedDigitsEverywhere kGerman; }
"""


@pytest.fixture(scope="session")
def german_streams(tmp_path_factory) -> str:
    compiler = shutil.which("c++")
    if compiler is None:
        pytest.skip("there is no C++ compiler")
    directory = tmp_path_factory.mktemp("streams")
    source = directory / "streams.cpp"
    source.write_text(textwrap.dedent(STREAMS))
    library = directory / "libstreams.so"
    subprocess.run([compiler, "-std=c++17", "-shared", "-fPIC", f"-I{ROOT}", source, "-o", library], check=True)
    return str(library)


def test_the_package_gives_the_same(german, german_streams):
    def run(locale: str, environment: Mapping[str, str]) -> str:
        done = subprocess.run(
            [sys.executable, "-W", "ignore", "-c", textwrap.dedent(PACKAGE), locale, DATA / "iris.csv"],
            env=environment,
            capture_output=True,
            text=True,
        )
        assert done.returncode == 0, done.stderr
        return done.stdout

    expected = run("plain", {**german, "LC_ALL": "C.UTF-8"})
    assert "setosa" in expected
    assert run("german", {**german, "LD_PRELOAD": german_streams}) == expected
