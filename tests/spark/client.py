"""What test_server.py runs in a process of its own, since a process has sessions of one kind alone."""

import os
import signal
import sys
import threading

import mcbinning as mb
import pyarrow.parquet as pq
import pytest
from conftest import start_session
from tables import MISSING, figures

ATTRIBUTES = ["odd", "single", "day", "instant", "text"]


def main(table, directory):
    session = start_session("server", directory)
    frame = session.read.parquet(table)
    rows = pq.read_table(table)

    options = {"weight": "w", "missing": MISSING}
    bins = mb.supervised_bins(frame, "t", ATTRIBUTES, **options)
    assert figures(bins) == figures(mb.supervised_bins(rows, "t", ATTRIBUTES, **options))
    assert bins.reduction.engine == "Spark"

    found = bins.transform(frame).toArrow()
    expected = bins.transform(found.select(frame.columns))
    assert found.select(expected.column_names).to_pylist() == expected.to_pylist()

    with pytest.raises(mb.StreamError, match=r"^Spark failed: .*DIVIDE_BY_ZERO"):
        mb.equal_frequency_bins(session.sql("SELECT 1 / (id - 3) AS x FROM RANGE(9)"))

    signal.signal(signal.SIGINT, signal.default_int_handler)  # which a process in the background ignores
    slow = session.range(10**12, numPartitions=2).selectExpr("id % 7 AS x", "id % 5 AS y")
    threading.Timer(3, os.kill, (os.getpid(), signal.SIGINT)).start()
    with pytest.raises(KeyboardInterrupt):
        mb.equal_frequency_bins(slow)
    assert session.range(5).count() == 5 and not session.catalog.listTables()
    session.stop()


main(*sys.argv[1:])
