"""A table that its engine reduces has the bins of a run over its rows, to the last bit."""

import decimal
import os
import re
import signal
import subprocess
import sys
import time
import warnings

import duckdb
import mcbinning as mb
import numpy as np
import pyarrow as pa
import pyarrow.csv as pacsv
import pyarrow.parquet as pq
import pytest
import sqlglot
from conftest import ROOT
from mcbinning import _buckets
from tables import KINDS, MISSING, figures, random_table


def relation_of(table):
    connection = duckdb.connect()
    connection.execute("SET TimeZone = 'UTC'")
    connection.register("rows_of_test", table)
    return connection.sql("SELECT * FROM rows_of_test")


def check_equal(function, table, *arguments, **options):
    """Over the rows and by DuckDB."""
    with warnings.catch_warnings():
        warnings.simplefilter("ignore", mb.BinningWarning)
        limits = {name: options.pop(name) for name in ("max_groups", "distinct") if name in options}
        rows = function(table, *arguments, **options)
        reduced = function(relation_of(table), *arguments, **options, **limits, reduce="engine")
    assert figures(reduced) == figures(rows)
    return reduced


@pytest.mark.parametrize("seed", range(8))
def test_random_tables_have_equal_figures(seed):
    rng = np.random.default_rng(seed)
    weights = ["none", "whole", "fractions", "cents"][seed % 4]
    table = random_table(rng, weights)
    common = {
        "weight": None if weights == "none" else "w",
        "closed": str(rng.choice(["right", "left"])),
        "rounding": str(rng.choice(["none", "truncate", "closest"])),
        "missing": dict(MISSING),
    }
    if weights != "none":
        common["missing"]["w"] = [0.5, (7, 8)]
    supervised = common | {
        "small_bin_ratio": float(rng.choice([0, 0.5])),
        "max_distinct": rng.choice([None, 20]),
        "n_bins": int(rng.choice([5, 50])),
    }
    check_equal(mb.supervised_bins, table, "t", KINDS, **supervised)
    check_equal(mb.equal_frequency_bins, table, KINDS, n_bins=int(rng.choice([2, 7, 300])), **common)
    pairs = [("free", "t"), ("cents", "u"), ("text", "u"), ("odd", "text"), ("u", "t")]
    check_equal(mb.supervised_bins, table, pairs=pairs, **supervised)


def test_the_examples_have_equal_figures():
    for file, target, weight in (("iris.csv", "species", None), ("young_men.csv", "college", "weight")):
        table = pacsv.read_csv(ROOT / "examples" / "data" / file)
        for options in ({}, {"max_distinct": 20, "n_bins": 15, "closed": "left", "small_bin_ratio": 0.3}):
            check_equal(mb.supervised_bins, table, target, weight=weight, **options)
        check_equal(mb.equal_frequency_bins, table, weight=weight, n_bins=6)


SHAPES = {
    "normal": lambda rng, n: rng.normal(0, 1, n),
    "decades": lambda rng, n: np.exp(rng.normal(0, 25, n)) * rng.choice([-1, 1], n),
    "heavy": lambda rng, n: np.where(rng.random(n) < 0.6, 3.5, 3.5 + rng.normal(0, 1e-9, n)),
    "crowded": lambda rng, n: np.where(
        rng.random(n) < 0.01, rng.normal(0, 1e9, n), 5 + 1e-13 * rng.integers(0, 3000, n)
    ),
    "whole": lambda rng, n: rng.integers(-2000, 2000, n),
    "instants": lambda rng, n: np.datetime64("2020-01-01", "us") + rng.integers(0, 10**9, n),
    "single": lambda rng, n: rng.normal(0, 1, n).astype(np.float32),
}


@pytest.mark.parametrize("shape", SHAPES)
@pytest.mark.parametrize("buckets", [600, 3000])
def test_many_valued_attributes_are_joined_without_loss(shape, buckets, monkeypatch):
    monkeypatch.setattr(_buckets, "_BUCKETS", buckets)
    monkeypatch.setattr(_buckets, "_FEW_ROWS", 300)
    rng = np.random.default_rng(buckets)
    n = 4000
    x = SHAPES[shape](rng, n)
    if x.dtype == float:
        x[:40] = [np.inf, -np.inf, np.nan, 0.0, -0.0, 1.7976931348623157e308, 5e-324, -5e-324] * 5
    t = rng.integers(0, 3, n)
    table = pa.table(
        {
            "x": pa.array(x, mask=rng.random(n) < 0.05),
            "t": pa.array(t, mask=rng.random(n) < 0.05),
            "w": pa.array(rng.integers(0, 12, n) / 4.0, mask=rng.random(n) < 0.05),
        }
    )
    missing = {"t": [2]} if shape == "instants" else {"t": [2], "x": [7, (100, 120)]}
    told = []
    for closed in ("right", "left"):
        for n_bins in (7, 60):
            options = {"weight": "w", "missing": missing, "closed": closed, "n_bins": n_bins, "max_groups": 1999}
            told.append(check_equal(mb.equal_frequency_bins, table, ["x"], **options))
            told.append(check_equal(mb.supervised_bins, table, "t", ["x"], **options, max_distinct=10))
    if buckets == 600 and shape != "heavy":
        assert min(bins.reduction.groups["x"] for bins in told) < 1000


