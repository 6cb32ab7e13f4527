"""The Python package against the bare library, and against scikit-learn.

    python bench/python_speed.py [--rawrun build/bench/rawrun] [--rows 1000000] [--turns 5]

The first table: what `fit` takes from an array and from an Arrow table, over what the library takes for the same data
in a C++ host. The second: equal-frequency bins and their use, beside KBinsDiscretizer(strategy="quantile"). The seconds
are those of the processor. Each measurement is a process of its own on one thread, and the turns alternate, so that a
busy machine hits all alike.
"""

from __future__ import annotations

import argparse
import json
import os
import statistics
import subprocess
import sys
import tempfile
import time
from pathlib import Path

COLUMNS = 10
CATEGORIES = 3
BINS = 10


def make_data(path: Path, rows: int) -> None:
    import numpy as np

    rng = np.random.default_rng(0)
    target = rng.integers(0, CATEGORIES, rows)
    with path.open("wb") as file:
        for shift in (0.25, 0.5, 1.0, 1.5, 2.0, 0.0, 0.0, 0.0, 0.0, 0.0):
            (rng.normal(size=rows) + shift * target).tofile(file)
        target.astype(float).tofile(file)


def memory(field: str) -> float:
    """Of this process, in MiB, from the kernel."""
    lines = Path("/proc/self/status").read_text().splitlines()
    return next(int(line.split()[1]) / 1024 for line in lines if line.startswith(field))


def measure(what: str, path: Path, rows: int) -> None:
    """Prints the seconds of fit and of transform, and the peak of memory above where it stood."""
    import warnings

    import mcbinning as mb
    import numpy as np
    import pyarrow as pa
    from sklearn.preprocessing import KBinsDiscretizer

    warnings.simplefilter("ignore")
    columns = np.fromfile(path).reshape(COLUMNS + 1, rows)
    X = np.ascontiguousarray(columns[:COLUMNS].T)
    y = columns[COLUMNS].astype(np.int64)
    if what.endswith("arrow"):
        X = pa.table({f"x{i}": columns[i] for i in range(COLUMNS)})
    binner = {
        "supervised": lambda: mb.SupervisedBinner(n_bins=BINS),
        "equal": lambda: mb.EqualFrequencyBinner(n_bins=BINS),
        "kbins": lambda: KBinsDiscretizer(
            BINS, encode="ordinal", strategy="quantile", subsample=None, quantile_method="averaged_inverted_cdf"
        ),
    }[what.split("-")[0]]()
    before = memory("VmRSS")
    Path("/proc/self/clear_refs").write_text("5")  # sets the peak back to the present
    start = time.process_time()
    binner.fit(X, y)
    fitted = time.process_time()
    peak = memory("VmHWM")
    binner.transform(X)
    print(json.dumps([fitted - start, time.process_time() - fitted, peak - before]))


def run(what: str, path: Path, rows: int) -> list[float]:
    threads = {name: "1" for name in ("OMP_NUM_THREADS", "OPENBLAS_NUM_THREADS", "ARROW_NUM_THREADS")}
    call = [sys.executable, __file__, "--measure", what, "--data", str(path), "--rows", str(rows)]
    done = subprocess.run(call, capture_output=True, text=True, check=True, env={**os.environ, **threads})
    return [float(number) for number in json.loads(done.stdout)]


def run_native(rawrun: str, path: Path, rows: int, categories: int) -> float:
    numbers = [rows, COLUMNS, categories, BINS]
    with tempfile.TemporaryDirectory() as directory:
        call = [rawrun, str(path), *map(str, numbers), directory]
        return float(subprocess.run(call, capture_output=True, text=True, check=True).stdout.split()[0])


def compare_with_native(rawrun: str, path: Path, rows: int, turns: int) -> None:
    print("| run | native, s | array, s | ratio | Arrow table, s | ratio |\n|---|---|---|---|---|---|")
    for method, categories in (("supervised", CATEGORIES), ("equal", 0)):
        native, array, arrow = [], [], []
        for _ in range(turns):
            native.append(run_native(rawrun, path, rows, categories))
            array.append(run(method, path, rows)[0])
            arrow.append(run(f"{method}-arrow", path, rows)[0])
        ratios = [statistics.median(a / b for a, b in zip(times, native)) for times in (array, arrow)]
        medians = [statistics.median(times) for times in (native, array, arrow)]
        print(
            f"| {method} | {medians[0]:.2f} | {medians[1]:.2f} | {ratios[0]:.2f} | {medians[2]:.2f} "
            f"| {ratios[1]:.2f} |",
            flush=True,
        )


def compare_with_kbins(path: Path, rows: int, turns: int) -> None:
    print("\n| binner | fit, s | transform, s | peak of fit, MiB |\n|---|---|---|---|")
    runs: dict[str, list[list[float]]] = {"equal": [], "kbins": []}
    for _ in range(turns):
        for what in runs:
            runs[what].append(run(what, path, rows))
    for what, name in (("equal", "EqualFrequencyBinner"), ("kbins", 'KBinsDiscretizer("quantile")')):
        fit, transform, memory = (statistics.median(column) for column in zip(*runs[what]))
        print(f"| {name} | {fit:.2f} | {transform:.2f} | {memory:.0f} |")


def main() -> None:
    parser = argparse.ArgumentParser()
    parser.add_argument("--rawrun", default="build/bench/rawrun")
    parser.add_argument("--rows", type=int, default=1_000_000)
    parser.add_argument("--turns", type=int, default=5)
    parser.add_argument("--measure")
    parser.add_argument("--data", type=Path)
    options = parser.parse_args()
    if options.measure:
        measure(options.measure, options.data, options.rows)
        return
    with tempfile.TemporaryDirectory() as directory:
        path = Path(directory) / "columns.bin"
        make_data(path, options.rows)
        compare_with_native(options.rawrun, path, options.rows, options.turns)
        compare_with_kbins(path, options.rows, options.turns)


if __name__ == "__main__":
    main()
