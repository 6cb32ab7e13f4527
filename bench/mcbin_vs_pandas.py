#!/usr/bin/env python3
"""Shows side by side what mcbin does outside of the library and what pandas needs to read the same file once.

    cmake -S . -B build/release -DCMAKE_BUILD_TYPE=Release -DMCOBNQRT_BENCHMARKS=ON
    cmake --build build/release --target mcbininput
    bench/mcbin_vs_pandas.py build/release/bench/mcbininput

The file has 1,000,000 rows, 10 columns of normal values with all their digits, and a target of three categories. mcbin
reads it twice: once to learn the columns, once for the records, which are dropped here and not handed to the library.
Both run on one thread, in turn, five times; the seconds are those of the processor, so that what else runs on the
machine counts for little. Needs NumPy and pandas.
"""

import os
import resource
import statistics
import subprocess
import sys
import tempfile

ROWS = 1_000_000
COLUMNS = 10
TIMES = 5
READ = "import pandas, sys, time; t = time.process_time(); pandas.read_csv(sys.argv[1]); print(time.process_time() - t)"


def write_table(path):
    import numpy as np

    random = np.random.default_rng(1)
    target = random.integers(0, 3, ROWS)
    values = random.normal(size=(ROWS, COLUMNS))
    with open(path, "w") as file:
        file.write(",".join(f"x{i}" for i in range(COLUMNS)) + ",y\n")
        for row, category in zip(values.tolist(), target.tolist()):
            file.write(",".join(map(repr, row)) + f",{'abc'[category]}\n")


def time_mcbin(program, path):
    before = resource.getrusage(resource.RUSAGE_CHILDREN)
    subprocess.run([program, path, "y"], check=True, stdout=subprocess.DEVNULL)
    after = resource.getrusage(resource.RUSAGE_CHILDREN)
    return after.ru_utime + after.ru_stime - before.ru_utime - before.ru_stime


def time_pandas(path):
    environment = dict(os.environ, OMP_NUM_THREADS="1", OPENBLAS_NUM_THREADS="1")
    return float(
        subprocess.run([sys.executable, "-c", READ, path], check=True, env=environment, capture_output=True).stdout
    )


def main():
    if len(sys.argv) != 2:
        sys.exit("usage: mcbin_vs_pandas.py PATH_OF_MCBININPUT")
    with tempfile.TemporaryDirectory() as directory:
        path = os.path.join(directory, "table.csv")
        write_table(path)
        seconds = [(time_mcbin(sys.argv[1], path), time_pandas(path)) for _ in range(TIMES)]
        size = os.path.getsize(path) / 1e6
    mcbin, pandas = (statistics.median(column) for column in zip(*seconds))
    print(f"{ROWS} rows, {size:.0f} MB, medians of {TIMES}")
    print(f"  mcbin, both passes     {mcbin:6.3f} s")
    print(f"  pandas.read_csv, once  {pandas:6.3f} s")
    print(f"  ratio                  {mcbin / pandas:6.2f}")


if __name__ == "__main__":
    main()
