"""What can be done with the bins."""

from __future__ import annotations

import copy
import datetime
import decimal
import json
import math
import pickle
import sqlite3

import duckdb
import mcbinning as mb
import numpy as np
import pandas as pd
import pyarrow as pa
import pytest
import sqlglot
from hypothesis import given, settings
from hypothesis import strategies as st
from mcbinning._sql import WITHOUT_NAN

pytestmark = pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")

VALUES = st.one_of(st.none(), st.integers(-20, 20).map(lambda n: n / 4), st.floats(-1e6, 1e6))
ROWS = st.lists(
    st.tuples(VALUES, st.sampled_from("abc"), st.sampled_from([0.0, 0.5, 1.0, 3.0])), min_size=1, max_size=60
)


def table_of(rows: list[tuple[float | None, str, float]]) -> pa.Table:
    x, y, w = zip(*rows)
    return pa.table({"x": pa.array(x, pa.float64()), "y": y, "w": w})


@settings(max_examples=150, deadline=None)
@given(rows=ROWS, closed=st.sampled_from(["right", "left"]), bins=st.integers(2, 6))
def test_bins_of_the_same_data_recount_to_the_table(rows, closed, bins):
    table = table_of([*rows, (0.25, "a", 1.0), (0.75, "b", 1.0)])
    for result in (
        mb.supervised_bins(table, "y", ["x"], weight="w", closed=closed, max_distinct=bins, n_bins=bins),
        mb.equal_frequency_bins(table, ["x"], weight="w", closed=closed, n_bins=bins),
    ):
        found = result["x"]
        placed = table.append_column("bin", result.transform(table)["x_bin"]).to_pandas()
        weights = placed.groupby("bin")["w"].sum().reindex(range(found.n_bins), fill_value=0.0)

        assert weights.tolist() == found.weights.tolist()
        assert placed.loc[placed["bin"].isna(), "w"].sum() == found.missing_weight
        if found.target is not None:
            for code, category in enumerate(found.target.category_names()):
                part = placed[placed["y"] == category].groupby("bin")["w"].sum()
                assert (
                    part.reindex(range(found.n_bins), fill_value=0.0).tolist() == found.target_weights[:, code].tolist()
                )


@settings(max_examples=60, deadline=None)
@given(rows=ROWS, closed=st.sampled_from(["right", "left"]))
def test_json_keeps_every_bit(rows, closed):
    result = mb.equal_frequency_bins(table_of([*rows, (0.1, "a", 0.3)]), ["x"], weight="w", closed=closed, n_bins=4)
    again = mb.BinningResult.from_json(result.to_json())

    assert again["x"].cut_points.tobytes() == result["x"].cut_points.tobytes()
    assert again["x"].weights.tobytes() == result["x"].weights.tobytes()
    assert again.to_json() == result.to_json()


@settings(max_examples=60, deadline=None)
@given(rows=ROWS, closed=st.sampled_from(["right", "left"]))
def test_sql_puts_every_row_where_transform_does(rows, closed):
    table = table_of([*rows, (0.25, "a", 1.0)])
    result = mb.equal_frequency_bins(table, ["x"], closed=closed, n_bins=4, missing={"x": [-1.5, (2.0, 3.0)]})
    expected = result.transform(table)["x_bin"].to_pylist()
    table_of_rows = table  # DuckDB finds it by this name
    assert len(table_of_rows) == len(expected)
    database = sqlite3.connect(":memory:")
    database.execute("CREATE TABLE data (x REAL)")
    database.executemany("INSERT INTO data VALUES (?)", [(value,) for value in table["x"].to_pylist()])

    # SQLite itself takes some literals for a neighbouring number.
    cuts = result["x"].cut_points.tolist()
    if all(math.isinf(cut) or database.execute(f"SELECT {cut!r}").fetchone()[0] == cut for cut in cuts):
        assert [row[-1] for row in database.execute(result.to_sql("sqlite", "data"))] == expected
    assert [row[-1] for row in duckdb.sql(result.to_sql("duckdb", "table_of_rows")).fetchall()] == expected


