#!/usr/bin/env python3
"""Equal-frequency bins by the library, by NumPy and by scikit-learn, for the same column, on one thread.

    cmake -S . -B build/release -DCMAKE_BUILD_TYPE=Release -DMCOBNQRT_BENCHMARKS=ON
    cmake --build build/release --target rawrun
    bench/quantiles.py build/release/bench/rawrun [RECORDS [TURNS]]

The column is an attribute of workload W1 in README.md. Seconds are those of the processor, medians of all turns, which
take one way after the other; memory is the peak above the column. Needs NumPy and scikit-learn.
"""

import os

for threads in ("OMP_NUM_THREADS", "OPENBLAS_NUM_THREADS"):
    os.environ[threads] = "1"  # is read when NumPy is loaded

import ctypes
import statistics
import subprocess
import sys
import tempfile
import time
from pathlib import Path

import numpy as np
from sklearn.preprocessing import KBinsDiscretizer


def uniforms(seed, count):
    """The first numbers of splitmix64, in [0, 1)."""
    z = np.uint64(seed) + np.arange(1, count + 1, dtype=np.uint64) * np.uint64(0x9E3779B97F4A7C15)
    z = (z ^ (z >> np.uint64(30))) * np.uint64(0xBF58476D1CE4E5B9)
    z = (z ^ (z >> np.uint64(27))) * np.uint64(0x94D049BB133111EB)
    return ((z ^ (z >> np.uint64(31))) >> np.uint64(11)) * 2.0**-53


def normals(seed, count):
    total = np.full(count, -6.0)
    for column in uniforms(seed, 12 * count).reshape(count, 12).T:
        total += column
    return total


def memory(field):
    """Of this process, in MiB, from the kernel."""
    lines = Path("/proc/self/status").read_text().splitlines()
    return next(int(line.split()[1]) / 1024 for line in lines if line.startswith(field))


def measure(work):
    """The seconds and the MiB that a piece of work takes."""
    ctypes.CDLL(None).malloc_trim(0)  # what is freed but kept would hide the need for it
    before = memory("VmRSS")
    Path("/proc/self/clear_refs").write_text("5")  # sets the peak back to the present
    start = time.process_time()
    work()
    return time.process_time() - start, memory("VmHWM") - before


def quantile(column, bins):
    return np.quantile(column, np.arange(1, bins) / bins)


def discretizer(bins):
    return KBinsDiscretizer(
        bins, encode="ordinal", strategy="quantile", subsample=None, quantile_method="averaged_inverted_cdf"
    )


def native(rawrun, path, column, bins):
    with tempfile.TemporaryDirectory() as directory:
        call = [rawrun, path, str(len(column)), "1", "0", str(bins), directory]
        seconds, peak = subprocess.run(call, capture_output=True, text=True, check=True).stdout.split()
    return float(seconds), float(peak)


def compare(rawrun, path, column, bins, turns):
    ways = {
        "library, whole run": lambda: native(rawrun, path, column, bins),
        "NumPy, quantile": lambda: measure(lambda: quantile(column, bins)),
        "NumPy, quantile and digitize": lambda: measure(
            lambda: np.bincount(np.digitize(column, quantile(column, bins), right=True))
        ),
        "scikit-learn, fit": lambda: measure(lambda: discretizer(bins).fit(column.reshape(-1, 1))),
        "scikit-learn, fit and transform": lambda: measure(
            lambda: discretizer(bins).fit_transform(column.reshape(-1, 1))
        ),
    }
    taken = {way: [] for way in ways}
    for _ in range(turns):
        for way, take in ways.items():
            taken[way].append(take())
    for way, turns_taken in taken.items():
        seconds, peak = (statistics.median(figures) for figures in zip(*turns_taken))
        print(f"| {bins} | {way} | {seconds * 1e3:.1f} | {peak:.1f} |")


def main():
    rawrun = sys.argv[1]
    records = int(sys.argv[2]) if len(sys.argv) > 2 else 1_000_000
    turns = int(sys.argv[3]) if len(sys.argv) > 3 else 7
    column = normals(105, records)
    print("| bins | what | ms | peak MiB |\n|--:|---|--:|--:|")
    with tempfile.TemporaryDirectory() as directory:
        path = os.path.join(directory, "column")
        column.tofile(path)
        for bins in (10, 100):
            compare(rawrun, path, column, bins, turns)


main()
