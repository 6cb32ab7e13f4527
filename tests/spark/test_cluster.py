"""A cluster of real processes gives the bins of one process, whatever happens to its executors."""

import os
import signal
import threading
import time

import mcbinning as mb
import pytest
from tables import figures

pytestmark = pytest.mark.filterwarnings("ignore")

ROWS = 4_000_000


def many_rows(session):
    """Made of the numbers of the rows, so that a part that is computed again comes out again."""
    return session.range(ROWS, numPartitions=16).selectExpr(
        "CAST(xxhash64(id) % 1000 AS DOUBLE) / 8 + 10 * (id % 3) AS x",
        "xxhash64(id, 1) % 50 + (id % 3) AS y",
        "CAST(id % 3 AS INT) AS t",
        "(xxhash64(id, 2) % 64) / 100D + 1 AS w",
    )


def test_a_lost_executor_changes_no_bit(cluster):
    frame = many_rows(cluster.session)
    expected = figures(mb.supervised_bins(frame.toArrow(), "t", weight="w"))
    assert figures(mb.supervised_bins(frame, "t", weight="w")) == expected

    killed = []

    def kill_one():
        tracker = cluster.session.sparkContext.statusTracker()
        while not killed:
            stages = [tracker.getStageInfo(stage) for stage in tracker.getActiveStageIds()]
            if any(stage and stage.numCompletedTasks > 2 and stage.numTasks > 8 for stage in stages):
                killed.append(cluster.executors()[0])
                os.kill(killed[0], signal.SIGKILL)
            time.sleep(0.02)

    killer = threading.Thread(target=kill_one, daemon=True)
    killer.start()
    assert figures(mb.supervised_bins(frame, "t", weight="w")) == expected
    assert killed, "no stage was found at work"
    assert killed[0] not in cluster.executors()