def columns_of_many_types() -> pa.Table:
    """Each type in steps, from below 1970 on, with nulls; a cut in the middle of the steps lies between two of them."""
    steps = np.random.default_rng(5).permutation(np.arange(400) % 40 - 20).tolist()
    day = datetime.date(1970, 1, 1)

    def some(values: list[object]) -> list[object]:
        return [value if step % 9 else None for value, step in zip(values, steps)]

    return pa.table(
        {
            "whole": pa.array(some(steps), pa.int16()),
            "paid": pa.array(some([decimal.Decimal(step) / 100 for step in steps]), pa.decimal128(9, 2)),
            "tiny": pa.array(some([step * 1e-310 for step in steps]), pa.float64()),
            "single": pa.array(some([step / 3 for step in steps]), pa.float32()),
            "day": some([day + datetime.timedelta(days=step) for step in steps]),
            "second": pa.array(some(steps), pa.timestamp("s")),
            "stamp": pa.array(steps, pa.timestamp("us")),
            "zoned": pa.array(some(steps), pa.timestamp("us", "Asia/Tokyo")),
            "flag": some([step > 3 for step in steps]),
            "text": some([f"t'{step % 7}" for step in steps]),
            "kind": pa.array(some([f"k{step // 8}" for step in steps])).dictionary_encode(),
            "y": ["a" if (step * 7) % 11 > 5 + (step < 0) * 3 else "b" for step in steps],
        }
    )


@pytest.mark.parametrize("closed", ["right", "left"])
@pytest.mark.parametrize("method", ["supervised", "equal-frequency"])
def test_sql_of_every_type_puts_each_row_where_transform_does(closed, method):
    data = columns_of_many_types()
    names = data.column_names[:-1]
    missing = {"whole": [3, (-7, -5)], "day": [datetime.date(1970, 1, 4), ("1970-01-08", "1970-01-10")], "text": "t'2"}
    if method == "supervised":
        result = mb.supervised_bins(data, "y", names, missing=missing, closed=closed)
    else:
        result = mb.equal_frequency_bins(data, names, missing=missing, closed=closed, n_bins=2)
        assert result["stamp"].cut_points.tolist() == [-0.5]  # between two microseconds
    duckdb.sql("SET TimeZone = 'America/New_York'")

    for labels in (False, True):
        expected = result.transform(data, labels)
        placed = duckdb.sql(result.to_sql("duckdb", "data", labels)).to_arrow_table()
        for name in names:
            assert placed[f"{name}_bin"].to_pylist() == expected[f"{name}_bin"].to_pylist(), name
    again = mb.BinningResult.from_json(result.to_json())
    assert again.to_sql("duckdb", "data") == result.to_sql("duckdb", "data")


def test_borders_are_shown_as_dates_that_part_the_same_days():
    days = pa.table({"day": pa.array([i % 20 for i in range(60)], pa.int32()).cast(pa.date32())})

    assert mb.equal_frequency_bins(days, n_bins=2)["day"].labels == ["(-inf, 1970-01-10]", "(1970-01-10, +inf)"]
    left = mb.equal_frequency_bins(days, n_bins=2, closed="left")["day"]
    assert left.labels == ["(-inf, 1970-01-11)", "[1970-01-11, +inf)"] and left.cut_points.tolist() == [9.5]


def test_a_date_beyond_the_calendar_stays_a_number():
    endless = duckdb.sql("SELECT if(range % 2 = 0, DATE '2020-01-01', 'infinity'::DATE) AS day FROM range(9)")
    figures = mb.equal_frequency_bins(endless, n_bins=2).summary()

    assert figures["minimum"][0] == datetime.date(2020, 1, 1) and figures["maximum"][0] == 2**31 - 1


