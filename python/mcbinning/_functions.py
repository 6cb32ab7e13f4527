"""Binning of data that need not be in memory."""

from __future__ import annotations

import numbers
import os
import tempfile
import warnings
from collections.abc import Iterable, Mapping, Sequence
from dataclasses import dataclass
from typing import Any

import numpy as np

from . import _core, _values
from ._errors import BinningError, DataError, warning_of
from ._progress import Progress, reporting
from ._result import AttributeBins, BinningResult, Settings, Variable
from ._sources import Column, Source, check_names, open_source
from ._status import NO_RECORDS, Status

Missing = Mapping[str, Any]
"""By column: the value that stands for missing, or a list of such values. A tuple of two numbers among them is an
interval, both ends included; there is at most one."""

_LARGEST_INT = 2**31 - 1


def supervised_bins(
    data: Any,
    target: str | None = None,
    attributes: Sequence[str] | None = None,
    weight: str | None = None,
    missing: Missing | None = None,
    pairs: Iterable[tuple[str, str]] | None = None,
    *,
    max_distinct: int | None = None,
    n_bins: int = 1000,
    closed: str = "right",
    small_bin_ratio: float = 0.0,
    temp_dir: str | os.PathLike[str] | None = None,
    progress: Progress = False,
) -> BinningResult:
    """Finds the bins that best separate the categories of a target.

    `data` is any object with the Arrow stream protocol or a path that DuckDB reads. Without `attributes` all columns of
    numbers, dates and timestamps are binned; a column of text is when it is named, and its bins are sets of categories.
    `pairs` of attribute and target take the place of both, to bin against many targets in one pass.

    An attribute with more than `max_distinct` distinct values is first pre-binned into `n_bins` bins of equal
    frequency. A bin lighter than `small_bin_ratio` times its lighter neighbour is merged away. Weights may be
    fractional, and a record without a weight is left out.

    Categories get their codes in ascending order, so the order of the rows makes no difference. A stream that can be
    read only once goes through a temporary file for that.
    """
    if (target is None) == (pairs is None):
        raise TypeError("either target or pairs must be given")
    if pairs is not None and attributes is not None:
        raise TypeError("pairs name the attributes, so attributes can't be given, too")
    source = open_source(data)
    if pairs is not None:
        wanted = list(dict.fromkeys((str(attribute), str(category)) for attribute, category in pairs))
    else:
        assert target is not None
        names = _names_to_bin(source, attributes, [target, weight])
        wanted = [(name, target) for name in names]
    check_settings(closed, n_bins, max_distinct, small_bin_ratio)
    plan = _Plan(source, wanted, target, weight, missing or {})
    settings = Settings(closed, n_bins, max_distinct, small_bin_ratio)
    feed = plan.open_feed(_directory(temp_dir))
    with reporting(progress, plan.names, len(wanted), source.rows) as report:
        outcome = feed.bin_supervised(
            [plan.names.index(attribute) for attribute, _ in wanted],
            [plan.names.index(category) for _, category in wanted],
            n_bins=n_bins,
            max_distinct=max_distinct or 0,
            small_bin_ratio=small_bin_ratio,
            right_closed=closed == "right",
            temp_dir=_directory(temp_dir),
            progress=report,
        )
    left_out = _texts_left_out(source, plan) if attributes is None and pairs is None else ()
    return make_result(outcome, plan.variables(feed), settings, "supervised", source.name, left_out)


def equal_frequency_bins(
    data: Any,
    attributes: Sequence[str] | None = None,
    weight: str | None = None,
    missing: Missing | None = None,
    *,
    n_bins: int = 10,
    closed: str = "right",
    temp_dir: str | os.PathLike[str] | None = None,
    progress: Progress = False,
) -> BinningResult:
    """Cuts each attribute into `n_bins` bins of equal weight; fewer, where equal values stay together.

    Data and arguments are those of `supervised_bins`.
    """
    source = open_source(data)
    names = _names_to_bin(source, attributes, [weight])
    check_settings(closed, n_bins)
    plan = _Plan(source, [(name, None) for name in names], None, weight, missing or {})
    feed = plan.open_feed(_directory(temp_dir))
    with reporting(progress, plan.names, len(names), source.rows) as report:
        outcome = feed.bin_equal_frequency(
            [plan.names.index(name) for name in names],
            n_bins=n_bins,
            right_closed=closed == "right",
            temp_dir=_directory(temp_dir),
            progress=report,
        )
    left_out = _texts_left_out(source, plan) if attributes is None else ()
    settings = Settings(closed, n_bins)
    return make_result(outcome, plan.variables(feed), settings, "equal-frequency", source.name, left_out)


