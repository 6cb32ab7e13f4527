"""Bins that are counted again, in their own data and in others, and bins that a person changes."""

from __future__ import annotations

import decimal
import json
import pickle
import subprocess

import duckdb
import mcbinning as mb
import numpy as np
import pandas as pd
import polars as pl
import pyarrow as pa
import pytest

pytestmark = pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")


@pytest.fixture
def people() -> pd.DataFrame:
    rng = np.random.default_rng(5)
    age = rng.integers(18, 80, 3000).astype(float)
    frame = pd.DataFrame({"age": age, "town": rng.choice(["north", "south", "west"], 3000), "w": rng.random(3000)})
    younger = 9 * (frame["town"] == "north")  # and so the order of the towns is not that of their names
    frame["y"] = np.where(age + 20 * rng.normal(size=3000) - younger > 50, "yes", "no")
    frame.loc[::17, "age"] = np.nan
    frame["w"] = frame["w"].astype("Float64")
    frame.loc[::23, "w"] = pd.NA
    frame.loc[::29, "y"] = None
    return frame


@pytest.fixture
def bins(people) -> mb.BinningResult:
    return mb.supervised_bins(people, "y", ["age", "town"], "w")


def same(left: mb.AttributeBins, right: mb.AttributeBins) -> bool:
    frames = left.to_pandas(), right.to_pandas()
    figures = [(found.gain, found.minimum, found.maximum, found.weight_with_missing) for found in (left, right)]
    return frames[0].equals(frames[1]) and np.array_equal(*figures, equal_nan=True)


@pytest.mark.parametrize(
    "form",
    [
        lambda frame, path: frame,
        lambda frame, path: pl.from_pandas(frame),
        lambda frame, path: pa.Table.from_pandas(frame).to_reader(),
        lambda frame, path: frame.to_parquet(path) or path,
        lambda frame, path: frame.sample(frac=1.0, random_state=1),
    ],
    ids=["pandas", "polars", "a stream", "a file", "another order"],
)
def test_the_data_that_bins_were_made_of_give_them_again(people, bins, form, tmp_path):
    evaluation = bins.evaluate(form(people, tmp_path / "people.parquet"))

    assert list(evaluation) == list(bins) and not evaluation.flags
    for key, evaluated in evaluation.items():
        assert same(evaluated.first, evaluated.second) and evaluated.stability == 0.0
        assert same(bins[key], evaluated.second)
    assert evaluation.second.records == 3000
    assert evaluation.second.records_without_weight == bins.records_without_weight
    assert evaluation.second.weight_grid == bins.weight_grid


def test_the_tool_writes_the_evaluation_that_the_package_does(mcbin, people, tmp_path, monkeypatch):
    monkeypatch.chdir(tmp_path)
    people.to_csv("first.csv", index=False)
    moved = people[people["age"] > 30].assign(town=lambda frame: frame["town"].replace("west", "far, far"))
    moved.loc[moved.index[3], ["y", "w"]] = ["perhaps", 0.5]
    moved.loc[moved.index[4], ["age", "y", "w"]] = [99.0, "yes", 0.5]
    moved.to_csv("second.csv", index=False)
    wanted = ["--attributes", "age,town", "--categorical", "town", "--weight", "w", "--format", "json"]
    made = subprocess.run([mcbin, "supervised", "first.csv", "--target", "y", *wanted], capture_output=True, check=True)
    (tmp_path / "bins.json").write_bytes(made.stdout)

    evaluation = mb.BinningResult.from_json("bins.json").evaluate("second.csv")
    for form, text in (("json", evaluation.to_json()), ("csv", evaluation.to_csv())):
        call = [mcbin, "evaluate", "bins.json", "second.csv", "--format", form]
        assert subprocess.run(call, capture_output=True, check=True).stdout.decode() == text
    assert evaluation["town"].unseen_categories == ("far, far",) and evaluation["age"].weight_above == 0.5
    assert evaluation.weight_of_unseen_targets == 0.5
    assert set(evaluation.flags) == {"age", "town"}
    assert json.loads(evaluation.to_json())["attributes"][1]["unseen"]["categories"] == ["far, far"]


def test_figures_are_told_by_row_and_by_attribute(people, bins):
    half = people[people["age"].isna() | (people["age"] > 40)]
    evaluation = bins.evaluate(half)

    frame = evaluation["age"].to_pandas()
    parts = frame["stability"].iloc[:-1]
    assert parts.sum() == pytest.approx(evaluation["age"].stability) and frame["interval"].iloc[-1] == "total"
    one = frame.iloc[-2]  # the missing
    shift = (one["second_share"] - one["first_share"]) * np.log(one["second_share"] / one["first_share"])
    assert one["stability"] == pytest.approx(shift)
    summary = evaluation.summary()
    assert summary["attribute"].tolist() == ["age", "town"] and "shifted" in summary["flags"][0]
    assert evaluation["age"].plot().get_title().startswith("age: stability index")
    assert "flagged" in repr(evaluation) and "<table" in evaluation._repr_html_()
    assert len(evaluation.to_pandas()) == len(frame) + len(evaluation["town"].to_pandas())


