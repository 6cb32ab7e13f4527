"""The binners as scikit-learn's transformers."""

from __future__ import annotations

import os
from collections.abc import Sequence
from typing import Any

import numpy as np
import numpy.typing as npt
import pandas as pd
import pyarrow as pa
from sklearn.base import BaseEstimator, TransformerMixin
from sklearn.utils import Tags, check_array, column_or_1d
from sklearn.utils._set_output import _get_output_config
from sklearn.utils.validation import _check_feature_names_in, check_consistent_length, check_is_fitted, validate_data

from . import _core
from ._errors import BinningError, DataError
from ._opening import is_table, open_source
from ._outcome import make_result
from ._outputs import Form, centres
from ._plan import check_categories, check_order, name_orders, named_in
from ._progress import Progress, reporting
from ._result import BinningResult
from ._settings import check_settings, check_share, directory_of
from ._sources import Column, Source
from ._transform import add_variable
from ._types import CategoryOrder, Closed, Drop, Encode, MissingOutput, Rounding, Unseen
from ._values import Floats

_ALL_ROWS = 2**62
_MOST_CATEGORIES = 256


class _Binner(TransformerMixin, BaseEstimator):  # type: ignore[misc]
    """What the two binners share: reading `X`, and the use of the fitted bins."""

    n_bins: int
    closed: Closed
    encode: Encode
    missing: MissingOutput
    dtype: Any
    sparse_output: bool
    drop: Drop | None
    rounding: Rounding
    temp_dir: str | os.PathLike[str] | None
    progress: Progress

    unseen: Unseen = "error"
    _cuts_categories = False
    """Whether features of text are cut between sets of their categories."""

    result_: BinningResult
    n_features_in_: int

    def transform(self, X: Any) -> Any:
        """The bins of `X`, in the form that `encode` names."""
        check_is_fitted(self)
        columns = self._read_columns(X)
        codes = [found.bin_numbers(values) for found, values in zip(self.result_.bins, columns)]
        written = self._form.write(codes, self.result_.bins)
        if self.encode == "interval" and _get_output_config("transform", self)["dense"] == "polars":
            return _as_texts(written, self.get_feature_names_out())
        return written

    def inverse_transform(self, X: Any) -> Floats:
        """A value for each bin that `transform` has given: the middle of the bin, of which an outer one ends with the
        least or the largest value that `fit` saw; NaN for a missing value. There is no way back from `encode="woe"` and
        `"rate"`."""
        check_is_fitted(self)
        codes = self._form.read(X, self.result_.bins)
        return np.column_stack([centres(found)[column] for found, column in zip(self.result_.bins, codes)])

    def get_feature_names_out(self, input_features: Any = None) -> npt.NDArray[np.object_]:
        """The names of the input, or with `encode="onehot"` a name for each bin of each."""
        check_is_fitted(self)
        return self._form.names(_check_feature_names_in(self, input_features), self.result_.bins)

    @property
    def _form(self) -> Form:
        return Form(self.encode, self.missing, self.dtype, self.sparse_output, self.drop)

    def __sklearn_tags__(self) -> Tags:
        tags = super().__sklearn_tags__()
        tags.input_tags.allow_nan = True
        return tags

    def _fit(self, X: Any, codes: npt.NDArray[np.uint8] | None, classes: npt.NDArray[Any], sample_weight: Any) -> None:
        self._form.check()
        feed, columns, rows = self._open(X, reset=True)
        if rows == 0:
            raise DataError("the data have no rows")
        names = [column.name for column in columns]
        if codes is not None:
            if rows is not None:
                check_consistent_length(np.empty(rows), codes)
            feed.add_field("y", "code", array=codes)
            _name_classes(feed, len(names), classes)
            names = [*names, "y"]
        if sample_weight is not None:
            array = _check_weights(sample_weight, rows)
            feed.add_field("sample_weight", "weight", array=array, rounding=self.rounding)
            names = [*names, "sample_weight"]
        self._code_categories(feed, columns)
        with reporting(self.progress, names, self.n_features_in_, rows) as report:
            bins = self._run(feed, list(range(self.n_features_in_)), report)
        self.result_ = make_result(bins, stacklevel=4)
        for found in self.result_.bins:
            if found.status.is_error:
                raise BinningError(found.status, f"attribute {found.attribute!r}: {found.status}")
        self.cut_points_ = [found.cut_points for found in self.result_.bins]
        self.bin_tables_ = [found.to_pandas() for found in self.result_.bins]
        self.statuses_ = [found.status for found in self.result_.bins]

    def _code_categories(self, feed: _core.Feed, columns: Sequence[Column]) -> None:
        """Gives the categories of the features their codes, in the order in which they are cut."""

    def _run(self, feed: _core.Feed, attributes: list[int], report: Any) -> _core.Bins:
        raise NotImplementedError

    def _open(self, X: Any, reset: bool) -> tuple[_core.Feed, Sequence[Column], int | None]:
        """A feed of the columns of `X`, read where they lie; what they are; and how many rows there are, if that is
        known."""
        if is_table(X):
            return self._open_table(X, reset)
        X = self._check(X, reset)
        if X.dtype.kind in "mM":
            return self._open_times(X, reset)
        feed = _core.Feed(None)
        names = self._names(X)
        for i, name in enumerate(names):
            feed.add_field(name, "attribute", array=X[:, i])
        return feed, [Column(name, "float") for name in names], X.shape[0]

    def _names(self, X: npt.NDArray[Any]) -> list[str]:
        return list(map(str, getattr(self, "feature_names_in_", [f"x{i}" for i in range(X.shape[1])])))

    def _check(self, X: Any, reset: bool) -> npt.NDArray[Any]:
        X = _with_nan(X)
        array: npt.NDArray[Any] = validate_data(self, X, reset=reset, dtype="numeric", ensure_all_finite=False)
        if array.dtype.kind in "mM":
            return array
        # Numbers of 128 bits or in the other byte order are the only ones that the feed can't read where they lie.
        return array if array.dtype.itemsize <= 8 and array.dtype.isnative else array.astype(np.float64)

    def _open_times(self, X: npt.NDArray[Any], reset: bool) -> tuple[_core.Feed, Sequence[Column], int | None]:
        # Of the units Arrow has days and those from the second down.
        if X.dtype.kind == "M" and np.datetime_data(X.dtype)[0] in ("Y", "M", "W", "h", "m"):
            X = X.astype("M8[s]")
        columns = [pa.array(np.ascontiguousarray(X[:, i])) for i in range(X.shape[1])]
        return self._feed_table(open_source(pa.Table.from_arrays(columns, names=self._names(X))), reset)

    def _open_table(self, X: Any, reset: bool) -> tuple[_core.Feed, Sequence[Column], int | None]:
        source = open_source(X)
        named = X if isinstance(X, pd.DataFrame) else pd.DataFrame(columns=[column.name for column in source.columns])
        validate_data(self, named, reset=reset, skip_check_array=True)
        if not source.columns:
            raise DataError("there are no columns")
        return self._feed_table(source, reset)

    def _feed_table(self, source: Source, reset: bool) -> tuple[_core.Feed, Sequence[Column], int | None]:
        table = source.open(None)
        feed = _core.Feed(table)
        for i, column in enumerate(source.columns):
            if column.is_ordered and column.kind != "text":
                raise DataError("the column holds ordered categories, not numbers", column.name)
            if not reset and self.result_.bins[i].variable.is_categorical:
                add_variable(feed, table, self.result_.bins[i].variable, column.name, [], self.unseen)
                continue
            is_category = reset and self._cuts_categories and column.kind == "text"
            feed.add_field(column.name, "category" if is_category else "attribute", column=i)
        return feed, source.columns, source.rows

    def _read_columns(self, X: Any) -> Sequence[Floats]:
        if is_table(X):
            return self._open_table(X, reset=False)[0].read(_ALL_ROWS)
        X = self._check(X, reset=False)
        for found in self.result_.bins:
            if found.variable.is_categorical:
                raise DataError("the column held texts in fit, so a table has to give it", found.attribute)
        if X.dtype.kind in "mM":
            return self._open_times(X, reset=False)[0].read(_ALL_ROWS)
        return list(X.T)