def test_sql_asks_each_dialect_for_nan_and_flags_in_its_own_words():
    table = pa.table({"x": [float(i) for i in range(40)], "flag": [i > 9 for i in range(40)]})
    result = mb.supervised_bins(table, "flag", ["x"])
    flags = mb.equal_frequency_bins(table, ["flag"], n_bins=2)
    conditions = {
        "duckdb, normalization_strategy=case_sensitive": 'ISNAN("x")',
        "spark2": "ISNAN(`x`)",
        "athena": 'IS_NAN("x")',
        "oracle": '"x" IS NAN',
        "redshift": "\"x\" = CAST('NaN' AS DOUBLE PRECISION)",
        "hive": "`x` <> `x` OR `x` = CAST('NaN' AS DOUBLE)",
        "duckdb": 'isnan("x")',
        "postgres": "\"x\" = CAST('NaN' AS DOUBLE PRECISION)",
        "snowflake": "\"x\" = CAST('NaN' AS DOUBLE)",
        "bigquery": "IS_NAN(`x`)",
        "mysql": None,
    }

    for dialect, condition in conditions.items():
        text = result.to_sql(dialect)
        text = " ".join(text.split())
        assert condition in text if condition else "NAN" not in text.upper(), dialect
    for dialect in sqlglot.Dialect.classes:  # a new one is one to decide about
        assert ("NAN" in result.to_sql(dialect).upper()) != (dialect in WITHOUT_NAN), dialect
    assert '"flag" = FALSE' in flags.to_sql("postgres")
    with pytest.raises(ValueError, match="dialect"):
        result.to_sql("klingon")


def test_transform_gives_back_the_kind_of_thing_that_it_got(mixed, tmp_path):
    frame = mixed.set_index(pd.Index(range(5000, 6500)))
    result = mb.supervised_bins(frame[["x", "whole", "y"]], "y")
    path = tmp_path / "data.csv"
    frame.to_csv(path, index=False)

    bins = result.transform(frame)
    assert bins.index.equals(frame.index) and list(bins) == ["x_bin", "whole_bin"]
    stream = result.transform(path, labels=True)
    assert isinstance(stream, pa.RecordBatchReader)
    labels = stream.read_all()["x_bin"].to_pylist()
    assert labels == [result["x"].labels[number] for number in bins["x_bin"]]
    with pytest.raises(mb.DataError, match="column 'whole': there is no such column"):
        result.transform(frame[["x"]])


@pytest.mark.parametrize("closed", ["right", "left"])
@pytest.mark.parametrize("n_bins", [2, 33, 34, 300])
def test_numpy_finds_the_bins_that_the_library_of_bins_finds(closed, n_bins):
    values = np.random.default_rng(n_bins).integers(0, 1000, 40_000).astype(float)
    found = mb.equal_frequency_bins(pa.table({"x": values}), n_bins=n_bins, closed=closed)["x"]

    probes = np.concatenate([found.cut_points, np.nextafter(found.cut_points, -1), values[:2000], [-np.inf, np.inf]])
    assert found.bin_numbers(probes).tolist() == [found._core.find_bin(value) for value in probes]


def test_values_outside_the_range_seen_fall_into_the_outer_bins():
    result = mb.equal_frequency_bins(pa.table({"x": range(100)}), n_bins=4)

    assert result["x"].bin_numbers(np.array([-1e300, -np.inf, 1e300, np.inf, np.nan])).tolist() == [0, 0, 3, 3, 4]


def test_summary_and_notebook_show_the_largest_gain_first(iris):
    result = mb.supervised_bins(iris.rename(columns={"petal_width": "<b>"}), "species")

    assert result.summary()["attribute"].tolist() == ["<b>", "petal_length", "sepal_length", "sepal_width"]
    assert result.summary()["gain"].is_monotonic_decreasing
    html = result._repr_html_()
    assert "&lt;b&gt;" in html and html.index("&lt;b&gt;") < html.index("sepal_width")


def test_what_rounding_leaves_is_no_gain():
    """A single bin leaves the target's entropy as it is, and it is computed in two ways."""
    rng = np.random.default_rng(4)
    for case in range(30):
        y = rng.choice(["a", "b", "c"], 90, p=[0.2, 0.3, 0.5])
        result = mb.supervised_bins(pa.table({"x": rng.normal(size=90), "y": y, "w": rng.random(90)}), "y", weight="w")
        if result["x"].n_bins == 1:
            assert str(result["x"].gain) == "0.0" and result.summary()["gain"][0] == 0.0, case


