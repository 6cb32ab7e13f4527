"""The transformers, as scikit-learn uses them."""

from __future__ import annotations

import pickle
import tracemalloc

import mcbinning as mb
import numpy as np
import pandas as pd
import polars as pl
import pyarrow as pa
import pytest
from sklearn.compose import ColumnTransformer
from sklearn.linear_model import LogisticRegression
from sklearn.pipeline import make_pipeline
from sklearn.utils.estimator_checks import parametrize_with_checks

WITH_GAP = np.array([[1.0], [2.0], [3.0], [11.0], [12.0], [13.0]] * 4)
TWO_CLASSES = np.array(["low"] * 3 + ["up"] * 3).repeat(1)[np.arange(24) % 6]

pytestmark = pytest.mark.filterwarnings("ignore::mcbinning.NoCutPointsWarning")


@pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")
@parametrize_with_checks(
    [mb.SupervisedBinner(), mb.SupervisedBinner(max_distinct=5, n_bins=4), mb.EqualFrequencyBinner()]
)
def test_keeps_the_rules_of_scikit_learn(estimator, check):
    check(estimator)


def test_cut_point_is_the_value_at_the_closed_side():
    right = mb.SupervisedBinner().fit(WITH_GAP, TWO_CLASSES)
    left = mb.SupervisedBinner(closed="left").fit(WITH_GAP, TWO_CLASSES)

    assert right.cut_points_[0].tolist() == [3.0]
    assert left.cut_points_[0].tolist() == [11.0]
    assert right.transform([[3.0], [3.1]]).tolist() == [[0.0], [1.0]]
    assert left.transform([[10.9], [11.0]]).tolist() == [[0.0], [1.0]]
    assert right.bin_tables_[0]["weight[low]"].tolist() == [12.0, 0.0, 12.0]
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

    assert table["weight"].tolist() == pytest.approx(
        [weights[TWO_CLASSES == "low"].sum(), weights[TWO_CLASSES == "up"].sum(), weights.sum()]
    )


def test_works_inside_a_pipeline_and_survives_pickling(mixed):
    columns = ColumnTransformer(
        [
            ("cut", mb.SupervisedBinner(encode="onehot"), ["x", "whole"]),
            ("split", mb.EqualFrequencyBinner(n_bins=4), ["single"]),
        ]
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
        (
            dict(X=WITH_GAP, y=TWO_CLASSES, sample_weight=[1.0] * 23 + [-1.0]),
            "'sample_weight', row 23: the weight is neg",
        ),
        (
            dict(X=WITH_GAP, y=TWO_CLASSES, sample_weight=[1.0] * 23 + [np.nan]),
            "'sample_weight', row 23: the weight is NaN",
        ),
        (
            dict(X=pa.table({"x": WITH_GAP[:, 0]}).to_reader(), y=TWO_CLASSES[:-1]),
            "has at least 24 rows, but there are 23",
        ),
        (dict(X=np.arange(24).astype("m8[s]")[:, None], y=TWO_CLASSES), "column 'x0': .*duration"),
        (
            dict(X=WITH_GAP, y=TWO_CLASSES, sample_weight=[1.0] * 23 + [pd.NA]),
            "'sample_weight', row 23: the weight is NaN",
        ),
    ],
)
def test_bad_data_are_refused_with_column_and_row(arguments, message):
    with pytest.raises(ValueError, match=message):
        mb.SupervisedBinner().fit(**arguments)


@pytest.mark.parametrize("unit", ["Y", "M", "W", "D", "h", "m", "s", "ms", "us", "ns"])
def test_a_matrix_of_dates_is_cut_at_dates_and_nat_is_missing(unit):
    stamps = np.array(["2010", "2011", "2012", "2020", "2021", "2022", "NaT"] * 4, f"M8[{unit}]")
    binner = mb.SupervisedBinner(encode="interval").fit(
        stamps[:, None], ["low"] * 3 + ["up"] * 4 + (["low"] * 3 + ["up"] * 4) * 3
    )

    assert binner.result_["x0"].labels[0].startswith("(-inf, 201") and len(binner.cut_points_[0]) == 1
    assert [label == "missing" for label in binner.transform(stamps[:7, None])[:, 0]] == [False] * 6 + [True]


@pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")
@pytest.mark.parametrize("form", [lambda rows: np.array(rows, dtype=object), list, pd.DataFrame])
def test_na_among_objects_is_missing(form):
    rows = [[value, 1.0] for value in [*WITH_GAP[:, 0], pd.NA, None]]
    binner = mb.SupervisedBinner().fit(form(rows), [*TWO_CLASSES, "up", "low"])

    assert binner.cut_points_[0].tolist() == [3.0]
    assert binner.transform(form(rows))[-2:, 0].tolist() == [2.0, 2.0]


def test_polars_output_in_words_is_text_even_with_missing_values():
    X = pl.DataFrame({"x": [None, *WITH_GAP[:, 0]]})  # polars takes the first value for the type of all
    for missing in ("keep", "code"):
        binner = mb.SupervisedBinner(encode="interval", missing=missing).set_output(transform="polars")
        out = binner.fit(X.lazy(), ["up", *TWO_CLASSES]).transform(X)
        assert out.schema == {"x": pl.String}
        assert out["x"].to_list()[:2] == ["missing" if missing == "code" else None, "(-inf, 3]"]


