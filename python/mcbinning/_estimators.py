"""The binners as scikit-learn's transformers."""

from __future__ import annotations

import os
from collections.abc import Sequence
from typing import Any

import numpy as np
import numpy.typing as npt
import pandas as pd
from sklearn.base import BaseEstimator, TransformerMixin
from sklearn.utils import Tags, check_array, column_or_1d
from sklearn.utils.validation import _check_feature_names_in, check_consistent_length, check_is_fitted, validate_data

from . import _core
from ._errors import BinningError, DataError
from ._functions import check_settings, make_result
from ._progress import Progress, reporting
from ._result import BinningResult, Settings, Variable
from ._sources import Source, open_source
from ._values import Codes, Floats

_ALL_ROWS = 2**62
_MOST_CATEGORIES = 256


class _Binner(TransformerMixin, BaseEstimator):  # type: ignore[misc]
    """What the two binners share: reading `X`, and the use of the fitted bins."""

    n_bins: int
    closed: str
    encode: str
    missing: str
    temp_dir: str | os.PathLike[str] | None
    progress: Progress

    result_: BinningResult
    n_features_in_: int
    _method: str

    def transform(self, X: Any) -> npt.NDArray[Any]:
        """The bins of `X`, in the form that `encode` names."""
        check_is_fitted(self)
        columns = self._read_columns(X)
        bins = [found.bin_numbers(values) for found, values in zip(self.result_.bins, columns)]
        if self.encode == "ordinal":
            return self._as_numbers(bins)
        return self._as_indicators(bins) if self.encode == "onehot" else self._as_intervals(bins)

    def get_feature_names_out(self, input_features: Any = None) -> npt.NDArray[np.object_]:
        """The names of the input, or with `encode="onehot"` a name for each bin of each."""
        check_is_fitted(self)
        names = _check_feature_names_in(self, input_features)
        if self.encode != "onehot":
            return np.asarray(names, dtype=object)
        pairs = [(name, label) for name, i in zip(names, range(len(names))) for label in self._labels(i)]
        return np.array([f"{name}_{label}" for name, label in pairs], dtype=object)

    def __sklearn_tags__(self) -> Tags:
        tags = super().__sklearn_tags__()
        tags.input_tags.allow_nan = True
        return tags

    def _fit(self, X: Any, codes: npt.NDArray[np.uint8] | None, classes: Sequence[Any], sample_weight: Any) -> None:
        if self.encode not in ("ordinal", "onehot", "interval"):
            raise ValueError(f"encode must be 'ordinal', 'onehot' or 'interval', not {self.encode!r}")
        if self.missing not in ("code", "keep"):
            raise ValueError(f"missing must be 'code' or 'keep', not {self.missing!r}")
        feed, variables, rows = self._open(X, reset=True)
        if rows == 0:
            raise DataError("the data have no rows")
        if codes is not None:
            if rows is not None:
                check_consistent_length(np.empty(rows), codes)
            feed.add_variable("y", "code", array=codes, num_codes=len(classes))
            variables.append(Variable("y", "target", "text", categories=tuple(classes)))
        if sample_weight is not None:
            feed.add_variable("sample_weight", "weight", array=_check_weights(sample_weight, rows))
            variables.append(Variable("sample_weight", "weight", rounding="none"))
        names = [variable.name for variable in variables]
        with reporting(self.progress, names, self.n_features_in_, rows) as report:
            outcome = self._run(feed, list(range(self.n_features_in_)), report)
        self.result_ = make_result(outcome, variables, self._settings(), self._method, stacklevel=4)
        for found in self.result_.bins:
            if found.status.is_error:
                raise BinningError(found.status, f"attribute {found.attribute!r}: {found.status}")
        self.cut_points_ = [found.cut_points for found in self.result_.bins]
        self.bin_tables_ = [found.to_pandas() for found in self.result_.bins]
        self.statuses_ = [found.status for found in self.result_.bins]

    def _settings(self) -> Settings:
        raise NotImplementedError

    def _run(self, feed: _core.Feed, attributes: list[int], report: Any) -> Any:
        raise NotImplementedError

    def _temp_dir(self) -> str:
        return "" if self.temp_dir is None else os.fspath(self.temp_dir)

    def _open(self, X: Any, reset: bool) -> tuple[_core.Feed, list[Variable], int | None]:
        """A feed of the columns of `X`, read where they lie; and how many rows there are, if that is known."""
        if hasattr(X, "__arrow_c_stream__"):
            return self._open_table(X, reset)
        X = self._check(X, reset)
        feed = _core.Feed(None)
        names = getattr(self, "feature_names_in_", [f"x{i}" for i in range(X.shape[1])])
        for i, name in enumerate(names):
            feed.add_variable(str(name), "attribute", array=X[:, i])
        return feed, [Variable(str(name)) for name in names], X.shape[0]

    def _check(self, X: Any, reset: bool) -> npt.NDArray[Any]:
        array: npt.NDArray[Any] = validate_data(self, X, reset=reset, dtype="numeric", ensure_all_finite=False)
        # Numbers of 128 bits or in the other byte order are the only ones that the feed can't read where they lie.
        return array if array.dtype.itemsize <= 8 and array.dtype.isnative else array.astype(np.float64)

    def _open_table(self, X: Any, reset: bool) -> tuple[_core.Feed, list[Variable], int | None]:
        source = open_source(X)
        named = X if isinstance(X, pd.DataFrame) else pd.DataFrame(columns=[column.name for column in source.columns])
        validate_data(self, named, reset=reset, skip_check_array=True)
        if not source.columns:
            raise DataError("there are no columns")
        feed = _core.Feed(source.open(None))
        for i, column in enumerate(source.columns):
            feed.add_variable(column.name, "attribute", column=i)
        variables = [Variable(column.name, kind=column.kind, time_zone=column.time_zone) for column in source.columns]
        return feed, variables, source.rows

    def _read_columns(self, X: Any) -> Sequence[Floats]:
        if hasattr(X, "__arrow_c_stream__"):
            feed, _, _ = self._open_table(X, reset=False)
            return feed.read(_ALL_ROWS)
        return list(self._check(X, reset=False).T)

    def _as_numbers(self, bins: Sequence[Codes]) -> Floats:
        out = np.empty((len(bins[0]), len(bins)))
        for i, column in enumerate(bins):
            out[:, i] = column
            if self.missing == "keep":
                out[column == self._n_bins(i), i] = np.nan
        return out

    def _as_indicators(self, bins: Sequence[Codes]) -> Floats:
        blocks = []
        for i, column in enumerate(bins):
            block: Floats = np.zeros((len(column), self._n_bins(i) + 1))
            block[np.arange(len(column)), column] = 1.0
            if self.missing == "keep":
                block[column == self._n_bins(i)] = np.nan
                block = block[:, :-1]
            blocks.append(block)
        return np.concatenate(blocks, axis=1)

    def _as_intervals(self, bins: Sequence[Codes]) -> npt.NDArray[np.object_]:
        out = np.empty((len(bins[0]), len(bins)), dtype=object)
        for i, column in enumerate(bins):
            names = [*self.result_.bins[i].labels, "missing" if self.missing == "code" else None]
            out[:, i] = np.array(names, dtype=object)[column]
        return out

    def _n_bins(self, feature: int) -> int:
        return len(self.cut_points_[feature]) + 1

    def _labels(self, feature: int) -> list[str]:
        labels = self.result_.bins[feature].labels
        return labels + ["missing"] if self.missing == "code" else labels