def test_what_the_data_lack_is_told(people, bins):
    with pytest.warns(UserWarning, match="no column 'w', the weight of the bins"):
        evaluation = bins.evaluate(people.drop(columns=["y", "w"]))
    assert evaluation["age"].second.target is None and evaluation["age"].second.weight == people["age"].count()

    renamed = bins.evaluate(people.rename(columns={"y": "went", "w": "heft"}), target="went", weight="heft")
    assert same(renamed["age"].first, renamed["age"].second)
    with pytest.raises(mb.DataError, match="there is no such column"):
        bins.evaluate(people, target="went")
    with pytest.raises(mb.DataError, match="age"):
        bins.evaluate(people.drop(columns="age"))
    negative = people.assign(w=-1.0)
    with pytest.raises(mb.DataError, match="the weight is negative"):
        bins.evaluate(negative)


def test_bins_that_a_person_changes_recount_to_what_sql_counts(people):
    bins = mb.supervised_bins(people, "y", ["age", "town"])
    cuts = bins["age"].cut_points.tolist()
    merged = bins["age"].merge(0, 1)
    moved = merged["age"].move(cuts[1], cuts[1] + 0.5, people)["age"].split(70, people)

    assert merged["age"].edited and not merged["town"].edited and not bins["age"].edited
    assert merged["age"].weights[0] == bins["age"].weights[:2].sum() and merged["age"].gain < bins["age"].gain
    assert same(merged["town"], bins["town"]) and moved["age"].n_distinct is None
    query = f"SELECT age_bin, COUNT(*) FROM ({moved.to_sql('duckdb', 'people')}) WHERE y IS NOT NULL"
    counted = duckdb.sql(f"{query} AND age IS NOT NULL GROUP BY 1 ORDER BY 1").fetchall()
    assert [number for _, number in counted] == moved["age"].weights.tolist()

    for again in (mb.BinningResult.from_json(moved.to_json()), pickle.loads(pickle.dumps(moved))):
        assert again["age"].edited and same(again["age"], moved["age"])
    alone = pickle.loads(pickle.dumps(bins["age"])).merge(0, 1)
    assert list(alone) == ["age"] and same(alone["age"], merged["age"])


def test_cut_points_of_a_person_s_choice(people, bins):
    given = bins.with_cuts({"age": [30, 50], "town": []}, people)
    assert given["age"].cut_points.tolist() == [30.0, 50.0] and given["town"].n_bins == 1
    assert given["age"].weight == bins["age"].weight and given["age"].target_entropy == bins["age"].target_entropy

    assert same(bins.with_cuts({"age": bins["age"].cut_points})["age"], bins["age"])
    with pytest.raises(TypeError, match="data must be given"):
        bins.with_cuts({"age": [31.5]})
    for cuts in ([2, 1], [1, 1], [np.nan]):
        with pytest.raises(ValueError, match="cut points must rise"):
            bins.with_cuts({"age": cuts}, people)
    with pytest.raises(KeyError):
        bins.with_cuts({"size": [1]}, people)
    with pytest.raises(ValueError, match="bins from 0 to"):
        bins["age"].merge(1, 99)
    with pytest.raises(ValueError, match="is no cut point"):
        bins["age"].move(1.25, 2, people)
    with pytest.raises(ValueError, match="is a cut point already"):
        bins["age"].split(bins["age"].cut_points[0], people)


@pytest.mark.parametrize("closed", ["right", "left"])
def test_an_engine_counts_what_a_run_over_the_rows_counts(people, closed):
    frame = people.assign(
        size=np.where(people.index % 50 == 0, np.inf, people["age"] * 1.5),
        day=pd.Timestamp("2024-01-01") + pd.to_timedelta(people["age"].fillna(0) * 3600.5, unit="s"),
        price=[decimal.Decimal(int(value * 100)) / 100 for value in people["age"].fillna(1.0)],
        flag=people["age"] > 50,
    )
    names = ["age", "size", "day", "price", "flag", "town"]
    missing = {"age": [20, (30, 35)], "town": "south"}
    bins = mb.supervised_bins(frame, "y", names, "w", missing, closed=closed)
    moved = frame[frame["age"] != 40].assign(town=lambda new: new["town"].replace("west", "a tent"))
    moved.loc[moved.index[:9], "y"] = "perhaps"
    moved.loc[moved.index[:50], "size"] = -np.inf
    warehouse = duckdb.connect()
    warehouse.register("moved", pa.Table.from_pandas(moved))
    asked = []

    def run(sql):
        asked.append(sql)
        return warehouse.sql(sql)

    for data, source in (
        (moved, mb.query_source(run, "duckdb", "moved")),
        (moved.drop(columns="y"), mb.query_source(run, "duckdb", "(SELECT * EXCLUDE (y) FROM moved) AS m")),
    ):
        by_rows, by_engine = bins.evaluate(data), bins.evaluate(source)
        for key in bins:
            left, right = by_rows[key], by_engine[key]
            assert same(left.second, right.second) and left.stability == right.stability, key
            assert (left.weight_below, left.weight_above) == (right.weight_below, right.weight_above)
            assert (left.unseen_weight, left.unseen_categories) == (right.unseen_weight, right.unseen_categories)
        assert by_engine.weight_of_unseen_targets == by_rows.weight_of_unseen_targets
        assert by_engine.second.records == by_rows.second.records == len(moved)
        assert by_engine.second.weight_grid == by_rows.second.weight_grid
    assert not any(sql.startswith("SELECT *") and "LIMIT 0" not in sql for sql in asked), "no rows are asked for"