def test_frames_have_a_row_for_each_bin_and_for_the_missing_and_the_total(iris):
    iris.loc[:29, "petal_width"] = np.nan
    iris.loc[140:, "species"] = np.nan  # whose records are in no row
    result = mb.supervised_bins(iris, "species")
    frame = result.to_pandas()

    assert len(frame) == sum(found.n_bins + 1 for found in result.values()) + 1
    assert frame[frame["bin"].isna()]["interval"].tolist() == ["total"] * 3 + ["missing", "total"]
    assert frame[frame["interval"] != "total"].groupby("attribute")["weight"].sum().tolist() == [140.0] * 4
    assert frame[frame["interval"] == "total"]["share"].tolist() == [1.0] * 4
    missing = result["petal_width"].missing
    assert (missing.weight, missing.target_weights, missing.woe) == (30.0, (30.0, 0.0, 0.0), None)
    assert result["petal_length"].missing is None
    parts = frame[[f"weight[{name}]" for name in ("setosa", "versicolor", "virginica")]]
    assert parts.sum(axis=1).tolist() == frame["weight"].tolist()
    assert result.to_arrow().to_pandas().equals(frame)


def test_plots_draw_shares_over_the_weight_of_the_bins(iris):
    result = mb.supervised_bins(iris, "species")
    ax = result.plot("petal_width")
    bars = [(bar.get_x(), bar.get_width(), bar.get_height()) for bar in ax.patches]

    assert len(bars) == 3 * result["petal_width"].n_bins
    assert sum(width * height for _, width, height in bars) == pytest.approx(1.0)
    titles = [axes.get_title() for axes in result.plot_all(2).axes]
    assert titles[0].startswith("petal_width") and titles[-1].startswith("sepal_width")


def test_what_bins_say_about_an_event_is_in_every_table():
    x = [1, 1, 1, 1, 2, 2, 2, 2]
    frame = pd.DataFrame(
        {"x": x * 20, "y": [False, False, False, True, True, True, True, False] * 20, "z": list("abcdabcd") * 20}
    )
    result = mb.supervised_bins(frame, pairs=[("x", "y"), ("x", "z")])
    found = result["x", "y"]

    # A quarter of the events is in the first bin and three quarters are in the second; of the others it is the reverse.
    woe = [math.log(1 / 3), math.log(3)]
    assert found.rates.tolist() == [0.25, 0.75] and found.woe == pytest.approx(woe)
    assert found.iv == pytest.approx([math.log(3) / 2] * 2) and found.information_value == found.iv.sum()
    assert found.to_pandas()[["rate", "woe", "iv"]].to_numpy().T.tolist() == [
        [0.25, 0.75, 0.5],
        [*found.woe, 0.0],
        [*found.iv, found.information_value],
    ]
    of_four = result["x", "z"]
    assert of_four.rates is None and of_four.woe is None and "woe" not in of_four.to_pandas()
    values = dict(zip(result.summary()["target"], result.summary()["information_value"]))
    assert values["y"] == found.information_value and math.isnan(values["z"])
    assert found.information_value == json.loads(result.to_json())["results"][0]["information_value"]


def test_the_missing_weigh_in_the_evidence_and_empty_cells_are_smoothed():
    x = [1] * 6 + [2] * 6 + [None] * 4
    data = pa.table({"x": pa.array(x, pa.float64()), "y": [0] * 6 + [1] * 6 + [0, 0, 0, 1]})
    for smoothing in (0.5, 2.0, 0.0):
        found = mb.supervised_bins(data, "y", smoothing=smoothing)["x"]
        events, others = smoothing / 7, (6 + smoothing) / 9
        first = math.log(events / others) if smoothing else -math.inf
        missing = math.log((1 / 7) / (3 / 9))
        assert found.rates.tolist() == [0.0, 1.0] and found.woe[0] == first
        assert (found.missing.rate, found.missing.woe) == (0.25, missing)
        assert found.information_value == found.iv.sum() + found.missing.iv
    weighted = mb.supervised_bins(data.append_column("w", pa.array(np.arange(16) / 4)), "y", weight="w")["x"]
    assert weighted.missing.target_weights == (3.0 + 3.25 + 3.5, 3.75)
    again = pickle.loads(pickle.dumps(found))
    assert again.woe.tolist() == found.woe.tolist() and again.missing == found.missing and again.smoothing == 0.0
    for smoothing in (-1, math.inf, math.nan):
        with pytest.raises(ValueError, match="smoothing must be a finite number of at least 0"):
            mb.supervised_bins(data, "y", smoothing=smoothing)