class SupervisedBinner(_Binner):
    """Cuts each feature where that best separates the categories of `y`, by entropy and description length.

    Parameters
    ----------
    max_distinct : int or None, default=None
        A feature with more distinct values than this is pre-binned into `n_bins` bins of equal frequency, from which
        the search for cut points starts. None: never.
    n_bins : int, default=1000
        The number of those pre-bins.
    closed : {"right", "left"}, default="right"
        The side of a bin that belongs to it.
    small_bin_ratio : float, default=0.0
        An inner bin whose weight is below this share of its lighter neighbour's is merged away.
    encode : {"ordinal", "onehot", "interval"}, default="ordinal"
        What `transform` gives: the number of the bin, a column of 0 and 1 for each bin, or the bin in words.
    missing : {"code", "keep"}, default="code"
        Whether a missing value gets a code of its own, one past the last bin (a column of its own, or "missing"), or
        stays missing.
    temp_dir : path or None, default=None
        Where the temporary files go; None for the system's directory.
    progress : bool or callable, default=False
        Whether to show progress bars; or what to call with a phase and an index.

    Attributes
    ----------
    cut_points_ : list of arrays, by feature
    bin_tables_ : list of pandas.DataFrame, by feature
    statuses_ : list of Status, by feature
    result_ : BinningResult
    classes_ : array, the categories of `y`
    n_features_in_ : int
    feature_names_in_ : array, if `X` had names
    """

    _method = "supervised"

    def __init__(
        self,
        *,
        max_distinct: int | None = None,
        n_bins: int = 1000,
        closed: str = "right",
        small_bin_ratio: float = 0.0,
        encode: str = "ordinal",
        missing: str = "code",
        temp_dir: str | os.PathLike[str] | None = None,
        progress: Progress = False,
    ) -> None:
        self.max_distinct = max_distinct
        self.n_bins = n_bins
        self.closed = closed
        self.small_bin_ratio = small_bin_ratio
        self.encode = encode
        self.missing = missing
        self.temp_dir = temp_dir
        self.progress = progress

    def fit(self, X: Any, y: Any, sample_weight: Any = None) -> SupervisedBinner:
        """Finds the cut points. `X` is an array, a frame, or any Arrow stream; weights may be fractional."""
        check_settings(self.closed, self.n_bins, self.max_distinct, self.small_bin_ratio)
        if y is None:
            raise ValueError(f"{type(self).__name__} requires y to be passed, but the target y is None")
        self.classes_, codes = _code_target(y)
        self._fit(X, codes, self.classes_.tolist(), sample_weight)
        return self

    def __sklearn_tags__(self) -> Tags:
        tags = super().__sklearn_tags__()
        tags.target_tags.required = True
        return tags

    def _settings(self) -> Settings:
        return Settings(self.closed, self.n_bins, self.max_distinct, self.small_bin_ratio)

    def _run(self, feed: _core.Feed, attributes: list[int], report: Any) -> Any:
        return feed.bin_supervised(
            attributes,
            [len(attributes)] * len(attributes),
            n_bins=self.n_bins,
            max_distinct=self.max_distinct or 0,
            small_bin_ratio=self.small_bin_ratio,
            right_closed=self.closed == "right",
            temp_dir=self._temp_dir(),
            progress=report,
        )