class SupervisedBinner(_Binner):
    """Cuts each feature where that best separates the categories of `y`, by entropy and description length. Those that
    are columns of text in a table are cut between sets of their categories, of which there are from 2 to 256.

    Parameters
    ----------
    category_order : {"rate", "text"} or dict, default="rate"
        In which order the categories of a feature are cut that have none of their own, as those of an ordered
        categorical have. "rate": by the share of the second class, or with several along the first principal direction
        of their shares. "text": by their bytes. A dict tells by column all categories in their order; the others follow
        their rate.
    rare : float, default=0.0
        Categories with less than this share of the weight, 0 to 1, that have no order of their own become one,
        "(rare)", to which `transform` counts categories that were never seen, too.
    unseen : {"error", "missing"}, default="error"
        What a category is to `transform` that `fit` has not seen, where there are no rare ones: a `DataError`, or
        missing.
    max_distinct : int, default=None
        A feature with more distinct values than this, at least 1, is pre-binned into `n_bins` bins of equal frequency,
        between which it is then cut. None: never.
    n_bins : int, default=1000
        The number of those pre-bins, at least 2.
    closed : {"right", "left"}, default="right"
        The side of a bin that belongs to it: (a, b] or [a, b).
    small_bin_ratio : float, default=0.0
        An inner bin whose weight is below this share, 0 to 1, of its lighter neighbour's is merged away.
    smoothing : float, default=0.5
        What is added to the weights of a bin's events and others for the weight of evidence, where one of them is 0.
    encode : {"ordinal", "onehot", "interval", "woe", "rate"}, default="ordinal"
        What `transform` gives: the number of the bin from 0, a column of 0 and 1 for each bin, or the bin in words;
        or its weight of evidence or its rate of the second class, for two classes. A missing value has those of the
        missing rows of `fit`; without any, a weight of evidence of 0 and the rate of all rows.
    missing : {"code", "keep"}, default="code"
        Whether a missing value gets a code of its own, one past the last bin (a column of its own, or "missing"), or
        stays missing.
    dtype : dtype, default="float64"
        That of the numbers. Whole numbers have none for a missing value that is kept.
    sparse_output : bool, default=False
        With `encode="onehot"`: whether the columns come as a sparse matrix of scipy's.
    drop : {"first"}, default=None
        With `encode="onehot"`: "first" leaves out the first bin of each feature, which then has 0 in all columns, so
        that the columns are not collinear. None: no bin is left out.
    rounding : {"none", "truncate", "closest"}, default="none"
        Whether sample weights become whole numbers, and how. "none": they count with their fractions, on a grid on
        which every sum is exact.
    temp_dir : path, default=None
        The directory of the temporary files, 8 bytes for each row and feature. None: TMPDIR, else /tmp.
    progress : bool or callable, default=False
        Whether to show progress bars; or a function that is called with the phase, "records" or "attributes", and the
        number of records read or the index of the feature that is done.

    Attributes
    ----------
    cut_points_ : list of numpy.ndarray, by feature
    bin_tables_ : list of pandas.DataFrame, by feature
    statuses_ : list of Status, by feature
    result_ : BinningResult
    classes_ : numpy.ndarray
        The categories of `y`, in the order that an ordered categorical or an Enum declares, else in ascending order.
    n_features_in_ : int
    feature_names_in_ : numpy.ndarray, if `X` had names

    Raises
    ------
    DataError, BinningError, ValueError, TypeError
        By `fit` and `transform`, as by `supervised_bins`.

    Examples
    --------
    >>> import mcbinning as mb
    >>> binner = mb.SupervisedBinner(encode="interval")
    >>> ages = [[21], [22], [23], [24], [25], [26], [41], [42], [43], [44], [45], [46]]
    >>> binner.fit(ages, ["no"] * 6 + ["yes"] * 6).transform([[30], [20]]).tolist()
    [['(26, +inf)'], ['(-inf, 26]']]
    """

    _cuts_categories = True

    def __init__(
        self,
        *,
        category_order: CategoryOrder = "rate",
        rare: float = 0.0,
        unseen: Unseen = "error",
        max_distinct: int | None = None,
        n_bins: int = 1000,
        closed: Closed = "right",
        small_bin_ratio: float = 0.0,
        smoothing: float = 0.5,
        encode: Encode = "ordinal",
        missing: MissingOutput = "code",
        dtype: Any = "float64",
        sparse_output: bool = False,
        drop: Drop | None = None,
        rounding: Rounding = "none",
        temp_dir: str | os.PathLike[str] | None = None,
        progress: Progress = False,
    ) -> None:
        self.category_order = category_order
        self.rare = rare
        self.unseen = unseen
        self.max_distinct = max_distinct
        self.n_bins = n_bins
        self.closed = closed
        self.small_bin_ratio = small_bin_ratio
        self.smoothing = smoothing
        self.encode = encode
        self.missing = missing
        self.dtype = dtype
        self.sparse_output = sparse_output
        self.drop = drop
        self.rounding = rounding
        self.temp_dir = temp_dir
        self.progress = progress

    def fit(self, X: Any, y: Any, sample_weight: Any = None) -> SupervisedBinner:
        """Finds the cut points. `X` is an array, a frame, or any Arrow stream; weights may be fractional."""
        check_settings(
            self.closed,
            self.n_bins,
            self.max_distinct,
            self.small_bin_ratio,
            rounding=self.rounding,
            smoothing=self.smoothing,
        )
        check_share("rare", self.rare)
        if self.unseen not in ("error", "missing"):
            raise ValueError(f"unseen must be 'error' or 'missing', not {self.unseen!r}")
        if y is None:
            raise ValueError(f"{type(self).__name__} requires y to be passed, but the target y is None")
        self.classes_, codes = _code_target(y)
        if self.encode in ("woe", "rate") and len(self.classes_) != 2:
            raise ValueError(f"encode={self.encode!r} is for two classes, and there are {len(self.classes_)}")
        self._fit(X, codes, self.classes_, sample_weight)
        return self

    def __sklearn_tags__(self) -> Tags:
        tags = super().__sklearn_tags__()
        tags.target_tags.required = True
        return tags

    def _code_categories(self, feed: _core.Feed, columns: Sequence[Column]) -> None:
        order = name_orders(self.category_order)
        declared: Any = {} if isinstance(order, str) else order
        names = [column.name for column in columns]
        texts = [i for i, column in enumerate(columns) if column.kind == "text"]
        for name in named_in(order):
            if name not in names:
                raise DataError("there is no such column", name)
            if names.index(name) not in texts:
                raise DataError("only the categories of a column of text can be given an order", name)
        if not texts:
            return
        # The categories are known, and can be counted, only when all records have been read.
        feed.spool(directory_of(self.temp_dir))
        for i in texts:
            check_categories(names[i], feed.categories(i))
        by_rate = order != "text"
        unordered = [i for i in texts if names[i] not in declared and not columns[i].is_ordered]
        counted = feed.count_categories([(i, len(columns)) for i in unordered], rare=self.rare, by_rate=by_rate)
        for i, codes in zip(unordered, counted):
            check_categories(names[i], codes.names)
            kind, target = ("rate", "y") if by_rate else ("text", "")
            feed.set_codes(i, codes, rare=self.rare, order=kind, target=target)
        for i in set(texts) - set(unordered):
            given = declared.get(names[i], feed.categories(i))
            check_order(names[i], given, feed.categories(i))
            feed.set_codes(i, _core.CategoryCodes(list(map(str, given))), order="declared")

    def _run(self, feed: _core.Feed, attributes: list[int], report: Any) -> _core.Bins:
        return feed.bin(
            attributes,
            [len(attributes)] * len(attributes),
            target=len(attributes),
            n_bins=self.n_bins,
            max_distinct=self.max_distinct,
            small_bin_ratio=self.small_bin_ratio,
            smoothing=self.smoothing,
            right_closed=self.closed == "right",
            temp_dir=directory_of(self.temp_dir),
            progress=report,
        )


