"""What the package says of itself: help, types, metadata."""

from __future__ import annotations

import doctest
import importlib.metadata
import inspect
import re
import subprocess
import sys

import mcbinning as mb
import pytest

DOCUMENTED = [
    mb.supervised_bins,
    mb.equal_frequency_bins,
    mb.query_source,
    mb.SupervisedBinner,
    mb.BinningResult.select,
    mb.information_gain,
    mb.information_value,
    mb.EqualFrequencyBinner,
    mb.BinningResult.transform,
    mb.BinningResult.to_sql,
    mb.BinningResult.to_json,
    mb.BinningResult.from_json,
]


@pytest.mark.parametrize("thing", DOCUMENTED, ids=lambda thing: thing.__qualname__)
def test_help_is_a_manual_whose_example_runs(thing):
    text = inspect.getdoc(thing)
    parameters = [p for p in inspect.signature(thing).parameters.values() if p.name not in ("self", "cls")]
    sections = re.findall(r"^(\w+)\n-+$", text, re.M)
    runner = doctest.DocTestRunner(optionflags=doctest.NORMALIZE_WHITESPACE)
    for test in doctest.DocTestFinder(recurse=False).find(thing, thing.__name__, globs={}):
        runner.run(test)

    for parameter in parameters:
        line = re.search(rf"^{parameter.name} : .+\n    \S", text, re.M)
        assert line, parameter.name
        if parameter.default is not inspect.Parameter.empty:
            default = repr(parameter.default).replace("'", '"')
            assert f"default={default}" in line[0], parameter.name
    assert {"Parameters", "Examples"} <= set(sections) and ({"Returns", "Attributes"} & set(sections))
    assert runner.summarize(verbose=False).failed == 0 and runner.tries > 0


PROGRAM = """
import mcbinning as mb

bins: mb.BinningResult = mb.supervised_bins(
    "a.parquet", target="y", closed="left", memory_limit="1GB", missing={"x": [9, (1, 2)]}
)
names: list[str] = bins["x"].labels
gain: float = bins[0].gain
text: str = bins.to_sql("duckdb", table="t") + mb.__version__
table = bins.transform(["a.csv", "b.csv"], labels=True, unseen="missing")
for name, found in bins.items():
    print(name, found.n_bins + 1, found.status.words.upper(), found.cut_points.sum())
binner: mb.SupervisedBinner = mb.SupervisedBinner(encode="onehot", missing="keep").fit([[1.0]], ["a"])
equal: mb.BinningResult = mb.equal_frequency_bins("a.csv", n_bins=4).from_json("{}")
if bins.status.severity == "error":
    raise mb.BinningError(bins.status)
"""

WRONG = [
    'mb.supervised_bins("a.csv", "y", closed="rigth")',
    'mb.equal_frequency_bins("a.csv", closed="both")',
    'mb.SupervisedBinner(encode="one-hot")',
    'mb.EqualFrequencyBinner(missing="drop")',
    'mb.equal_frequency_bins("a.csv").transform("b.csv", unseen="ignore")',
    'mb.equal_frequency_bins("a.csv", n_bins="4")',
    'mb.equal_frequency_bins("a.csv").to_sql(dialect=1)',
    'mb.equal_frequency_bins("a.csv")["x"].labels.lower()',
]


def test_types_pass_a_user_s_program_and_catch_wrong_words(tmp_path):
    program = tmp_path / "program.py"
    program.write_text(PROGRAM + "".join(f"{line}\n" for line in WRONG))
    call = [sys.executable, "-m", "mypy", "--strict", "--cache-dir", str(tmp_path / "cache"), str(program)]
    done = subprocess.run(call, capture_output=True, text=True, timeout=300, cwd=tmp_path)

    first = PROGRAM.count("\n") + 1
    lines = [int(number) for number in re.findall(r"^program.py:(\d+): error", done.stdout, re.M)]
    assert sorted(set(lines)) == list(range(first, first + len(WRONG))), done.stdout + done.stderr
    assert "Literal['rigth']" in done.stdout


def test_the_metadata_say_what_the_package_is():
    metadata = importlib.metadata.metadata("mcbinning")

    assert mb.__version__ == metadata["Version"]
    assert "binning" in metadata["Summary"] and metadata["Description"]
    assert any(line.startswith("Programming Language :: Python :: 3") for line in metadata.get_all("Classifier"))
    assert "Typing :: Typed" in metadata.get_all("Classifier")
