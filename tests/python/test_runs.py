"""While it runs: progress, interruption, threads, memory."""

from __future__ import annotations

import os
import signal
import subprocess
import sys
import textwrap
import threading
import time

import mcbinning as mb
import numpy as np
import pyarrow as pa
import pytest

pytestmark = pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")


def large(rows: int, columns: int) -> np.ndarray:
    return np.random.default_rng(0).normal(size=(rows, columns))


def test_progress_goes_through_the_records_and_then_the_attributes():
    seen = []
    mb.EqualFrequencyBinner(progress=lambda phase, index: seen.append((phase, index))).fit(large(250_000, 3))

    assert seen == [("records", 100_000), ("records", 200_000), ("attributes", 0), ("attributes", 1), ("attributes", 2)]


def test_progress_bars_name_the_attribute(capsys):
    mb.equal_frequency_bins(pa.table({"age": range(30), "size": range(30)}), n_bins=3, progress=True)

    shown = capsys.readouterr().err
    assert "reading" in shown and "binning: 100%" in shown and "size" in shown


def test_what_the_progress_function_raises_ends_the_run(tmp_path):
    def fail(phase: str, index: int) -> None:
        raise LookupError(f"{phase} {index}")

    with pytest.raises(LookupError, match="records 100000"):
        mb.EqualFrequencyBinner(progress=fail, temp_dir=tmp_path).fit(large(150_000, 2))
    assert list(tmp_path.iterdir()) == []


INTERRUPTED = """
    import sys, numpy as np, pyarrow as pa, mcbinning as mb
    phase, directory = sys.argv[1:]
    table = pa.table({f"x{i}": np.random.default_rng(i).normal(size=300_000) for i in range(30)})
    table = table.append_column("kind", pa.array(["a", "b"] * 150_000))

    def endless():
        while True:
            yield from table.to_batches()
            if phase == "categories":  # the reading ahead for them, which reports nothing
                print("now", flush=True)

    def tell(now, index):
        if now == phase:
            print("now", flush=True)

    data = table if phase == "attributes" else pa.RecordBatchReader.from_batches(table.schema, endless())
    try:
        if phase == "categories":
            mb.supervised_bins(data, "kind", temp_dir=directory)
        mb.equal_frequency_bins(data, n_bins=5000, temp_dir=directory, progress=tell)
    except KeyboardInterrupt:
        print("stopped", flush=True)
    else:
        print("done", flush=True)
"""


@pytest.mark.parametrize("phase", ["categories", "records", "attributes"])
def test_ctrl_c_raises_keyboard_interrupt_and_leaves_no_file(tmp_path, phase):
    process = subprocess.Popen(
        [sys.executable, "-c", textwrap.dedent(INTERRUPTED), phase, str(tmp_path)], stdout=subprocess.PIPE, text=True
    )
    try:
        assert process.stdout is not None and process.stdout.readline() == "now\n"
        process.send_signal(signal.SIGINT)
        rest = process.communicate(timeout=60)[0]
    finally:
        process.kill()  # where the time of the test was up

    assert rest.splitlines()[-1] == "stopped" and process.returncode == 0
    assert list(tmp_path.iterdir()) == []


def test_other_threads_run_while_the_library_works():
    X = large(400_000, 6)
    turns, seen = 0, []
    worker = threading.Thread(target=lambda: mb.EqualFrequencyBinner(progress=lambda *_: seen.append(turns)).fit(X))
    interval = sys.getswitchinterval()
    sys.setswitchinterval(1000.0)  # nobody takes the GIL away: who works has to let it go
    try:
        worker.start()
        while worker.is_alive():
            turns += 1
            time.sleep(0)
    finally:
        sys.setswitchinterval(interval)
        worker.join()

    assert len(seen) == 10 and seen[-1] > seen[0]


UNDER_LIMIT = """
    import resource, sys
    import mcbinning as mb, duckdb, pyarrow
    path, directory = sys.argv[1:]
    with open("/proc/self/statm") as file:
        used = int(file.read().split()[5]) * resource.getpagesize()
    limit = used + {allowed}
    resource.setrlimit(resource.RLIMIT_DATA, (limit, limit))
    result = mb.equal_frequency_bins(path, temp_dir=directory)
    print(len(result), result["x0"].weight)
"""


def test_a_file_far_larger_than_the_memory_is_binned(tmp_path):
    import duckdb

    # A column's tuples take 16 bytes a row, 9 MiB, and as much again while they are sorted; the rest is for DuckDB.
    rows, columns, allowed = 600_000, 120, 256 << 20
    path = tmp_path / "large.parquet"
    numbers = ", ".join(f"random() + {i} AS x{i}" for i in range(columns))
    duckdb.sql(f"COPY (SELECT {numbers} FROM range({rows})) TO '{path}' (ROW_GROUP_SIZE 20480)")
    assert path.stat().st_size > 2 * allowed

    script = textwrap.dedent(UNDER_LIMIT).replace("{allowed}", str(allowed))
    call = [sys.executable, "-W", "ignore", "-c", script, str(path), str(tmp_path)]
    # Arrow's own allocator reserves a gigabyte of addresses, which the limit counts as memory in use.
    plain = os.environ | {"ARROW_DEFAULT_MEMORY_POOL": "system"}
    done = subprocess.run(call, capture_output=True, text=True, env=plain, timeout=300)
    assert done.stdout.split() == [str(columns), str(float(rows))], done.stderr[-2000:]