def test_the_grid_of_an_engine_is_that_of_a_run_over_rows():
    """Ties go to the even multiple, no weight becomes 0, and the largest double stays one."""
    step = 2.0 ** (2 + 1 - 52)  # of four weights up to 2
    for w in (
        [2.0, 1.5 * step, 2.5 * step, 1e-300],
        [1.7976931348623157e308, 0.0, 0.0, 0.0],
        [2.0**60 + 2**8, 3.0, 2.0**60, 0.1],
        [5e-324, 1e-323, 0.0, 5e-324],
    ):
        table = pa.table({"x": [1.0, 2.0, 3.0, 4.0], "t": [0, 1, 0, 1], "w": w})
        for rounding in ("none", "truncate", "closest"):
            if rounding == "none" or max(w) > 1:
                check_equal(mb.supervised_bins, table, "t", ["x"], weight="w", rounding=rounding)


def test_categories_are_those_of_all_rows():
    """Also of such as have no weight, or stand beside a missing value alone."""
    table = pa.table(
        {
            "x": [1.0, 2.0, None, 4.0, 5.0, 1e300],
            "t": ["a", "b", "beside missing", "weightless", "b", None],
            "w": [1.0, 1.0, 1.0, 0.0, None, 0.0],
        }
    )
    bins = check_equal(mb.supervised_bins, table, "t", ["x"], weight="w")
    assert len(bins["x"].target.categories) == 4 and bins.records == 6 and bins.records_without_weight == 1


def test_columns_may_have_any_names(monkeypatch):
    """Also those that the queries use themselves."""
    monkeypatch.setattr(_buckets, "_FEW_ROWS", 100)
    rng = np.random.default_rng(6)
    names = ["category_", "weight_", "value_", "number_", "bucket_", "zero_", "rows_", 'a "b"', "low_", "GROUP"]
    table = pa.table({name: rng.normal(0, 1, 900).round(3) for name in names})
    table = table.set_column(0, "category_", pa.array(rng.integers(0, 2, 900)))
    table = table.set_column(1, "weight_", pa.array(rng.random(900)))
    check_equal(mb.supervised_bins, table, "category_", weight="weight_")
    check_equal(mb.equal_frequency_bins, table, names[2:], weight="weight_", n_bins=4, max_groups=400)
    check_equal(mb.supervised_bins, table, "category_", names[1:3], n_bins=4, max_distinct=9, max_groups=700)


def test_a_run_without_records_that_count_fails_as_over_rows():
    for w in ([0.0, 0.0], [None, None]):
        table = pa.table({"x": [1.0, 2.0], "t": [0, 1], "w": pa.array(w, pa.float64())})
        for data, reduce in ((table, "rows"), (relation_of(table), "engine")):
            with pytest.raises(mb.BinningError, match="120004"):
                mb.supervised_bins(data, "t", ["x"], weight="w", reduce=reduce)
    empty = relation_of(pa.table({"x": pa.array([], pa.float64())}))
    with pytest.raises(mb.DataError, match="the data have no rows"):
        mb.equal_frequency_bins(empty, reduce="engine")


@pytest.mark.parametrize(
    ("options", "fault", "words"),
    [
        ({"weight": "nan"}, mb.DataError, "column 'nan': 2 weights are NaN"),
        ({"weight": "negative"}, mb.DataError, "column 'negative': one weight is negative"),
        ({"weight": "infinite"}, mb.DataError, "column 'infinite': one weight is infinite"),
        ({"weight": "wide"}, mb.DataError, "column 'wide': weights of more than 15 digits"),
        (
            {"max_groups": 5},
            mb.DataError,
            "column 'x': there are more than max_groups=5 pairs .* pre-bin it by max_dis",
        ),
        ({"target": "x"}, mb.DataError, "attribute and target at once"),
        ({"target": "many"}, mb.DataError, "^column 'many': there are more than 256 categories"),
        ({"reduce": "cluster"}, ValueError, "reduce must be 'rows', 'engine' or 'auto', not 'cluster'"),
        ({"distinct": "roughly"}, ValueError, "distinct must be"),
        ({"max_groups": 0}, ValueError, "max_groups must be a whole number of at least 1"),
    ],
)
def test_faults_end_in_a_sentence(options, fault, words):
    n = 400
    table = pa.table(
        {
            "x": np.arange(n) % 100 / 1.0,
            "t": np.arange(n) % 2,
            "many": np.arange(n),
            "nan": [float("nan"), float("nan"), *np.ones(n - 2)],
            "negative": [-1.0, *np.ones(n - 1)],
            "infinite": [np.inf, *np.ones(n - 1)],
            "huge": np.full(n, 1e308),
            "wide": pa.array([decimal.Decimal("0.1")] * n, pa.decimal128(20, 10)),
        }
    )
    with pytest.raises(fault, match=words):
        mb.supervised_bins(relation_of(table), **({"target": "t", "attributes": ["x"], "reduce": "engine"} | options))


