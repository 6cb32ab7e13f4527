"""Spark frames: their bins are those of a run over the rows, and so are the bins of their values."""

import os
import signal
import threading
import time
import types
import warnings

import mcbinning as mb
import numpy as np
import pyarrow as pa
import pyarrow.parquet as pq
import pytest
from mcbinning import _buckets, _spark
from tables import KINDS, MISSING, figures, random_table

pytestmark = pytest.mark.filterwarnings("ignore")


@pytest.fixture(scope="module")
def frame(spark, tmp_path_factory):
    """A wide table, with times of a zone beside those of none."""
    table = random_table(np.random.default_rng(5), "fractions")
    moments = table["instant"].cast(pa.timestamp("us", "UTC"))
    path = tmp_path_factory.mktemp("tables") / "wide.parquet"
    pq.write_table(table.append_column("moment", moments), path, row_group_size=100)
    return spark.read.parquet(str(path)).cache()


def check_equal(function, frame, *arguments, **options):
    limits = {"max_groups": options.pop("max_groups")} if "max_groups" in options else {}
    with warnings.catch_warnings():
        warnings.simplefilter("ignore", mb.BinningWarning)
        reduced = function(frame, *arguments, **options, **limits)
        rows = function(frame.toArrow(), *arguments, **options)
    assert figures(reduced) == figures(rows)
    assert reduced.reduction.engine == "Spark" and not frame.sparkSession.catalog.listTables()
    return reduced


def test_all_kinds_of_columns_have_equal_figures(frame):
    attributes = [*KINDS, "moment"]
    check_equal(mb.supervised_bins, frame, "t", attributes)
    weighted = {"weight": "w", "missing": MISSING | {"w": [0.5]}}
    check_equal(mb.supervised_bins, frame, "t", attributes, **weighted, closed="left", max_distinct=20, n_bins=9)
    check_equal(mb.supervised_bins, frame, pairs=[("odd", "u"), ("text", "u"), ("u", "t")], **weighted)
    check_equal(mb.equal_frequency_bins, frame, attributes, weight="w", rounding="closest", n_bins=7)


def test_many_valued_attributes_are_joined_without_loss(frame, monkeypatch):
    monkeypatch.setattr(_buckets, "_BUCKETS", 400)
    monkeypatch.setattr(_buckets, "_FEW_ROWS", 150)
    attributes = ["free", "single", "instant", "moment"]
    bins = check_equal(mb.equal_frequency_bins, frame, attributes, weight="w", n_bins=5, max_groups=250)
    assert max(bins.reduction.groups.values()) < frame.count() / 2
    check_equal(mb.supervised_bins, frame, "t", ["free"], n_bins=5, max_distinct=20, max_groups=600)


def test_transform_adds_the_columns_that_it_gives_elsewhere(frame):
    bins = mb.supervised_bins(frame.toArrow(), "u", [*KINDS, "moment"], missing=MISSING)
    for labels in (False, True):
        found = bins.transform(frame, labels=labels)
        assert found.columns[: len(frame.columns)] == frame.columns
        handed_on = found.toArrow()
        expected = bins.transform(handed_on.select(frame.columns), labels=labels)
        assert handed_on.select(expected.column_names).to_pylist() == expected.to_pylist()


def test_transform_refuses_what_it_was_not_made_for(spark):
    known = pa.table({"colour": ["red", "blue", "none"] * 9, "t": [0, 1, 0] * 9})
    bins = mb.supervised_bins(known, "t", ["colour"], missing={"colour": "none"})
    new = spark.createDataFrame([("red",), ("none",), (None,), ("green",)], "colour string")
    codes = [row["colour_bin"] for row in bins.transform(new, unseen="missing").collect()]
    assert codes[0] is not None and codes[1:] == [None, None, None]
    assert bins.transform(new.limit(3)).count() == 3
    with pytest.raises(Exception, match="a category is new"):
        bins.transform(new).collect()
    with pytest.raises(mb.DataError, match="the column holds integer, and the bins are of text"):
        bins.transform(spark.createDataFrame([(1,)], "colour int"))
    with pytest.raises(mb.DataError, match="there is no such column"):
        bins.transform(spark.range(3))


def test_faults_end_in_a_sentence(spark, monkeypatch):
    bad = spark.createDataFrame([(1.0, 0, -1.0), (2.0, 1, float("nan"))], "x double, t int, w double")
    with pytest.raises(mb.DataError, match="column 'w': one weight is NaN"):
        mb.supervised_bins(bad, "t", weight="w")
    collated = spark.sql("SELECT id AS x, CAST(id % 2 AS STRING) COLLATE UNICODE_CI AS t FROM RANGE(9)")
    with pytest.raises(mb.DataError, match="column 't': its collation UNICODE_CI takes different texts for one"):
        mb.supervised_bins(collated, "t", ["x"])
    with pytest.raises(mb.StreamError, match=r"^Spark failed: .*DIVIDE_BY_ZERO"):
        mb.equal_frequency_bins(spark.sql("SELECT 1 / (id - 3) AS x FROM RANGE(9)"))
    assert not spark.catalog.listTables()
    old = types.SimpleNamespace(sparkSession=types.SimpleNamespace(version="3.5.4"))
    with pytest.raises(mb.DataError, match=r"4\.0"):
        _spark.SparkEngine(old)


def test_cancelling_ends_the_jobs_of_one_engine(spark):
    slow = spark.range(10**12, numPartitions=2)
    ended = []
    with _spark.SparkEngine(slow) as engine:

        def run():
            try:
                engine.query("SELECT MAX(id % 7) AS n FROM rows_").read_all()
            except mb.StreamError as error:
                ended.append(str(error))

        thread = threading.Thread(target=run)
        thread.start()
        tracker = spark.sparkContext.statusTracker()
        while thread.is_alive() and not tracker.getActiveJobsIds():
            time.sleep(0.05)
        time.sleep(0.5)
        engine.cancel()
        thread.join(60)
        assert not thread.is_alive() and ended
    assert spark.range(5).count() == 5


def test_ctrl_c_ends_all_that_runs(spark):
    slow = spark.range(10**12, numPartitions=2).selectExpr("id % 7 AS x", "id % 5 AS y", "id % 3 AS z")
    threading.Timer(4, os.kill, (os.getpid(), signal.SIGINT)).start()
    with pytest.raises(KeyboardInterrupt):
        mb.equal_frequency_bins(slow)
    assert not spark.sparkContext.statusTracker().getActiveJobsIds() and not spark.catalog.listTables()