class EqualFrequencyBinner(_Binner):
    """Cuts each feature into bins of equal weight; fewer than asked for, where equal values stay together.

    Parameters and attributes are those of SupervisedBinner, without the ones that are about a target.
    """

    _method = "equal-frequency"

    def __init__(
        self,
        *,
        n_bins: int = 10,
        closed: str = "right",
        encode: str = "ordinal",
        missing: str = "code",
        temp_dir: str | os.PathLike[str] | None = None,
        progress: Progress = False,
    ) -> None:
        self.n_bins = n_bins
        self.closed = closed
        self.encode = encode
        self.missing = missing
        self.temp_dir = temp_dir
        self.progress = progress

    def fit(self, X: Any, y: Any = None, sample_weight: Any = None) -> EqualFrequencyBinner:
        """Finds the cut points. `X` is an array, a frame, or any Arrow stream; weights may be fractional."""
        check_settings(self.closed, self.n_bins)
        self._fit(X, None, (), sample_weight)
        return self

    def _settings(self) -> Settings:
        return Settings(self.closed, self.n_bins)

    def _run(self, feed: _core.Feed, attributes: list[int], report: Any) -> Any:
        return feed.bin_equal_frequency(
            attributes,
            n_bins=self.n_bins,
            right_closed=self.closed == "right",
            temp_dir=self._temp_dir(),
            progress=report,
        )


def _code_target(y: Any) -> tuple[npt.NDArray[Any], npt.NDArray[np.uint8]]:
    """The categories in ascending order, and the code of each row."""
    y = check_array(
        y, ensure_2d=False, dtype=None, ensure_all_finite="allow-nan", ensure_min_samples=0, input_name="y"
    )
    y = column_or_1d(y, warn=True)
    codes, classes = pd.factorize(y, sort=True)
    if (codes < 0).any():
        raise DataError("the target is missing", "y", int((codes < 0).argmax()))
    if len(classes) > _MOST_CATEGORIES:
        raise DataError(f"there are {len(classes)} categories, more than 256", "y")
    if len(classes) == 1:
        raise DataError(f"there is one class, {classes.tolist()[0]!r}; at least 2 are needed", "y")
    return classes, codes.astype(np.uint8)


def _check_weights(sample_weight: Any, rows: int | None) -> Floats:
    weights: Floats = check_array(
        sample_weight, ensure_2d=False, dtype=np.float64, ensure_all_finite=False, input_name="sample_weight"
    )
    if weights.ndim != 1:
        raise ValueError("Sample weights must be 1D array or scalar")
    if rows is not None and len(weights) != rows:
        raise ValueError(f"sample_weight has {len(weights)} values for {rows} rows")
    if not weights.any():
        raise ValueError("all weights are zero")
    return weights