def check_settings(
    closed: str, n_bins: int, max_distinct: int | None = None, small_bin_ratio: float = 0.0
) -> None:
    if closed not in ("right", "left"):
        raise ValueError(f"closed must be 'right' or 'left', not {closed!r}")
    _check_whole("n_bins", n_bins, 2)
    if max_distinct is not None:
        _check_whole("max_distinct", max_distinct, 1)
    if not 0.0 <= small_bin_ratio <= 1.0:
        raise ValueError(f"small_bin_ratio must be from 0 to 1, not {small_bin_ratio}")


def _check_whole(name: str, value: Any, least: int) -> None:
    if not isinstance(value, numbers.Integral) or not least <= int(value) <= _LARGEST_INT:
        raise ValueError(f"{name} must be a whole number of at least {least}, not {value!r}")


def make_result(
    outcome: Any,
    variables: Sequence[Variable],
    settings: Settings,
    method: str,
    data_name: str | None = None,
    left_out: Sequence[str] = (),
    stacklevel: int = 3,
) -> BinningResult:
    """The result of a run, whose warnings become Python's. \\raise BinningError if it failed as a whole."""
    fields, entries, records, version = outcome
    status = Status.from_core(fields)
    if status.code == NO_RECORDS and records == 0:
        raise DataError("the data have no rows")
    if status.is_error:
        raise BinningError(status)
    bins = tuple(_attribute_bins(entry, variables, settings.closed) for entry in entries)
    result = BinningResult(
        method, settings, tuple(variables), status, bins, tuple(left_out), data_name, records, version
    )
    for found in bins:
        if not found.status.ok:
            warnings.warn(warning_of(found.attribute, found.status), stacklevel=stacklevel)
    return result


def _attribute_bins(entry: dict[str, Any], variables: Sequence[Variable], closed: str) -> AttributeBins:
    target = variables[entry["target"]] if "target" in entry else None
    counts = entry["counts"]
    n_bins = len(entry["cut_points"]) + 1
    if len(counts) != n_bins or (target is not None and counts.shape[1] < 2):
        counts = np.empty((0, 1))  # nothing was binned: the rows that there are have no weights
    target_weights = None
    if target is not None:
        # The last categories have no column where no record has them.
        target_weights = np.zeros((len(counts), len(target.categories or ())))
        target_weights[:, : counts.shape[1] - 1] = counts[:, 1:]
    return AttributeBins(
        variable=variables[entry["attribute"]],
        target=target,
        status=Status.from_core(entry["status"]),
        closed=closed,
        cut_points=entry["cut_points"],
        weights=np.ascontiguousarray(counts[:, 0]),
        target_weights=target_weights,
        n_distinct=entry["n_distinct"],
        weight=entry["weight"],
        weight_with_missing=entry["weight_with_missing"],
        minimum=_values.figure(entry["minimum"]),
        maximum=_values.figure(entry["maximum"]),
        model_entropy=_values.figure(entry["model_entropy"]) if target else float("nan"),
    )


def _directory(temp_dir: str | os.PathLike[str] | None) -> str:
    return os.fspath(temp_dir) if temp_dir is not None else tempfile.gettempdir()


def _names_to_bin(source: Source, attributes: Sequence[str] | None, others: list[str | None]) -> list[str]:
    if attributes is not None:
        return list(dict.fromkeys([attributes] if isinstance(attributes, str) else attributes))
    columns = [column for column in source.columns if column.name not in others]
    for column in columns:
        if not column.is_usable:
            raise DataError(f"a column of this type can't be binned: {column.kind}", column.name)
    names = [column.name for column in columns if column.kind != "text"]
    if not names:
        raise DataError("there is nothing to bin: no column holds numbers")
    return names


def _texts_left_out(source: Source, plan: _Plan) -> tuple[str, ...]:
    return tuple(column.name for column in source.columns if column.kind == "text" and column.name not in plan.names)