def test_too_many_values_near_the_cuts_are_refused():
    table = pa.table({"x": np.arange(4000.0)})
    with pytest.raises(mb.DataError, match="more than max_groups=50 values lie next to the borders of 300 bins"):
        mb.equal_frequency_bins(relation_of(table), n_bins=300, reduce="engine", max_groups=50)


def test_only_data_of_an_engine_are_reduced(iris, tmp_path):
    for data in (iris, pa.table({"x": [1.0]})):
        with pytest.raises(ValueError, match="reduce='engine' needs data that an engine has"):
            mb.equal_frequency_bins(data, reduce="engine")
    with pytest.raises(ValueError, match="threads are those of DuckDB"):
        mb.equal_frequency_bins(iris, threads=2)
    assert mb.equal_frequency_bins(iris, ["petal_width"], reduce="rows").reduction is None


class Warehouse:
    """Answers queries on a table of DuckDB's, and does something first with one of them."""

    def __init__(self, table, number=-1, act=None):
        self.connection = duckdb.connect()
        self.connection.register("given", table)
        self.connection.execute("CREATE TABLE people AS SELECT * FROM given")
        self.queries = []
        self.number = number
        self.act = act

    def __call__(self, sql):
        if len(self.queries) == self.number:
            self.act(self.connection)
        self.queries.append(sql)
        return self.connection.sql(sql)


def test_a_table_that_changes_between_two_queries_is_noticed():
    table = pa.table({"x": np.arange(100) % 10, "t": np.arange(100) % 2})
    quiet = Warehouse(table)
    mb.supervised_bins(mb.query_source(quiet, "duckdb", "people"), "t")

    for row, sign in (
        ("(3, 1)", "^the weights of 'x' sum to 101.0"),
        ("(3, 2)", "^column 't': the category 2 was not"),
    ):
        insert = f"INSERT INTO people VALUES {row}"
        busy = Warehouse(table, len(quiet.queries) - 1, lambda connection, sql=insert: connection.execute(sql))
        with pytest.raises(mb.StreamError, match=f"{sign}.* the table was changed while it was read") as error:
            mb.supervised_bins(mb.query_source(busy, "duckdb", "people"), "t")
        assert error.value.row is None


