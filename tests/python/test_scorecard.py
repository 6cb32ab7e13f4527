"""Points for each bin, and what becomes of them in other forms."""

from __future__ import annotations

import json
import sqlite3

import duckdb
import mcbinning as mb
import numpy as np
import pandas as pd
import pytest
from sklearn.base import clone
from sklearn.linear_model import LogisticRegression

pytestmark = pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")


@pytest.fixture
def loans() -> pd.DataFrame:
    rng = np.random.default_rng(9)
    frame = pd.DataFrame(
        {
            "age": rng.integers(18, 80, 3000).astype(float),
            "debt": rng.lognormal(size=3000),
            "home": rng.choice(["owned", "rented", "with 'parents'"], 3000),
        }
    )
    risk = 1.5 * frame["debt"] - 0.06 * frame["age"] + 2 * (frame["home"] == "rented") + rng.normal(size=3000)
    frame["late"] = np.where(risk > 0.5, "yes", "no")
    frame.loc[::13, "age"] = np.nan
    return frame


@pytest.fixture
def bins(loans) -> mb.BinningResult:
    return mb.supervised_bins(loans, "late", ["age", "debt", "home"])


@pytest.mark.parametrize("rounded", [True, False])
@pytest.mark.parametrize("favoured", ["others", "event"])
def test_sql_gives_each_row_its_score_to_the_last_bit(loans, bins, rounded, favoured):
    card = mb.Scorecard(bins=bins, rounded=rounded, favoured=favoured).fit(loans, loans["late"])
    new = pd.concat([loans, loans.head(1).assign(age=np.nan, debt=np.nan, home="a tent")])

    score = card.score(new)
    assert duckdb.sql(card.to_sql("duckdb", "new")).df()["score"].tolist() == score.tolist()
    database = sqlite3.connect(":memory:")
    new.astype({"age": str, "debt": str}).replace("nan", "").to_sql("new", database, index=False)
    assert pd.read_sql(card.to_sql("sqlite", "new", cast=True), database)["score"].tolist() == score.tolist()
    assert card.to_sql("postgres").count("CASE") == 3 and "NaN" in card.to_sql("postgres")
    if rounded:
        assert (score == score.round()).all()
    late = np.corrcoef(score, np.append(loans["late"] == "yes", False))[0, 1]
    assert late > 0.4 if favoured == "event" else late < -0.4


def test_points_are_those_of_the_formula(loans, bins):
    card = mb.Scorecard(base_points=500, base_odds=20, pdo=40, rounded=False, bins=bins).fit(loans, loans["late"])

    others, event = card.predict_proba(loans).T
    evidence = bins.transform(loans, encode="woe")
    model = LogisticRegression(C=np.inf, max_iter=1000).fit(evidence.to_numpy(), loans["late"])
    assert event == pytest.approx(model.predict_proba(evidence.to_numpy())[:, 1])
    assert card.score(loans) == pytest.approx(500 + 40 * np.log2(others / event / 20))
    table = card.to_pandas()
    assert table["points"][0] == card.base_ and len(table) == 1 + sum(found.n_bins + 1 for found in bins.bins)
    assert table.query("attribute == 'age' and interval == 'missing'")["weight"].item() == bins["age"].missing.weight


def test_a_scorecard_makes_its_own_bins_and_takes_models(loans):
    X, y = loans[["age", "debt"]], (loans["late"] == "yes").astype(int)
    card = clone(mb.Scorecard(binner=mb.SupervisedBinner(closed="left"), model=LogisticRegression(C=1e-9))).fit(X, y)
    assert card.result_.settings.closed == "left" and card.classes_ == [0, 1]
    assert all(abs(points).max() <= 1 for points in card.points_), "a heavy penalty leaves nothing of the coefficients"
    assert (card.score(X.to_numpy()) == card.score(X)).all()

    weights = np.where(y == 1, 2.0, 1.0)
    weighted, twice = mb.Scorecard(rounded=False).fit(X, y, weights), mb.Scorecard(rounded=False)
    twice.fit(pd.concat([X, X[y == 1]]), pd.concat([y, y[y == 1]]))
    assert weighted.score(X) == pytest.approx(twice.score(X), rel=1e-4)


def test_files_keep_a_scorecard_to_the_last_bit(loans, bins, tmp_path):
    card = mb.Scorecard(rounded=False, bins=bins, pdo=33).fit(loans, loans["late"])
    again = mb.Scorecard.from_json(card.to_json(tmp_path / "card.json"))
    assert (mb.Scorecard.from_json(tmp_path / "card.json").score(loans) == card.score(loans)).all()
    assert (again.predict_proba(loans) == card.predict_proba(loans)).all()
    assert again.to_json() == card.to_json() and again.to_sql() == card.to_sql()
    loans.to_parquet(tmp_path / "loans.parquet")
    assert (card.score(tmp_path / "loans.parquet") == card.score(loans)).all()

    page = card.to_html(tmp_path / "card.html")
    assert "<script" not in page and "http" not in page and "rented" in page and "with 'parents'" in page
    document = json.loads(card.to_json())
    for spoiled, words in (
        ({**document, "schema": "other"}, "not a scorecard"),
        ({**document, "schema_version": 2}, "version 2"),
        ({**document, "attributes": []}, "points for each bin"),
        ({key: document[key] for key in document if key != "base"}, "damaged"),
    ):
        with pytest.raises(ValueError, match=words):
            mb.Scorecard.from_json(json.dumps(spoiled))


def test_what_can_not_be_a_scorecard_is_refused(loans, bins, iris):
    for options, words in (
        ({"pdo": 0}, "above 0"),
        ({"base_odds": -1}, "above 0"),
        ({"base_points": np.inf}, "finite"),
        ({"favoured": "good"}, "favoured must be"),
        ({"bins": bins, "binner": mb.SupervisedBinner()}, "binner can't be given"),
    ):
        with pytest.raises(ValueError, match=words):
            mb.Scorecard(**options).fit(loans, loans["late"])
    with pytest.raises(ValueError, match="both classes"):
        mb.Scorecard(bins=bins).fit(loans, ["no"] * 3000)
    with pytest.raises(ValueError, match="two classes"):
        mb.Scorecard().fit(iris.drop(columns="species"), iris["species"])
    sharp = pd.DataFrame({"x": range(20)})
    unsmoothed = mb.supervised_bins(sharp.assign(y=sharp["x"] > 9), "y", ["x"], smoothing=0.0)
    with pytest.raises(ValueError, match="infinite"):
        mb.Scorecard(bins=unsmoothed).fit(sharp, sharp["x"] > 9)
    card = mb.Scorecard(bins=bins).fit(loans, loans["late"])
    with pytest.raises(ValueError, match="a column for each of 3"):
        card.score([[1.0]])
    with pytest.raises(mb.DataError, match="debt"):
        card.score(loans.drop(columns="debt"))