class EqualFrequencyBinner(_Binner):
    """Cuts each feature into bins of equal weight; fewer than asked for, where equal values stay together.

    Parameters
    ----------
    n_bins : int, default=10
        The number of bins, at least 2.
    closed : {"right", "left"}, default="right"
        The side of a bin that belongs to it: (a, b] or [a, b).
    encode : {"ordinal", "onehot", "interval"}, default="ordinal"
        What `transform` gives: the number of the bin from 0, a column of 0 and 1 for each bin, or the bin in words.
    missing : {"code", "keep"}, default="code"
        Whether a missing value gets a code of its own, one past the last bin (a column of its own, or "missing"), or
        stays missing.
    dtype : dtype, default="float64"
        That of the numbers. Whole numbers have none for a missing value that is kept.
    sparse_output : bool, default=False
        With `encode="onehot"`: whether the columns come as a sparse matrix of scipy's.
    drop : {"first"}, default=None
        With `encode="onehot"`: "first" leaves out the first bin of each feature, which then has 0 in all columns, so
        that the columns are not collinear. None: no bin is left out.
    rounding : {"none", "truncate", "closest"}, default="none"
        Whether sample weights become whole numbers, and how. "none": they count with their fractions, on a grid on
        which every sum is exact.
    temp_dir : path, default=None
        The directory of the temporary files, 8 bytes for each row and feature. None: TMPDIR, else /tmp.
    progress : bool or callable, default=False
        Whether to show progress bars; or a function that is called with the phase, "records" or "attributes", and the
        number of records read or the index of the feature that is done.

    Attributes
    ----------
    cut_points_ : list of numpy.ndarray, by feature
    bin_tables_ : list of pandas.DataFrame, by feature
    statuses_ : list of Status, by feature
    result_ : BinningResult
    n_features_in_ : int
    feature_names_in_ : numpy.ndarray, if `X` had names

    Raises
    ------
    DataError, BinningError, ValueError, TypeError
        By `fit` and `transform`, as by `equal_frequency_bins`.

    Examples
    --------
    >>> import mcbinning as mb
    >>> binner = mb.EqualFrequencyBinner(n_bins=2)
    >>> binner.fit([[1.0], [2.0], [3.0], [4.0]]).transform([[0.0], [float("nan")], [9.0]]).tolist()
    [[0.0], [2.0], [1.0]]
    """

    def __init__(
        self,
        *,
        n_bins: int = 10,
        closed: Closed = "right",
        encode: Encode = "ordinal",
        missing: MissingOutput = "code",
        dtype: Any = "float64",
        sparse_output: bool = False,
        drop: Drop | None = None,
        rounding: Rounding = "none",
        temp_dir: str | os.PathLike[str] | None = None,
        progress: Progress = False,
    ) -> None:
        self.n_bins = n_bins
        self.closed = closed
        self.encode = encode
        self.missing = missing
        self.dtype = dtype
        self.sparse_output = sparse_output
        self.drop = drop
        self.rounding = rounding
        self.temp_dir = temp_dir
        self.progress = progress

    def fit(self, X: Any, y: Any = None, sample_weight: Any = None) -> EqualFrequencyBinner:
        """Finds the cut points. `X` is an array, a frame, or any Arrow stream; weights may be fractional."""
        check_settings(self.closed, self.n_bins, rounding=self.rounding)
        if self.encode in ("woe", "rate"):
            raise ValueError(f"encode={self.encode!r} is of classes, which this binner does not look at")
        self._fit(X, None, np.empty(0), sample_weight)
        return self

    def _run(self, feed: _core.Feed, attributes: list[int], report: Any) -> _core.Bins:
        return feed.bin(
            attributes,
            n_bins=self.n_bins,
            right_closed=self.closed == "right",
            temp_dir=directory_of(self.temp_dir),
            progress=report,
        )


