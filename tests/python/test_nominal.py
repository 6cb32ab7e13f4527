"""Categories without an order of their own: which columns of them are binned, in which order, and what each holds."""

from __future__ import annotations

import json
import subprocess

import duckdb
import mcbinning as mb
import numpy as np
import pandas as pd
import polars as pl
import pyarrow as pa
import pytest

from tests.tables import figures

RATES = {"Aachen": 0.8, "Bonn": 0.2, "Cologne": 0.25, "Dresden": 0.75, "Essen": 0.5}
TIERS = ["high", "low", "mid"]


def make_cities(seed: int = 4, rows: int = 1000) -> pa.Table:
    """Cities whose order by rate is not that of their names, with weights that a grid moves."""
    rng = np.random.default_rng(seed)
    city = rng.choice(list(RATES), rows)
    chance = np.array([RATES[name] for name in city])
    tier = np.where(rng.random(rows) < chance, np.where(rng.random(rows) < 0.7, 0, 2), 1)
    return pa.table(
        {
            "city": pa.array(city.tolist(), mask=rng.random(rows) < 0.05),
            "bought": np.where(rng.random(rows) < chance, "yes", "no").tolist(),
            "tier": pa.array(np.array(TIERS)[tier].tolist(), mask=rng.random(rows) < 0.05),
            "w": rng.random(rows) * np.exp(rng.normal(0, 3, rows)),
        }
    )


def categories_of(bins: mb.BinningResult, name: str = "city") -> tuple[str, ...]:
    return next(variable.categories for variable in bins.variables if variable.name == name)


def rates_of(table: pa.Table, target: str, event: str) -> list[str]:
    """The cities by the share that the event has of their weight, worked out without the package."""
    frame = table.to_pandas().dropna(subset=["city", target])
    events = frame["w"].where(frame[target] == event, 0.0)
    return (events.groupby(frame["city"]).sum() / frame["w"].groupby(frame["city"]).sum()).sort_values().index.tolist()


@pytest.mark.parametrize("seed", range(5))
def test_categories_ascend_by_the_rate_of_the_second_category(seed):
    table = make_cities(seed)

    bins = mb.supervised_bins(table, "bought", weight="w", attributes=["city"])

    assert list(categories_of(bins)) == rates_of(table, "bought", "yes")
    assert (bins["city"].variable.category_order, bins["city"].variable.order_target) == ("rate", "bought")
    rates = bins["city"].categories_to_pandas()["rate"][:5]
    assert rates.is_monotonic_increasing
    assert np.all(np.diff(bins["city"].rates) > 0)


def test_categories_follow_the_first_principal_direction_of_several_rates():
    table = make_cities()
    bins = mb.supervised_bins(table, "tier", weight="w", attributes=["city"])

    frame = table.to_pandas().dropna()
    weights = frame.pivot_table(index="city", columns="tier", values="w", aggfunc="sum").to_numpy()
    shares = weights / weights.sum(axis=1, keepdims=True)
    centred = shares - weights.sum(axis=0) / weights.sum()
    direction = np.linalg.eigh(centred.T @ (centred * weights.sum(axis=1, keepdims=True)))[1][:, -1]
    by_position = np.array(sorted(RATES))[np.argsort(shares @ direction * np.sign(direction[-1]))]
    assert abs(direction[-1]) > 0.1 * np.abs(direction).max()
    assert list(categories_of(bins)) == by_position.tolist()


def forms(table: pa.Table) -> dict[str, object]:
    return {
        "pandas": table.to_pandas(),
        "unordered categorical": table.to_pandas().astype({"city": "category"}),
        "polars": pl.from_arrow(table),
        "reader": table.to_reader(max_chunksize=37),
        "backwards": table.take(np.arange(table.num_rows)[::-1]),
        "relation": duckdb.from_arrow(table),
    }


@pytest.mark.parametrize("target", ["bought", "tier"])
@pytest.mark.parametrize("weight", [None, "w"])
def test_order_and_bins_depend_neither_on_the_form_of_the_data_nor_on_the_host(target, weight, tmp_path, mcbin):
    table = make_cities()
    expected = figures(mb.supervised_bins(table, target, weight=weight))
    expected["data"]["name"] = None

    for name, data in forms(table).items():
        reduces = ["rows", "engine"] if name == "relation" else [None]
        for reduce in reduces:
            assert figures(mb.supervised_bins(data, target, weight=weight, reduce=reduce)) == expected, (name, reduce)
    path = tmp_path / "cities.csv"
    table.to_pandas().to_csv(path, index=False)
    command = [mcbin, "supervised", path, "--target", target, "--format", "json"]
    printed = subprocess.run(command + (["--weight", weight] if weight else []), capture_output=True, check=True).stdout
    document = json.loads(printed)
    assert document["variables"] == [
        # A file of text has no types, and so no kinds of values.
        {**variable, "value_kind": None}
        for variable in expected["variables"]
    ]
    assert document["results"] == expected["results"]