def test_the_best_attributes_are_selected_and_scored(iris):
    iris["noise"] = np.random.default_rng(0).normal(size=150)
    with pytest.warns(mb.NoCutPointsWarning):
        result = mb.supervised_bins(iris, "species")
    assert list(result.select(top=2)) == ["petal_width", "petal_length"]
    assert list(result.select(min_gain=0.6)) == ["petal_width", "petal_length", "sepal_length"]
    assert len(result.select(min_iv=0.0)) == 0 and len(result.select()) == 5
    assert result.select(top=1).transform(iris).columns.tolist() == ["petal_width_bin"]
    assert mb.BinningResult.from_json(result.select(top=1).to_json()).summary()["gain"].tolist() == [
        result["petal_width"].gain
    ]
    features = iris.drop(columns="species")
    assert mb.information_gain(features, iris["species"]).tolist() == [result[name].gain for name in features]

    is_setosa = (iris["species"] == "setosa").to_numpy()
    with pytest.warns(mb.NoCutPointsWarning):
        of_two = mb.supervised_bins(features.assign(y=is_setosa), "y")
    values = mb.information_value(features, is_setosa)
    assert values.tolist() == [of_two[name].information_value for name in features]
    chosen = of_two.select(min_iv=1.0, top=3)
    assert [found.information_value for found in chosen.bins] == sorted(values, reverse=True)[:3]
    with pytest.raises(ValueError, match="one of two classes"):
        mb.information_value(features, iris["species"])
    with pytest.raises(ValueError, match="top must be at least 0"):
        result.select(top=-1)


def test_copies_and_pickles_are_equal_to_the_last_bit(mixed):
    result = mb.supervised_bins(mixed.assign(kind=mixed["y"], id=list(map(str, mixed.index))), "y", missing={"x": 0.1})
    fitted = mb.SupervisedBinner(encode="interval").fit(mixed[["x", "zoned"]], mixed["y"])

    for again in (pickle.loads(pickle.dumps(result)), copy.deepcopy(result), copy.copy(result)):
        assert again.to_json() == result.to_json() and again.left_out == result.left_out == {
            "id": "text: more than 256 categories"
        }
        assert [found.labels for found in again.bins] == [found.labels for found in result.bins]
    for found in result.values():
        again = pickle.loads(pickle.dumps(found))
        assert again.to_pandas().equals(found.to_pandas()) and again.variable == found.variable
        assert (again.gain, again.status, again.n_distinct) == (found.gain, found.status, found.n_distinct)
    copied = pickle.loads(pickle.dumps(fitted))
    assert (copied.transform(mixed[["x", "zoned"]]) == fitted.transform(mixed[["x", "zoned"]])).all()


def test_columns_of_bins_get_names_that_are_free_and_bins_that_lack_are_told_of(tmp_path):
    frame = pd.DataFrame(
        {"x": np.arange(20.0), "x_bin": np.arange(20.0), "void": np.full(20, np.nan), "y": ["a", "b"] * 10}
    )
    result = mb.supervised_bins(frame, "y")

    with pytest.warns(mb.NoValidValuesWarning, match="attribute 'void'"):
        placed = result.transform(frame)
    assert list(placed) == ["x_bin_2", "x_bin_bin", *["void_bin"] * (result["void"].n_bins > 0)]
    assert placed["x_bin_2"].tolist() == [0] * 20  # a single bin
    assert duckdb.sql(result.to_sql("duckdb", "frame")).df()["x_bin_2"].tolist() == [0] * 20
    result.to_csv(tmp_path / "bins.csv")
    assert (tmp_path / "bins.csv").read_text() == result.to_csv()
