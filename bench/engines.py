#!/usr/bin/env python3
"""What an attribute costs when it is reduced by an engine, beside a run over the rows, by the number of rows.

    bench/engines.py DIRECTORY --rows 1e6 1e7 1e8 [--ways rows engine spark] [--svg docs/images/engines.svg]

needs the package with its extras `files` and `plot`, for Spark `spark`, and 12 bytes of DIRECTORY for each row. The
rows are made by formula in files of at most 10^8 rows, which stay there for the next time.
"""

import argparse
import json
import os
import subprocess
import sys
import time
import warnings
from pathlib import Path

ROWS_OF_FILE = 10**8
MOST_ROWS = {"rows": 10**8, "engine": 10**10, "spark": 2 * 10**7}
"""Of each way; others would take too much memory or time."""
ATTRIBUTES = {"age": "about 170 values", "amount": "about 40,000 values", "score": "nearly all values different"}


def make_rows(path, first, rows):
    """Uniforms made of a hash of the row's number, so that each machine has the same rows."""
    import duckdb

    connection = duckdb.connect(config={"preserve_insertion_order": False, "memory_limit": "4GB"})

    def uniform(stream):
        return f"((hash(i * 8 + {stream}) >> 11)::DOUBLE / {2**53}::DOUBLE)"

    connection.execute(f"""
        COPY (
            SELECT round(60 * ({uniform(0)} + {uniform(1)}) + 24 * t)::INTEGER AS age,
                   round(exp(3.5 + 2 * {uniform(2)} + 0.25 * t) * {uniform(3)}, 2) AS amount,
                   sqrt(-2 * ln({uniform(4)} + 1e-17)) * cos(2 * pi() * {uniform(5)}) + 0.4 * t AS score,
                   t AS target, (1 + hash(i * 8 + 7) % 16)::DOUBLE / 4 AS w
            FROM (SELECT range AS i, (hash(range * 8 + 6) % 3)::INTEGER AS t FROM range({first}, {first + rows}))
        ) TO '{path}' (FORMAT PARQUET, ROW_GROUP_SIZE 1000000)""")


def files_of(directory, rows):
    for first in range(0, rows, ROWS_OF_FILE):
        size = min(ROWS_OF_FILE, rows - first)
        path = Path(directory) / f"{first}-{size}.parquet"
        if not path.exists():
            make_rows(path, first, size)
        yield str(path)


def family_seconds():
    """Of the processor: this process and all that come from it, Java's among them."""
    seconds = {}
    for entry in Path("/proc").glob("[0-9]*"):
        try:
            fields = (entry / "stat").read_text().rsplit(")", 1)[1].split()
        except OSError:  # no process, or one that has ended by now
            continue
        seconds[int(entry.name)] = int(fields[1]), sum(map(int, fields[11:15])) / os.sysconf("SC_CLK_TCK")
    found = {os.getpid()}
    while more := {pid for pid, (parent, _) in seconds.items() if parent in found} - found:
        found |= more
    return sum(seconds[pid][1] for pid in found), found


def peak_of(processes):
    total = 0
    for process in processes:
        status = Path(f"/proc/{process}/status").read_text()
        total += sum(int(line.split()[1]) for line in status.splitlines() if line.startswith("VmHWM"))
    return total / 2**20


def start_spark():
    from pyspark.sql import SparkSession

    settings = {"spark.driver.memory": "3g", "spark.ui.enabled": "false", "spark.log.level": "OFF"}
    settings |= {
        "spark.driver.bindAddress": "127.0.0.1",
        "spark.driver.host": "127.0.0.1",
        "spark.ui.showConsoleProgress": "false",
    }
    builder = SparkSession.builder.master(f"local[{len(os.sched_getaffinity(0))}]")
    for key, value in settings.items():
        builder = builder.config(key, value)
    return builder.getOrCreate()


def measure(way, paths, attribute, options):
    """One run in this process; of Spark the second one, when Java has warmed up."""
    import mcbinning as mb

    warnings.simplefilter("ignore")
    data = start_spark().read.parquet(*paths) if way == "spark" else paths
    options = {"reduce": way, **options} if way == "engine" else {}
    for _ in range(2 if way == "spark" else 1):
        began, before = time.time(), family_seconds()[0]
        bins = mb.supervised_bins(data, "target", [attribute], max_distinct=100_000, n_bins=1000, **options)[attribute]
        wall, (after, processes) = time.time() - began, family_seconds()
    return {
        "wall": wall,
        "processor": after - before,
        "peak": peak_of(processes),
        "bins": [bins.n_distinct, bins.n_bins, bins.model_entropy, *bins.cut_points[:3]],
    }


def draw(found, path):
    import matplotlib

    matplotlib.use("svg")
    matplotlib.rcParams["svg.hashsalt"] = "engines"  # the same picture from the same table
    from matplotlib import pyplot

    figure, axes = pyplot.subplots(figsize=(7.5, 4.5))
    colours = dict(zip(ATTRIBUTES, ("tab:blue", "tab:orange", "tab:green")))
    styles = {"rows": "--", "engine": "-", "spark": ":"}
    names = {"rows": "rows", "engine": "DuckDB", "spark": "Spark"}
    for way, attribute in dict.fromkeys((way, attribute) for _, way, attribute in found):
        points = [
            (rows, run["processor"] / rows * 1e9) for (rows, *key), run in found.items() if key == [way, attribute]
        ]
        label = f"{attribute}, {names[way]}"
        axes.plot(*zip(*points), styles[way], marker="o", color=colours[attribute], label=label)
    axes.set(xscale="log", yscale="log", xlabel="rows", ylabel="processor time, ns a row")
    axes.grid(True, which="both", alpha=0.3)
    axes.legend(fontsize=8)
    figure.tight_layout()
    figure.savefig(path, metadata={"Date": None})


def main():
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("directory")
    parser.add_argument("--rows", type=float, nargs="+", default=[1e6, 1e7])
    parser.add_argument("--ways", nargs="+", default=["rows", "engine"], choices=["rows", "engine", "spark"])
    parser.add_argument("--attributes", nargs="+", default=list(ATTRIBUTES), choices=list(ATTRIBUTES))
    parser.add_argument("--options", type=json.loads, default={}, help="of the runs by DuckDB, as JSON")
    parser.add_argument("--svg")
    parser.add_argument("--one", action="store_true", help="run in this process and print JSON")
    arguments = parser.parse_args()
    found = {}
    for rows in map(int, arguments.rows):
        paths = list(files_of(arguments.directory, rows))
        for way in (way for way in arguments.ways if rows <= MOST_ROWS[way]):
            for attribute in arguments.attributes:
                if arguments.one:
                    print(json.dumps(measure(way, paths, attribute, arguments.options)))
                    continue
                command = [sys.executable, __file__, arguments.directory, "--one", "--rows", str(rows), "--ways", way]
                command += ["--attributes", attribute, "--options", json.dumps(arguments.options)]
                output = subprocess.run(command, stdout=subprocess.PIPE, text=True, check=True).stdout
                run = found[rows, way, attribute] = json.loads(output.splitlines()[-1])
                figures = "wall {wall:.1f} s, processor {processor:.1f} s, peak {peak:.2f} GiB".format(**run)
                print(f"{rows:>12,} {way:6} {attribute:6} {figures}, {run['bins']}", flush=True)
    if arguments.svg:
        draw(found, arguments.svg)


if __name__ == "__main__":
    main()