def _code_target(y: Any) -> tuple[npt.NDArray[Any], npt.NDArray[np.uint8]]:
    """The categories in the order that `y` declares or else in ascending order, and the code of each row."""
    declared = _declared_order(y)
    y = check_array(y, ensure_2d=False, dtype=None, ensure_all_finite="allow-nan", ensure_min_samples=0, input_name="y")
    y = column_or_1d(y, warn=True)
    codes, classes = pd.factorize(y, sort=declared is None)
    if declared is not None:
        order = np.argsort(declared.get_indexer(classes))
        codes = np.where(codes < 0, -1, np.argsort(order)[codes])
        classes = classes[order]
    if (codes < 0).any():
        raise DataError("the target is missing", "y", int((codes < 0).argmax()))
    if len(classes) > _MOST_CATEGORIES:
        raise DataError(f"there are {len(classes)} categories, more than 256", "y")
    if len(classes) == 1:
        raise DataError(f"there is one class, {classes.tolist()[0]!r}; at least 2 are needed", "y")
    return classes, codes.astype(np.uint8)


def _declared_order(y: Any) -> pd.Index | None:
    """The categories of an ordered categorical or an Enum."""
    kind: Any = getattr(y, "dtype", None)
    if isinstance(kind, pd.CategoricalDtype) and kind.ordered:
        return kind.categories
    if type(kind).__module__.partition(".")[0] == "polars" and type(kind).__name__ == "Enum":
        return pd.Index(kind.categories.to_list())
    return None


