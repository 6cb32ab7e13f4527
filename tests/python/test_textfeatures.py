"""Features of text in scikit-learn's transformers: they have the bins that `supervised_bins` makes of their columns."""

from __future__ import annotations

import pickle

import mcbinning as mb
import numpy as np
import pandas as pd
import polars as pl
import pyarrow as pa
import pytest
from sklearn.base import clone
from sklearn.linear_model import LogisticRegression
from sklearn.model_selection import cross_val_score
from sklearn.pipeline import make_pipeline

pytestmark = pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")

RATES = {"Aachen": 0.9, "Bonn": 0.2, "Cologne": 0.3, "Dresden": 0.8, "Essen": 0.5}


@pytest.fixture
def people() -> pd.DataFrame:
    rng = np.random.default_rng(3)
    town = rng.choice(list(RATES), 800)
    frame = pd.DataFrame({"age": rng.integers(18, 80, 800), "town": town, "w": rng.random(800)})
    frame["y"] = np.where(rng.random(800) < frame["town"].map(RATES), "yes", "no")
    frame.loc[::31, "town"] = None
    frame.loc[5, "town"] = "Fulda"
    return frame


FORMS = {
    "pandas": lambda X: X,
    "objects": lambda X: X.astype({"town": object}),
    "categorical": lambda X: X.astype({"town": "category"}),
    "polars": pl.from_pandas,
    "a stream": lambda X: pa.Table.from_pandas(X).to_reader(),
}


@pytest.mark.parametrize("form", FORMS)
def test_every_table_has_the_bins_and_codes_that_the_function_gives(people, form):
    X, read = people[["town", "age"]], FORMS[form]
    bins = mb.supervised_bins(people, "y", ["town", "age"], "w")

    binner = mb.SupervisedBinner().fit(read(X), people["y"], sample_weight=people["w"])

    for name in X:
        assert binner.result_[name].to_pandas().equals(bins[name].to_pandas())
        assert binner.result_[name].gain == bins[name].gain
    assert binner.result_["town"].variable.categories == bins["town"].variable.categories
    codes = binner.transform(read(X))
    expected = bins.transform(X).fillna(bins["town"].n_bins).to_numpy(dtype=float)
    assert np.array_equal(codes, expected) and (codes[::31, 0] == bins["town"].n_bins).all()


@pytest.mark.parametrize(
    "settings",
    [
        {"category_order": "text"},
        {"category_order": {"town": ["Fulda", "Essen", "Dresden", "Bonn", "Cologne", "Aachen", "Gera"]}},
        {"rare": 0.05},
        {"rare": 0.05, "category_order": "text"},
    ],
    ids=str,
)
def test_settings_of_categories_are_those_of_the_function(people, settings):
    bins = mb.supervised_bins(people, "y", ["town"], **settings)

    binner = mb.SupervisedBinner(**settings).fit(people[["town"]], people["y"])

    found, expected = binner.result_["town"], bins["town"]
    assert found.to_pandas().equals(expected.to_pandas())
    assert found.variable == expected.variable


def test_an_ordered_categorical_keeps_its_order(people):
    order = ["Essen", "Aachen", "Bonn", "Dresden", "Cologne", "Fulda"]
    X = people[["town"]].astype({"town": pd.CategoricalDtype(order, ordered=True)})

    assert list(mb.SupervisedBinner().fit(X, people["y"]).result_["town"].variable.categories) == order


def test_three_classes_order_categories_as_the_function_does(people):
    people["y"] = np.where(people["age"] > 60, "old", people["y"])

    binner = mb.SupervisedBinner().fit(people[["town"]], people["y"])

    assert binner.result_["town"].to_pandas().equals(mb.supervised_bins(people, "y", ["town"])["town"].to_pandas())


def test_an_unseen_category_is_refused_missing_or_rare(people):
    X, new = people[["town"]], pd.DataFrame({"town": ["Gera", "Bonn", None]})
    fit = {
        settings: mb.SupervisedBinner(**dict(settings)).fit(X, people["y"])
        for settings in [(), (("unseen", "missing"),), (("rare", 0.05),)]
    }
    refusing, missing, rare = fit.values()

    with pytest.raises(mb.DataError, match="column 'town', row 0: the category 'Gera'"):
        refusing.transform(new)
    codes = missing.transform(new)[:, 0]
    assert codes[0] == codes[2] == missing.result_["town"].n_bins and codes[1] == 0
    # Fulda has one record, so it stands in the bin of the rare ones.
    codes = rare.transform(pd.DataFrame({"town": ["Gera", "Fulda", None]}))[:, 0]
    assert codes[0] == codes[1] < codes[2] == rare.result_["town"].n_bins


def test_text_goes_through_pipelines_folds_pickles_and_scorecards(people):
    X, y = people[["town", "age"]], people["y"] == "yes"
    model = make_pipeline(mb.SupervisedBinner(encode="woe", unseen="missing"), LogisticRegression())

    assert cross_val_score(model, X, y, scoring="roc_auc").mean() > 0.7
    binner = clone(model[0]).fit(X, y)
    assert np.array_equal(pickle.loads(pickle.dumps(binner)).transform(X), binner.transform(X))
    labels = mb.SupervisedBinner(encode="onehot").fit(X, y).get_feature_names_out()
    assert "town_{Dresden, Aachen}" in labels and "town_missing" in labels
    card = mb.Scorecard().fit(X, y)
    assert np.unique(card.score(X)).size > 3


@pytest.mark.parametrize(
    ("settings", "X", "message"),
    [
        ({}, {"t": ["a"] * 8}, "column 't': there is a single category, 'a'"),
        ({}, {"t": pd.Series([None] * 8, dtype=object).astype("string")}, "column 't': no row has a category"),
        ({"rare": 0.6}, {"t": ["a", "b"] * 4}, "column 't': there is a single category"),
        ({"category_order": {"t": ["a"]}}, {"t": ["a", "b"] * 4}, "the order of the categories lacks 'b'"),
        ({"category_order": {"t": ["a", "b", "a"]}}, {"t": ["a", "b"] * 4}, "names one of them twice"),
        ({"category_order": {"u": ["a"]}}, {"t": ["a", "b"] * 4}, "column 'u': there is no such column"),
        ({"category_order": {"t": ["1"]}}, {"t": range(8)}, "only the categories of a column of text"),
        ({"category_order": "size"}, {"t": ["a", "b"] * 4}, "category_order must be"),
        ({"rare": 1.5}, {"t": ["a", "b"] * 4}, "rare must be from 0 to 1"),
        ({"unseen": "kept"}, {"t": ["a", "b"] * 4}, "unseen must be"),
    ],
)
def test_bad_categories_and_settings_are_refused_by_name(settings, X, message):
    with pytest.raises(ValueError, match=message):
        mb.SupervisedBinner(**settings).fit(pd.DataFrame(X), ["no", "yes"] * 4)


@pytest.mark.filterwarnings("ignore:X does not have valid feature names")
def test_text_is_no_number_and_has_no_middle(people):
    binner = mb.SupervisedBinner().fit(people[["town"]], people["y"])

    with pytest.raises(mb.DataError, match="column 'town': the column held texts in fit"):
        binner.transform(np.zeros((2, 1)))
    with pytest.raises(mb.DataError, match="town"):
        binner.transform(pd.DataFrame({"town": [1.0, 2.0]}))
    with pytest.raises(ValueError, match="'town' are sets of categories"):
        binner.inverse_transform(binner.transform(people[["town"]]))
    with pytest.raises(mb.DataError, match="column 'town': the column holds texts"):
        mb.EqualFrequencyBinner().fit(people[["town"]])
