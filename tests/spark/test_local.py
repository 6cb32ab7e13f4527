"""Spark frames: their bins are those of a run over the rows, and so are the bins of their values."""

import json
import os
import signal
import threading
import time
import types
import warnings

import mcbinning as mb
import numpy as np
import pandas as pd
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


def made_of(values, kind=None, **options):
    """Bins with one cut in the middle of the values."""
    attribute = pa.array(values, kind)
    target = [int(i >= len(values) // 2) for i in range(len(values))]
    table = pa.concat_tables([pa.table({"x": attribute, "t": target})] * 20)
    return mb.supervised_bins(table, "t", ["x"], **options)


INSTANTS = np.datetime64("1970-01-01", "us") + np.arange(8) * 43_200_000_001


@pytest.mark.parametrize(
    ("bins", "values"),
    [
        (made_of([2**53 + i for i in (-1, 0, 2, 4)]), "BIGINT: 9007199254740992, 9007199254740993, 9007199254740994"),
        (made_of([0.1, 0.2, 0.3, 0.4]), "FLOAT: 0.1, 0.2, 0.3, 'NaN', '-0.0', NULL"),
        (made_of([0.1, 0.2, 0.3, 0.4]), "DECIMAL(20, 17): 0.2, 0.20000000000000001, 0.20000000000000003, 0.3"),
        (made_of([0.0, 0.0, 1.0, 1.0]), "BOOLEAN: TRUE, FALSE, NULL"),
        (made_of([-1.5, -0.0, 0.0, 5e-324], closed="left"), "DOUBLE: -0.0D, 0.0D, 5e-324D, 'Infinity', 'NaN'"),
        (made_of(INSTANTS), "TIMESTAMP_NTZ: '1970-01-02 12:00:00.000003', '1970-01-02 12:00:00.000004'"),
        (made_of(INSTANTS, pa.timestamp("us", "Asia/Tokyo")), "TIMESTAMP: '1970-01-02 07:00:00.000003', '2000-01-01'"),
        (made_of(["a\\b", "it's", "", "é"]), "STRING: '', 'é', 'it\\'s', 'a\\\\b', NULL"),
    ],
    ids=lambda value: value if isinstance(value, str) else "",
)
def test_transform_compares_as_the_package_does(spark, bins, values):
    kind, _, texts = values.partition(": ")
    rows = ", ".join(f"(CAST({text} AS {kind}))" for text in texts.split(", "))
    found = bins.transform(spark.sql(f"SELECT * FROM VALUES {rows} AS rows(x)")).toArrow()
    assert found["x_bin"].to_pylist() == bins.transform(found.select(["x"]))["x_bin"].to_pylist()


def test_transform_knows_missing_and_unseen_categories(spark):
    bins = made_of(["red", "red", "blue", "none"], missing={"x": "none"})
    document = json.loads(bins.to_json())
    document["data"]["missing_text"] = ["NA"]  # as a text file has it
    bins = mb.BinningResult.from_json(json.dumps(document))
    new = spark.createDataFrame([("red",), ("none",), ("NA",), (None,), ("green",)], "x string")
    assert [row["x_bin"] for row in bins.transform(new, unseen="missing").collect()] == [0, None, None, None, None]
    known = new.where("x IS NULL OR x <> 'green'")
    assert [row["x_bin"] for row in bins.transform(known).collect()] == [0, None, None, None]
    with pytest.raises(Exception, match="column 'x': green is not among the categories"):
        bins.transform(new).collect()


def test_unseen_categories_are_in_the_bin_of_the_rare_ones(spark):
    values = ["red"] * 20 + ["blue"] * 20 + ["green", "white"]
    frame = pd.DataFrame({"x": values, "y": [i < 20 for i in range(42)]})
    bins = mb.supervised_bins(frame, "y", ["x"], rare=0.1)
    assert bins["x"].variable.rare == ("green", "white")

    new = spark.createDataFrame([("red",), ("green",), ("black",), (None,)], "x string")
    rows = bins.transform(new).collect()
    placed = bins.transform(new.toPandas())["x_bin"].tolist()
    assert [row["x_bin"] for row in rows] == [None if number is pd.NA else number for number in placed]
    assert rows[1]["x_bin"] == rows[2]["x_bin"] != rows[0]["x_bin"]


def test_evidence_and_evaluations_are_those_of_the_rows(spark, frame):
    bins = made_of([0.5, 1.5, None, 2.5, 3.5, None])
    new = spark.sql(
        "SELECT * FROM VALUES (0.5D, 1), (NULL, 0), (DOUBLE('NaN'), 1), (9.5D, 0), (-1.0D, 2) AS rows(x, t)"
    )
    for encode in ("woe", "rate"):
        found = bins.transform(new, encode=encode).toArrow()
        expected = bins.transform(found.select(["x"]), encode=encode)[f"x_{encode}"]
        assert found[f"x_{encode}"].to_pylist() == expected.to_pylist()
    texts = made_of(["red", "red", "blue", "none"], missing={"x": "none"})
    with pytest.raises(Exception, match="column 'x': green is not among the categories"):
        texts.transform(spark.sql("SELECT 'green' AS x"), encode="rate").collect()

    wide = mb.supervised_bins(frame.toArrow(), "t", [*KINDS, "moment"], weight="w", missing=MISSING | {"w": [0.5]})
    new = frame.where("ABS(HASH(t, w)) % 3 <> 0")
    by_rows, by_engine = wide.evaluate(new.toArrow()), wide.evaluate(new)
    for key in wide:
        left, right = by_rows[key], by_engine[key]
        assert figures_of(left) == figures_of(right), key
    assert by_engine.second.records == by_rows.second.records == new.count()


def figures_of(evaluation):
    second = evaluation.second
    weights = second.weights.tolist(), second.target_weights.tolist(), second.minimum, second.maximum
    strangers = evaluation.weight_below, evaluation.weight_above, evaluation.unseen_weight
    return str((weights, strangers, evaluation.stability))


def test_transform_refuses_what_it_was_not_made_for(spark):
    numbers, texts, instants = made_of([1.0, 2.0]), made_of(["a", "b"]), made_of(INSTANTS)
    refusals = [
        (numbers, "DATE '2020-01-01' AS x", "the column holds date, and the bins are of float: cast it in Spark"),
        (texts, "1 AS x", "the column holds integer, and the bins are of text"),
        (instants, "TIMESTAMP '2020-01-01' AS x", "timestamp with a time zone, and the bins are of timestamp without"),
        (texts, "'A' COLLATE UNICODE_CI AS x", "its collation UNICODE_CI takes different texts for one"),
        (numbers, "1 AS y", "there is no such column"),
    ]
    for bins, columns, words in refusals:
        with pytest.raises(mb.DataError, match=f"column 'x': .*{words}"):
            bins.transform(spark.sql(f"SELECT {columns}"))
    with pytest.warns(mb.NoValidValuesWarning):
        made_of([None, None], pa.float64()).transform(spark.sql("SELECT 1 AS x"))


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
        assert engine.get_progress() == 0.0
        engine.cancel()
        thread.join(60)
        assert not thread.is_alive() and ended
        assert engine.get_progress() is None
    assert spark.range(5).count() == 5


def test_ctrl_c_ends_all_that_runs(spark):
    slow = spark.range(10**12, numPartitions=2).selectExpr("id % 7 AS x", "id % 5 AS y", "id % 3 AS z")
    threading.Timer(4, os.kill, (os.getpid(), signal.SIGINT)).start()
    with pytest.raises(KeyboardInterrupt):
        mb.equal_frequency_bins(slow)
    assert not spark.sparkContext.statusTracker().getActiveJobsIds() and not spark.catalog.listTables()


def test_microseconds_are_those_of_the_reader_of_columns(spark):
    texts = ["0001-01-01 00:00:00", "1969-12-31 23:59:59.999999", "1970-01-01 00:00:00.000246", "1970-01-01 00:00:59.9"]
    texts += ["2024-03-10 02:30:00.000253", "9999-12-31 23:59:59.999999"]  # an hour that New York does not have
    for kind in ("TIMESTAMP", "TIMESTAMP_NTZ"):
        rows = ", ".join(f"({kind} '{text}')" for text in texts)
        with _spark.SparkEngine(spark.sql(f"SELECT * FROM VALUES {rows} AS rows(x)")) as engine:
            found = engine.query(f"SELECT x, CAST({engine.microseconds('x')} AS DOUBLE) AS n FROM rows_").read_all()
        assert found["n"].to_pylist() == [float(ticks) for ticks in found["x"].cast(pa.int64()).to_pylist()], kind


def test_jobs_of_all_threads_are_in_the_group_of_the_caller(spark, frame):
    context = spark.sparkContext
    tracker = context.statusTracker()
    without_group = set(tracker.getJobIdsForGroup(None))
    context.setJobGroup("of the caller", "bins")
    try:
        mb.supervised_bins(frame, "t", ["whole", "cents", "flag"])
    finally:
        context.setLocalProperty("spark.jobGroup.id", None)
    assert len(tracker.getJobIdsForGroup("of the caller")) >= 3
    assert set(tracker.getJobIdsForGroup(None)) <= without_group