def test_a_query_source_gives_equal_bins_and_its_rows_to_transform():
    table = pa.table({"x": np.arange(300) % 70, "t": np.arange(300) % 70 // 30, "w": np.arange(300) / 7})
    warehouse = Warehouse(table)
    source = mb.query_source(warehouse, dialect="duckdb", table="(SELECT * FROM people) AS subset")
    bins = mb.supervised_bins(source, "t", weight="w")
    expected = mb.supervised_bins(table, "t", weight="w")
    assert bins["x"].cut_points.tolist() == expected["x"].cut_points.tolist()
    assert bins.transform(source).read_all().equals(expected.transform(table))

    reduction = bins.reduction
    assert (reduction.engine, reduction.distinct, dict(reduction.groups)) == ("duckdb", "exact", {"x": 70})
    assert reduction.weight_grid == bins.weight_grid is not None and reduction.queries > 3
    assert mb.BinningResult.from_json(bins.to_json()).reduction == reduction

    with pytest.raises(TypeError, match="run must return an object with __arrow_c_stream__, not a list"):
        mb.equal_frequency_bins(mb.query_source(lambda sql: [], "trino", "people"))
    with pytest.raises(ValueError, match="Unknown dialect"):
        mb.query_source(warehouse, "cobol", "people")


def test_queries_have_a_form_in_each_dialect():
    """What is asked of a warehouse is its own SQL, with its own test for a NaN."""
    table = pa.table({"x": np.arange(600) / 8, "t": np.arange(600) % 2, "w": np.ones(600)})
    for dialect, is_nan in {
        "trino": "IS_NAN(",
        "bigquery": "IS_NAN(",
        "snowflake": "'NaN'",
        "postgres": "'NaN'",
    }.items():
        warehouse = Warehouse(table)
        asked = []

        def run(sql, warehouse=warehouse, asked=asked, dialect=dialect):
            asked.append(sql)
            return warehouse(sqlglot.transpile(sql, read=dialect, write="duckdb")[0])

        source = mb.query_source(run, dialect, "people")
        bins = mb.equal_frequency_bins(source, ["x"], weight="w", n_bins=3, max_groups=500)
        assert bins["x"].n_distinct == 600 and any(is_nan in sql for sql in asked), asked


def test_an_approximate_count_leaves_all_else_exact():
    rng = np.random.default_rng(3)
    table = pa.table({"x": rng.normal(0, 1, 60000), "t": rng.integers(0, 2, 60000)})
    options = {"max_distinct": 100, "n_bins": 20}
    limits = {"reduce": "engine", "max_groups": 50000, "distinct": "approximate"}
    with pytest.warns(mb.NoCutPointsWarning):
        expected = mb.supervised_bins(table, "t", **options)["x"]
        bins = mb.supervised_bins(relation_of(table), "t", **options, **limits)
    assert bins.reduction.distinct == "approximate" and bins.reduction.groups["x"] < 60000
    assert bins["x"].n_distinct == pytest.approx(60000, rel=0.2)
    assert np.array_equal(bins["x"].cut_points, expected.cut_points)
    assert np.array_equal(bins["x"].target_weights, expected.target_weights)


def test_auto_takes_what_is_cheaper_and_says_why(tmp_path):
    rng = np.random.default_rng(4)
    n = 20000
    table = pa.table({"few": rng.integers(0, 40, n), "many": rng.normal(0, 1, n), "t": rng.integers(0, 2, n)})
    csv, parquet = tmp_path / "rows.csv", tmp_path / "rows.parquet"
    pacsv.write_csv(table, csv)
    pq.write_table(table, parquet)
    with warnings.catch_warnings():
        warnings.simplefilter("ignore", mb.BinningWarning)
        for data, attribute, engine, reason in (
            (relation_of(table), "few", "DuckDB", r"about 4\d different values in 1 attributes"),
            (relation_of(table), "many", None, r"20000 rows, and about \d{5} different values"),
            (parquet, "few", "DuckDB", r"about 4\d different values"),
            (csv, "few", None, "each query would read the text of the files anew"),
            (table, "few", None, "no engine has the data"),
        ):
            bins = mb.supervised_bins(data, "t", [attribute], reduce="auto")
            assert bins.reduction.engine == engine and re.search(reason, bins.reduction.reason)
            assert mb.BinningResult.from_json(bins.to_json()).reduction == bins.reduction


def test_progress_tells_of_attributes_by_name(capsys):
    table = pa.table({"x": np.arange(3000.0), "y": np.arange(3000) % 7, "t": np.arange(3000) % 2})
    seen = []
    options = {"reduce": "engine", "progress": lambda phase, number: seen.append((phase, number))}
    with pytest.warns(mb.BinningWarning):
        mb.supervised_bins(relation_of(table), "t", ["y", "x"], **options)
        mb.supervised_bins(relation_of(table), "t", ["y", "x"], reduce="engine", progress=True)
    assert [number for phase, number in seen if phase == "attributes"] == [1, 0]
    assert "binning" in capsys.readouterr().err


def test_what_the_progress_function_raises_ends_the_query(tmp_path):
    pq.write_table(pa.table({"x": np.random.default_rng(8).normal(0, 1, 3_000_000)}), tmp_path / "rows.parquet")

    def fail(phase, number):
        raise LookupError(phase)

    with pytest.raises(LookupError, match=r"query|attributes"):
        mb.equal_frequency_bins(tmp_path / "rows.parquet", reduce="engine", temp_dir=tmp_path, progress=fail)
    assert os.listdir(tmp_path) == ["rows.parquet"]


def test_ctrl_c_ends_the_query_and_leaves_nothing_behind(tmp_path):
    pq.write_table(pa.table({"x": np.arange(1000.0)}), tmp_path / "rows.parquet")
    program = f"""
import duckdb, signal, mcbinning as mb
signal.signal(signal.SIGINT, signal.default_int_handler)  # which a process in the background ignores
many = duckdb.sql("SELECT a.x * 1e9 + b.x * 1e4 + c.x AS x FROM '{tmp_path}/rows.parquet' a, "
                  "'{tmp_path}/rows.parquet' b, '{tmp_path}/rows.parquet' c")
print("begun", flush=True)
mb.equal_frequency_bins(many, reduce="engine", temp_dir={str(tmp_path)!r})
"""
    process = subprocess.Popen(
        [sys.executable, "-c", program], stdout=subprocess.PIPE, stderr=subprocess.PIPE, text=True
    )
    assert process.stdout.readline() == "begun\n"
    time.sleep(1)
    process.send_signal(signal.SIGINT)
    _, errors = process.communicate(timeout=60)
    assert errors.rstrip().endswith("KeyboardInterrupt")
    assert os.listdir(tmp_path) == ["rows.parquet"]