def parse_missing(declared: Any, kind: str) -> tuple[tuple[Any, ...], tuple[float, float] | None]:
    """What the user declared missing in a column of this kind: values, as texts or numbers, and an interval."""
    items = declared if isinstance(declared, (list, set, frozenset, np.ndarray)) else [declared]
    intervals = [item for item in items if isinstance(item, tuple)]
    values = [item for item in items if not isinstance(item, tuple)]
    if len(intervals) > 1 or any(len(ends) != 2 for ends in intervals):
        raise ValueError("at most one interval, of two ends, can be declared missing")
    if kind == "text":
        if intervals:
            raise ValueError("an interval of texts can't be declared missing")
        return tuple(map(str, values)), None
    numbers = tuple(_values.encode(value, kind) for value in values)
    if not intervals:
        return numbers, None
    left, right = (_values.encode(end, kind) for end in intervals[0])
    if not left <= right:
        raise ValueError(f"the interval {intervals[0]} begins above its end")
    return numbers, (left, right)


@dataclass(frozen=True)
class _Plan:
    """Which columns take part, and as what."""

    source: Source
    pairs: Sequence[tuple[str, str | None]]
    target: str | None
    """That of all pairs, if they have one."""
    weight: str | None
    missing: Missing

    def __post_init__(self) -> None:
        check_names(self.source, [*self.names, *self.missing])
        if not self.pairs:
            raise DataError("there is nothing to bin: no attribute is named")
        for attribute, target in self.pairs:
            if attribute == target:
                raise DataError("the column can't be attribute and target at once", attribute)
            if self.weight is not None and self.weight in (attribute, target):
                raise DataError("the weight can't be attribute or target, too", self.weight)

    @property
    def targets(self) -> list[str]:
        return list(dict.fromkeys(target for _, target in self.pairs if target is not None))

    @property
    def names(self) -> list[str]:
        """Of the variables, in the order of the columns."""
        taking_part = {self.weight, *self.targets, *(attribute for attribute, _ in self.pairs)}
        in_order = [column.name for column in self.source.columns if column.name in taking_part]
        return in_order + sorted(name for name in taking_part if name is not None and name not in in_order)

    def open_feed(self, directory: str) -> _core.Feed:
        """A feed that knows all categories."""
        categorical = [name for name in self.names if self._use(name) == "category"]
        if not categorical:
            return self._make_feed(self.names)
        if self.source.is_once:
            feed = self._make_feed(self.names)
            feed.spool(directory)
            known = feed
            indices = {name: self.names.index(name) for name in categorical}
        else:
            known = self._make_feed(categorical)
            known.learn_categories()
            feed = self._make_feed(self.names)
            indices = {name: i for i, name in enumerate(categorical)}
        for name in categorical:
            categories = known.categories(indices[name])
            self._check_categories(name, categories)
            if known is not feed:
                feed.set_categories(self.names.index(name), categories)
        return feed

    def variables(self, feed: _core.Feed) -> list[Variable]:
        return [self._variable(feed, index, name) for index, name in enumerate(self.names)]

    def _column(self, name: str) -> Column:
        return next(column for column in self.source.columns if column.name == name)

    def _use(self, name: str) -> str:
        if name == self.weight:
            return "weight"
        return "category" if name in self.targets or self._column(name).kind == "text" else "attribute"

    def _missing(self, name: str) -> tuple[tuple[Any, ...], tuple[float, float] | None]:
        try:
            return parse_missing(self.missing.get(name, []), self._column(name).kind)
        except (TypeError, ValueError, OverflowError) as error:
            raise DataError(f"what is declared missing can't be used: {error}", name) from error

    def _make_feed(self, names: list[str]) -> _core.Feed:
        table = self.source.open(names)
        places = [fields[0] for fields in table.columns]
        feed = _core.Feed(table)
        for index, name in enumerate(names):
            feed.add_variable(name, self._use(name), column=places.index(name))
            values, interval = self._missing(name)
            is_text = self._column(name).kind == "text"
            feed.declare_missing(index, [] if is_text else list(values), interval, list(values) if is_text else [])
        return feed

    def _variable(self, feed: _core.Feed, index: int, name: str) -> Variable:
        column = self._column(name)
        use = self._use(name)
        return Variable(
            name,
            "weight" if use == "weight" else "target" if name == self.target else "attribute",
            column.kind,
            column.time_zone,
            tuple(feed.categories(index)) if use == "category" else None,
            *self._missing(name),
            rounding="none" if use == "weight" else None,
        )

    def _check_categories(self, name: str, categories: list[Any]) -> None:
        if len(categories) == 0:
            raise DataError("no row has a category: the data are empty, or all is missing", name)
        if len(categories) == 1:
            column = self._column(name)
            category = categories[0] if column.kind == "text" else _values.decode(categories[0], column.kind)
            raise DataError(f"there is a single category, {category!r}; at least 2 are needed", name)