def test_order_is_chosen_by_the_user():
    table = make_cities()
    own = ["Essen", "Bonn", "Aachen", "Ulm", "Cologne", "Dresden"]
    sizes = pd.DataFrame({"city": pd.Categorical(table["city"].to_pylist(), own, ordered=True)})
    sizes["bought"] = table["bought"].to_pandas()
    cases = [
        (table, "text", sorted(RATES), "text"),
        (table, {"city": own}, own, "declared"),
        (table.to_reader(), {"city": own}, own, "declared"),
        (duckdb.from_arrow(table), {"city": own}, own, "declared"),
        (sizes, "rate", [name for name in own if name != "Ulm"], "declared"),
    ]
    for data, order, expected, kind in cases:
        for reduce in ["rows", "engine"] if isinstance(data, duckdb.DuckDBPyRelation) else ["rows"]:
            bins = mb.supervised_bins(data, "bought", ["city"], category_order=order, reduce=reduce)
            assert list(categories_of(bins)) == expected
            assert bins["city"].variable.category_order == kind
    bins = mb.equal_frequency_bins(table, ["city"], n_bins=2)
    assert list(categories_of(bins)) == sorted(RATES) and bins["city"].variable.category_order == "text"
    assert list(categories_of(mb.equal_frequency_bins(table, ["city"], category_order={"city": own}))) == own


def test_orders_that_can_not_be_used_are_refused():
    table = make_cities()
    cases = [
        ("rates", ValueError, "must be 'rate', 'text' or a dict by column, not 'rates'"),
        ({"city": ["Bonn", "Bonn"]}, mb.DataError, "names one of them twice"),
        ({"city": sorted(RATES)[1:]}, mb.DataError, "lacks 'Aachen'"),
        ({"w": ["1"]}, mb.DataError, "only the categories of a column of text"),
        ({"town": ["Bonn"]}, mb.DataError, "no such column"),
    ]
    for order, error, words in cases:
        with pytest.raises(error, match=words):
            mb.supervised_bins(table, "bought", category_order=order)


def test_of_several_targets_the_first_one_orders_and_a_target_keeps_its_order():
    table = make_cities()
    pairs = [("city", "bought"), ("city", "tier"), ("bought", "tier"), ("tier", "city")]

    bins = mb.supervised_bins(table, pairs=pairs, weight="w")
    assert categories_of(bins) == tuple(sorted(RATES)), "it is a target, too"
    bins = mb.supervised_bins(table, pairs=pairs[:3], weight="w")
    assert list(categories_of(bins)) == rates_of(table, "bought", "yes")
    assert categories_of(bins, "bought") == ("no", "yes")
    engine = mb.supervised_bins(duckdb.from_arrow(table), pairs=pairs[:3], weight="w", reduce="engine")
    assert figures(engine) == figures(bins)


