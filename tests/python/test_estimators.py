"""The transformers, as scikit-learn uses them."""

from __future__ import annotations

import pickle
import tracemalloc

import numpy as np
import pandas as pd
import polars as pl
import pyarrow as pa
import pytest
from sklearn.compose import ColumnTransformer
from sklearn.linear_model import LogisticRegression
from sklearn.pipeline import make_pipeline
from sklearn.utils.estimator_checks import parametrize_with_checks

import mcbinning as mb

WITH_GAP = np.array([[1.0], [2.0], [3.0], [11.0], [12.0], [13.0]] * 4)
TWO_CLASSES = np.array(["low"] * 3 + ["up"] * 3).repeat(1)[np.arange(24) % 6]


@pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")
@parametrize_with_checks([mb.SupervisedBinner(), mb.SupervisedBinner(max_distinct=5, n_bins=4), mb.EqualFrequencyBinner()])
def test_keeps_the_rules_of_scikit_learn(estimator, check):
    check(estimator)


def test_cut_point_is_the_value_at_the_closed_side():
    right = mb.SupervisedBinner().fit(WITH_GAP, TWO_CLASSES)
    left = mb.SupervisedBinner(closed="left").fit(WITH_GAP, TWO_CLASSES)

    assert right.cut_points_[0].tolist() == [3.0]
    assert left.cut_points_[0].tolist() == [11.0]
    assert right.transform([[3.0], [3.1]]).tolist() == [[0.0], [1.0]]
    assert left.transform([[10.9], [11.0]]).tolist() == [[0.0], [1.0]]
    assert right.bin_tables_[0]["weight[low]"].tolist() == [12.0, 0.0]
    assert right.statuses_[0].ok


@pytest.mark.parametrize("encode", ["ordinal", "onehot", "interval"])
def test_missing_gets_a_code_of_its_own_or_stays_missing(encode):
    X = pd.DataFrame({"x": [*WITH_GAP[:, 0], np.nan]})
    y = [*TWO_CLASSES, "up"]
    as_code = mb.SupervisedBinner(encode=encode).fit(X, y).set_output(transform="pandas").transform(X)
    kept = mb.SupervisedBinner(encode=encode, missing="keep").fit(X, y).set_output(transform="pandas").transform(X)

    expected = {
        "ordinal": (["x"], [2.0], ["x"]),
        "interval": (["x"], ["missing"], ["x"]),
        "onehot": (["x_(-inf, 3]", "x_(3, +inf)", "x_missing"], [0.0, 0.0, 1.0], ["x_(-inf, 3]", "x_(3, +inf)"]),
    }[encode]
    assert list(as_code.columns) == expected[0]
    assert as_code.iloc[-1].tolist() == expected[1]
    assert list(kept.columns) == expected[2]
    assert kept.iloc[-1].isna().all() and not kept.iloc[:-1].isna().any(axis=None)


def test_all_forms_of_the_data_give_the_same_bins(mixed):
    frame = mixed[["x", "whole", "single"]].assign(some=mixed["x"].where(mixed["whole"] % 7 > 0).astype("Float64"))
    table = pa.Table.from_pandas(frame)
    plain = frame.astype({"some": "float64"})
    forms = {
        "array": plain.to_numpy(),
        "array by columns": np.asfortranarray(plain.to_numpy()),
        "other byte order": plain.to_numpy().astype(plain.to_numpy().dtype.newbyteorder()),
        "reversed twice": plain.to_numpy()[::-1, ::-1].copy()[::-1, ::-1],
        "pandas with NA": frame,
        "polars": pl.from_arrow(table),
        "arrow": table,
        "arrow in pieces": pa.concat_tables([table.slice(0, 7), table.slice(7)]),
    }
    expected = mb.SupervisedBinner().fit(forms["array"], mixed["y"])

    for name, X in forms.items():
        fitted = mb.SupervisedBinner().fit(X, mixed["y"])
        for a, b in zip(expected.result_.bins, fitted.result_.bins):
            assert a.cut_points.tolist() == b.cut_points.tolist(), name
            assert a.target_weights.tolist() == b.target_weights.tolist(), name
            assert a.model_entropy == b.model_entropy, name
        assert np.array_equal(expected.transform(forms["array"]), np.asarray(fitted.transform(X))), name