@pytest.mark.parametrize(
    ("y", "kind"),
    [([1, 2] * 12, "integer"), ([0.5, 2.0] * 12, "float"), ([True, False] * 12, "boolean"), (["a", "b"] * 12, "text")],
)
@pytest.mark.filterwarnings("ignore::mcbinning.BinningWarning")
def test_json_of_a_fitted_binner_has_its_classes_as_they_are(y, kind):
    result = mb.SupervisedBinner().fit(WITH_GAP, y).result_
    again = mb.BinningResult.from_json(result.to_json())

    assert again["x0"].target.kind == kind
    assert again["x0"].target.category_names() == result["x0"].target.category_names() == sorted(set(y))


@pytest.mark.parametrize(
    "parameters",
    [
        {"closed": "both"},
        {"encode": "x"},
        {"missing": "x"},
        {"n_bins": 1},
        {"n_bins": 2.5},
        {"max_distinct": 0},
        {"small_bin_ratio": 2},
    ],
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


@pytest.fixture
def loans() -> tuple[pd.DataFrame, pd.Series]:
    rng = np.random.default_rng(3)
    X = pd.DataFrame({"age": rng.integers(18, 80, 2000).astype(float), "size": rng.normal(size=2000)})
    y = pd.Series(np.where(X["age"] + 15 * rng.normal(size=2000) > 45, "repaid", "lost"))
    X.loc[::11, "age"] = np.nan
    return X, y


@pytest.mark.parametrize("encode", ["woe", "rate"])
def test_evidence_stands_for_bins_missing_and_new_values(loans, encode):
    X, y = loans
    binner = mb.SupervisedBinner(encode=encode).fit(X, y)

    found = binner.result_["age"]
    column = binner.transform(X)[:, 0]
    figures = found.woe if encode == "woe" else found.rates
    bins = found.bin_numbers(X["age"].to_numpy())
    seen = bins < found.n_bins
    assert (column[seen] == figures[bins[seen]]).all()
    assert set(column[~seen]) == {found.missing.woe if encode == "woe" else found.missing.rate}
    neutral = binner.transform(pd.DataFrame({"age": [30.0], "size": [np.nan]}))[0, 1]
    assert neutral == (0.0 if encode == "woe" else (y == "repaid").mean())
    assert binner.get_feature_names_out().tolist() == ["age", "size"]
    kept = mb.SupervisedBinner(encode=encode, missing="keep").fit_transform(X, y)
    assert np.isnan(kept[::11, 0]).all() and (kept[1::11, 0] == column[1::11]).all()


@pytest.mark.parametrize("missing", ["code", "keep"])
@pytest.mark.parametrize("drop", [None, "first"])
def test_indicators_are_sparse_whole_or_without_the_first(loans, missing, drop):
    X, y = loans
    if missing == "keep":
        X = X.fillna(30.0)
    dense = mb.SupervisedBinner(encode="onehot", missing=missing, drop=drop).fit(X, y)
    whole = mb.SupervisedBinner(encode="onehot", missing=missing, drop=drop, sparse_output=True).fit(X, y)

    indicators = dense.transform(X)
    assert (whole.transform(X).toarray() == indicators).all()
    assert indicators.shape[1] == len(dense.get_feature_names_out())
    assert indicators.sum() < len(X) * 2 if drop else indicators.sum() == len(X) * 2
    for binner in (dense, whole):
        again = binner.inverse_transform(binner.transform(X))
        assert (binner.transform(pd.DataFrame(again, columns=X.columns)) != binner.transform(X)).sum() == 0


@pytest.mark.parametrize("options", [{}, {"dtype": "int8"}, {"missing": "keep"}, {"encode": "interval"}])
def test_bins_lead_back_to_values_that_they_hold(loans, options):
    X, y = loans
    binner = mb.SupervisedBinner(**options).fit(X, y)

    written = binner.transform(X)
    back = binner.inverse_transform(written)
    assert (np.isnan(back) == X.isna().to_numpy()).all()
    again = binner.transform(pd.DataFrame(back, columns=X.columns))
    assert pd.DataFrame(again).equals(pd.DataFrame(written))
    if "dtype" in options:
        assert written.dtype == np.int8


@pytest.mark.parametrize(
    ("options", "words"),
    [
        ({"encode": "woe", "dtype": int}, "dtype must be of floats"),
        ({"missing": "keep", "dtype": "int32"}, "dtype must be of floats"),
        ({"dtype": "U4"}, "dtype must be one of numbers"),
        ({"drop": "first"}, "are for encode='onehot'"),
        ({"encode": "onehot", "drop": "last"}, "drop must be 'first'"),
    ],
)
def test_forms_that_can_not_be_are_refused(loans, options, words):
    with pytest.raises(ValueError, match=words):
        mb.SupervisedBinner(**options).fit(*loans)


def test_evidence_needs_two_classes_and_has_no_way_back(loans, iris):
    with pytest.raises(ValueError, match="for two classes, and there are 3"):
        mb.SupervisedBinner(encode="woe").fit(iris.drop(columns="species"), iris["species"])
    with pytest.raises(ValueError, match="does not look at"):
        mb.EqualFrequencyBinner(encode="rate").fit(loans[0])
    binner = mb.SupervisedBinner(encode="woe").fit(*loans)
    with pytest.raises(ValueError, match="no way back"):
        binner.inverse_transform(binner.transform(loans[0]))
    with pytest.raises(ValueError, match="numbers from 0"):
        mb.SupervisedBinner().fit(*loans).inverse_transform([[99, 0]])