def test_columns_that_can_not_be_categories_are_left_out_with_the_reason():
    n = 600
    table = pa.table(
        {
            "good": [f"g{i % 120}" for i in range(n)],  # five records for each
            "few": [f"f{i % 121}" for i in range(n)],
            "id": [f"i{i}" for i in range(n)],
            "one": ["same"] * n,
            "none": pa.array([None] * n, pa.utf8()),
            "mostly": [str(i % 5) if i % 2 else "none" for i in range(n)],
            "gone": ["x", "missing"] * (n // 2),
            "y": [i % 120 < 60 for i in range(n)],
        }
    )
    missing = {"gone": "missing"}
    expected = {
        "few": "text: 121 categories in 600 records",
        "id": "text: more than 256 categories",
        "one": "text: a single category",
        "none": "text: no category",
        "mostly": "text: text among numbers",
        "gone": "text: a single category",
    }
    for data, reduce in [
        (table, None),
        (table.to_reader(max_chunksize=50), None),
        (duckdb.from_arrow(table), "engine"),
    ]:
        bins = mb.supervised_bins(data, "y", missing=missing, reduce=reduce)
        assert bins.left_out == expected and list(bins) == ["good"]
        assert bins["good"].gain == 1.0
    assert len(mb.supervised_bins(table, "y", ["few"])["few"].variable.categories) == 121, "it is named"
    with pytest.raises(mb.DataError, match=r"column 'id'.*more than 256 categories"):
        mb.supervised_bins(table, "y", ["id"])
    with pytest.raises(mb.DataError, match=r"nothing to bin.*'id' \(text: more than 256 categories\)"):
        mb.supervised_bins(table.select(["id", "y"]), "y")


def test_each_category_is_told_with_its_figures():
    table = make_cities()
    found = mb.supervised_bins(table, "bought", attributes=["city"])["city"]
    again = mb.BinningResult.from_json(mb.supervised_bins(table, "bought", attributes=["city"]).to_json())["city"]

    frame = found.categories_to_pandas()
    assert frame["category"].tolist()[:5] == list(found.variable.categories)
    counts = table.to_pandas().groupby(["city", "bought"]).size().unstack()
    assert frame["weight[yes]"][:5].tolist() == counts.loc[frame["category"][:5], "yes"].tolist()
    by_bin = frame[:5].groupby("bin")[["weight", "weight[no]", "weight[yes]"]].sum()
    assert by_bin["weight[yes]"].tolist() == found.target_weights[:, 1].tolist()
    assert frame["weight"].iloc[-1] == found.to_pandas()["weight"].iloc[-1] == 1000
    row = frame.iloc[0]
    p, q = (row[f"weight[{name}]"] / (table["bought"].to_pylist().count(name)) for name in ("yes", "no"))
    assert row["woe"] == pytest.approx(np.log(p / q)) and row["iv"] == pytest.approx((p - q) * np.log(p / q))
    pd.testing.assert_frame_equal(again.categories_to_pandas(), frame)
    assert mb.supervised_bins(table, "bought", ["w"])["w"].categories_to_pandas().empty


@pytest.mark.parametrize("target", ["bought", "tier", None])
def test_rare_categories_are_one_to_which_unseen_ones_belong_in_every_host(target, tmp_path, mcbin):
    rng = np.random.default_rng(5)
    table = make_cities()
    names = [f"village {i}" if rng.random() < 0.1 else city for i, city in enumerate(table["city"].to_pylist())]
    table = table.set_column(0, "city", pa.array(names))
    frame = table.to_pandas()

    def run(data, reduce=None, order="rate"):
        if target is None:
            return mb.equal_frequency_bins(data, ["city"], "w", rare=0.01, n_bins=3, reduce=reduce)
        return mb.supervised_bins(data, target, ["city"], "w", rare=0.01, category_order=order, reduce=reduce)

    bins = run(table)
    found = bins["city"]
    is_counted = frame["w"].notna() if target is None else frame[target].notna()
    weights = frame["w"].where(is_counted, 0.0).groupby(frame["city"]).sum()
    rare = sorted(weights.index[weights < 0.01 * weights.sum()])
    assert found.variable.rare == tuple(rare) and len(rare) > 50
    kept = {*weights.index} - {*rare} | {"(rare)"}
    assert {*found.variable.categories} == kept and found.variable.categories[found.variable.rare_code] == "(rare)"
    assert figures(run(duckdb.from_arrow(table), "engine")) == figures(bins) == figures(run(table.to_reader()))

    news = pd.DataFrame({"city": ["Atlantis", rare[0], "(rare)", None, "Bonn", "Essen"]})
    bin_of_rare = found.bin_numbers(np.array([float(found.variable.rare_code)]))[0]
    for result in (bins, mb.BinningResult.from_json(bins.to_json())):
        placed = result.transform(news)["city_bin"]
        assert placed[:4].tolist() == [bin_of_rare] * 3 + [pd.NA]
        sql = duckdb.sql(result.to_sql("duckdb", table="news")).fetchall()
        assert [row[-1] for row in sql] == [None if number is pd.NA else number for number in placed.tolist()]
    bins.to_json(tmp_path / "bins.json")
    news.to_csv(tmp_path / "news.csv", index=False)
    applied = subprocess.run([mcbin, "apply", "bins.json", "news.csv"], cwd=tmp_path, capture_output=True, check=True)
    assert [row.rsplit(",", 1)[1] for row in applied.stdout.decode().splitlines()[1:]] == [
        "" if number is pd.NA else str(number) for number in placed.tolist()
    ]
    if target is not None:
        assert run(table, order="text")["city"].variable.categories == tuple(sorted(kept))

    frame.to_csv(tmp_path / "data.csv", index=False)
    command = [mcbin, *(["equal-frequency", "--n-bins", "3"] if target is None else ["supervised", "--target", target])]
    options = ["data.csv", "--attributes", "city", "--weight", "w", "--rare", "0.01", "--format", "json"]
    printed = subprocess.run(command + options, cwd=tmp_path, capture_output=True, check=True).stdout
    document = json.loads(printed)
    assert document["results"] == figures(bins)["results"]
    assert document["variables"] == [{**variable, "value_kind": None} for variable in figures(bins)["variables"]]


def test_a_column_of_rare_categories_alone_is_left_out_or_refused():
    table = pa.table({"c": [f"c{i % 100}" for i in range(1000)], "x": range(1000), "y": [i < 500 for i in range(1000)]})

    for data, reduce in [(table, None), (table.to_reader(), None), (duckdb.from_arrow(table), "engine")]:
        bins = mb.supervised_bins(data, "y", rare=0.02, reduce=reduce)
        assert bins.left_out == {"c": "text: rare categories alone"} and list(bins) == ["x"]
    with pytest.raises(mb.DataError, match=r"column 'c'.*there is a single category, '\(rare\)'"):
        mb.supervised_bins(table, "y", ["c"], rare=0.02)
    with pytest.raises(ValueError, match="rare must be from 0 to 1, not 2"):
        mb.supervised_bins(table, "y", rare=2)