def test_fractional_weights_are_used_as_they_are():
    weights = np.linspace(0.1, 0.9, len(WITH_GAP))
    table = mb.SupervisedBinner().fit(WITH_GAP, TWO_CLASSES, sample_weight=weights).bin_tables_[0]

    assert table["weight"].tolist() == pytest.approx([weights[TWO_CLASSES == "low"].sum(), weights[TWO_CLASSES == "up"].sum()])


def test_works_inside_a_pipeline_and_survives_pickling(mixed):
    columns = ColumnTransformer(
        [("cut", mb.SupervisedBinner(encode="onehot"), ["x", "whole"]), ("split", mb.EqualFrequencyBinner(n_bins=4), ["single"])]
    )
    model = make_pipeline(columns, LogisticRegression()).fit(mixed, mixed["y"])

    assert model.score(mixed, mixed["y"]) > 0.5
    assert np.array_equal(pickle.loads(pickle.dumps(model)).predict(mixed), model.predict(mixed))
    assert "split__single" in model[0].get_feature_names_out()


def test_polars_output_has_the_names_of_the_columns(mixed):
    X = pl.from_pandas(mixed[["x", "whole"]])
    out = mb.EqualFrequencyBinner(n_bins=3).set_output(transform="polars").fit(X).transform(X)

    assert isinstance(out, pl.DataFrame) and out.columns == ["x", "whole"]
    assert out["x"].value_counts()["count"].to_list() == [500, 500, 500]


@pytest.mark.parametrize(
    ("arguments", "message"),
    [
        (dict(X=WITH_GAP, y=["a"] * 24), "column 'y': there is one class, 'a'"),
        (dict(X=np.arange(300.0)[:, None], y=np.arange(300)), "column 'y': there are 300 categories, more than 256"),
        (dict(X=WITH_GAP, y=TWO_CLASSES[:-1]), "inconsistent numbers of samples"),
        (dict(X=WITH_GAP, y=[*TWO_CLASSES[:-1], None]), "column 'y', row 23: the target is missing"),
        (dict(X=WITH_GAP, y=[*[1.0, 2.0] * 11, 1.0, np.nan]), "column 'y', row 23: the target is missing"),
        (dict(X=pd.DataFrame(index=range(24)), y=TWO_CLASSES), "there are no columns"),
        (dict(X=pd.DataFrame({"x": []}), y=[]), "the data have no rows"),
        (dict(X=WITH_GAP, y=TWO_CLASSES, sample_weight=[1.0] * 23 + [-1.0]), "'sample_weight', row 23: the weight is neg"),
        (dict(X=WITH_GAP, y=TWO_CLASSES, sample_weight=[1.0] * 23 + [np.nan]), "'sample_weight', row 23: the weight is NaN"),
        (dict(X=pa.table({"x": WITH_GAP[:, 0]}).to_reader(), y=TWO_CLASSES[:-1]), "has at least 24 rows, but there are 23"),
        (dict(X=pd.DataFrame({"t": ["a", "b"] * 12}), y=TWO_CLASSES), "column 't': the column holds texts"),
    ],
)
def test_bad_data_are_refused_with_column_and_row(arguments, message):
    with pytest.raises(ValueError, match=message):
        mb.SupervisedBinner().fit(**arguments)


@pytest.mark.parametrize(
    "parameters", [{"closed": "both"}, {"encode": "x"}, {"missing": "x"}, {"n_bins": 1}, {"n_bins": 2.5}, {"max_distinct": 0}, {"small_bin_ratio": 2}]
)
def test_bad_parameters_are_refused_by_name(parameters):
    with pytest.raises(ValueError, match=next(iter(parameters))):
        mb.SupervisedBinner(**parameters).fit(WITH_GAP, TWO_CLASSES)


def test_the_array_is_read_where_it_lies():
    X = np.broadcast_to(np.arange(100_000.0)[:, None] % 50, (100_000, 40)).copy()
    y = np.arange(100_000) % 2
    tracemalloc.start()
    mb.SupervisedBinner().fit(X, y)
    peak = tracemalloc.get_traced_memory()[1]
    tracemalloc.stop()

    assert peak < X.nbytes / 4