def _name_classes(feed: _core.Feed, index: int, classes: npt.NDArray[Any]) -> None:
    """Tells the categories of the target as numbers where they are, so that other readers of the result know them as
    such."""
    categories: Any = list(map(float if classes.dtype.kind in "biuf" else str, classes.tolist()))
    if len(set(categories)) < len(categories):
        raise DataError("two classes are the same as texts, or as doubles", "y")
    feed.set_categories(index, categories)
    if classes.dtype.kind == "b":
        feed.set_value_kind(index, "boolean")


def _with_nan(X: Any) -> Any:
    """An array of objects with NaN in the place of pandas' NA, which is no number to NumPy."""
    array = np.asarray(X, dtype=object) if isinstance(X, (list, tuple)) and _holds_na(X) else X
    if not isinstance(array, np.ndarray) or array.dtype != np.dtype(object):
        return X
    is_missing = pd.isna(array)
    return np.where(is_missing, np.nan, array) if is_missing.any() else X


def _holds_na(X: Any) -> bool:
    return any(value is pd.NA for row in X for value in (row if isinstance(row, (list, tuple)) else [row]))


def _as_texts(intervals: npt.NDArray[np.object_], names: npt.NDArray[np.object_]) -> Any:
    """A polars frame of texts. polars itself takes objects, among them a None, for objects."""
    import polars

    columns = {name: intervals[:, i].tolist() for i, name in enumerate(names)}
    return polars.DataFrame(columns, schema=dict.fromkeys(columns, polars.String))


def _check_weights(sample_weight: Any, rows: int | None) -> Floats:
    weights: Floats = check_array(
        _with_nan(sample_weight), ensure_2d=False, dtype=np.float64, ensure_all_finite=False, input_name="sample_weight"
    )
    if weights.ndim != 1:
        raise ValueError("Sample weights must be 1D array or scalar")
    if rows is not None and len(weights) != rows:
        raise ValueError(f"sample_weight has {len(weights)} values for {rows} rows")
    if not weights.any():
        raise ValueError("all weights are zero")
    return weights