FORMS = {
    "pandas": lambda frame: frame,
    "a stream": lambda frame: pa.Table.from_pandas(frame).to_reader(),
    "DuckDB": duckdb.from_df,
}


@pytest.mark.parametrize("closed", ["right", "left"])
@pytest.mark.parametrize("weight", [None, "w"])
def test_rounded_cut_points_move_no_record(people, closed, weight):
    people["age"] += np.random.default_rng(2).random(len(people))
    chosen = {"attributes": ["age", "town"], "weight": weight, "closed": closed}
    bins = mb.supervised_bins(people, "y", **chosen)
    rounded = {name: mb.supervised_bins(form(people), "y", round="auto", **chosen) for name, form in FORMS.items()}
    engine = mb.supervised_bins(duckdb.from_df(people), "y", round="auto", reduce="engine", **chosen)
    equal = mb.equal_frequency_bins(FORMS["a stream"](people), ["age"], weight, closed=closed, round="auto")

    for found in [*rounded.values(), engine, mb.BinningResult.from_json(engine.to_json())]:
        assert found.settings.round == "auto" and bins.settings.round is None
        assert found["age"].cut_points.tolist() == rounded["pandas"]["age"].cut_points.tolist()
        assert all(len(str(cut)) <= 6 for cut in found["age"].cut_points)
        assert found.transform(people).equals(bins.transform(people))
        assert np.array_equal(found["age"].weights, bins["age"].weights)
        assert same(found["town"], bins["town"])
    plain = mb.equal_frequency_bins(people, ["age"], weight, closed=closed)
    assert equal.transform(people).equals(plain.transform(people)) and not same(equal["age"], plain["age"])
    with pytest.raises(ValueError, match="round must be 'auto' or None, not 'up'"):
        mb.supervised_bins(people, "y", round="up")


def test_weights_that_are_scaled_sum_to_the_number_of_records(people, mcbin, tmp_path):
    people["w"] *= 40.0
    people["y"] = people["y"].map({"yes": "buys", "no": "stays"})  # DuckDB reads these in a file as truth values
    people.loc[::31, "w"] = 0.0
    path = tmp_path / "people.csv"
    people.to_csv(path, index=False)
    sources = {
        **{name: form(people) for name, form in FORMS.items()},
        "another order": people.sample(frac=1.0, random_state=1),
        "a file": path,
    }

    def bin_scaled(data: object, **settings: object) -> mb.BinningResult:
        return mb.supervised_bins(data, "y", ["age", "town"], "w", weight_scale="rows", **settings)

    found = {name: bin_scaled(data) for name, data in sources.items()}
    found["an engine"] = bin_scaled(sources["DuckDB"], reduce="engine")
    heavy = mb.supervised_bins(people, "y", ["age", "town"], "w")
    call = [mcbin, "supervised", path, "--target", "y", "--attributes", "age,town", "--weight", "w", "--format", "json"]
    told = subprocess.run([*call, "--weight-scale", "rows"], capture_output=True, text=True, check=True)
    assert told.stderr == "" and told.stdout == found["a file"].to_json()

    for name, bins in found.items():
        assert bins["age"].weight_with_missing == pytest.approx((people["w"] > 0).sum(), rel=1e-12), name
        assert 1 < bins["age"].n_bins < heavy["age"].n_bins, name
        assert same(bins["age"], found["pandas"]["age"]) and same(bins["town"], found["pandas"]["town"]), name
        again = mb.BinningResult.from_json(bins.to_json())
        assert [variable.weight_scale for variable in again.variables if variable.role == "weight"] == ["rows"]
    for data in (
        people,
        FORMS["a stream"](people),
        duckdb.from_df(people),
        mb.query_source(duckdb_query(people), "duckdb", "people"),
    ):
        for key, evaluated in found["pandas"].evaluate(data).items():
            assert same(evaluated.second, found["pandas"][key])
    (tmp_path / "bins.json").write_text(told.stdout)
    evaluated = subprocess.run([mcbin, "evaluate", tmp_path / "bins.json", path, "--save", tmp_path / "again.json"])
    again = mb.BinningResult.from_json(tmp_path / "again.json")
    assert evaluated.returncode == 0 and all(same(again[key], found["pandas"][key]) for key in again)
    with pytest.raises(ValueError, match="weight_scale must be 'rows' or None, not 'cases'"):
        mb.supervised_bins(people, "y", weight="w", weight_scale="cases")


def duckdb_query(frame: pd.DataFrame):
    """What runs a query over a table with the name people."""
    connection = duckdb.connect()
    connection.register("people", frame)
    return lambda sql: connection.sql(sql).to_arrow_table()
