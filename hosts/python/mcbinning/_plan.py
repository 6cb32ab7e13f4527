"""Which columns take part in a run, and as what."""

from __future__ import annotations

from collections.abc import Iterable, Mapping, Sequence
from dataclasses import dataclass
from typing import Any

import numpy as np

from . import _core, _values
from ._errors import DataError
from ._sources import Column, Source, check_names, name_of
from ._types import Missing, Rounding


def names_to_bin(source: Source, attributes: Any, others: Sequence[str | None]) -> list[str]:
    """Those that the user named, or all columns that can be measured but the `others`."""
    if attributes is not None:
        is_one = isinstance(attributes, str) or not isinstance(attributes, Iterable)
        return list(dict.fromkeys(map(name_of, [attributes] if is_one else attributes)))
    left_out = columns_left_out(source, others)
    names = [column.name for column in source.columns if column.name not in others and column.name not in left_out]
    if not names:
        named = ", ".join(f"{name!r} ({kind})" for name, kind in left_out.items())
        named = f"; left out are {named}" if named else ""
        raise DataError(f"there is nothing to bin: no column holds numbers{named}")
    return names


def columns_left_out(source: Source, others: Sequence[str | None]) -> dict[str, str]:
    """By name: what a column holds that is binned only if it is named, or not at all."""
    return {
        column.name: column.kind
        for column in source.columns
        if column.name not in others and (column.kind == "text" or not column.is_usable)
    }


def name_missing(missing: Missing | None) -> dict[str, Any]:
    return {name_of(column): declared for column, declared in (missing or {}).items()}


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
class Plan:
    """Which columns take part, and as what."""

    source: Source
    pairs: Sequence[tuple[str, str | None]]
    target: str | None
    """That of all pairs, if they have one."""
    weight: str | None
    missing: Mapping[str, Any]
    rounding: Rounding
    """Of the weight."""

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
        """A feed that knows all categories and what the weights are like."""
        categorical = self.categorical
        to_learn = categorical if self.weight is None else [*categorical, self.weight]
        if not to_learn:
            return self._feed_columns(self.names)
        if self.source.is_once:
            feed = self._feed_columns(self.names)
            feed.spool(directory)
            known = feed
            indices = {name: self.names.index(name) for name in categorical}
        else:
            known = self._feed_columns(to_learn)
            known.learn()
            feed = self._feed_columns(self.names)
            feed.set_weights(known.weights())
            indices = {name: i for i, name in enumerate(categorical)}
        for name in categorical:
            categories = known.categories(indices[name])
            self.check_categories(name, categories)
            if known is not feed:
                feed.set_categories(self.names.index(name), categories)
        return feed

    @property
    def categorical(self) -> list[str]:
        return [name for name in self.names if self._use(name) == "category"]

    def column(self, name: str) -> Column:
        return next(column for column in self.source.columns if column.name == name)

    def _use(self, name: str) -> str:
        if name == self.weight:
            return "weight"
        column = self.column(name)
        is_category = name in self.targets or column.kind == "text" or column.is_ordered
        return "category" if is_category else "attribute"

    def missing_of(self, name: str) -> tuple[tuple[Any, ...], tuple[float, float] | None]:
        try:
            return parse_missing(self.missing.get(name, []), self.column(name).kind)
        except (TypeError, ValueError, OverflowError) as error:
            raise DataError(f"what is declared missing can't be used: {error}", name) from error

    def _feed_columns(self, names: list[str]) -> _core.Feed:
        return self.make_feed(names, self.source.open(names))

    def make_feed(self, names: list[str], table: _core.Table) -> _core.Feed:
        """The columns of these names, out of a table that may have further ones."""
        positions = [fields[0] for fields in table.columns]
        feed = _core.Feed(table)
        for index, name in enumerate(names):
            feed.add_field(name, self._use(name), column=positions.index(name), rounding=self.rounding)
            values, interval = self.missing_of(name)
            is_text = self.column(name).kind == "text"
            feed.declare_missing(index, [] if is_text else list(values), interval, list(values) if is_text else [])
        return feed

    def check_categories(self, name: str, categories: list[Any]) -> None:
        if len(categories) == 0:
            raise DataError("no row has a category: the data are empty, or all is missing", name)
        if len(categories) == 1:
            column = self.column(name)
            category = categories[0] if column.kind == "text" else _values.decode(categories[0], column.kind)
            raise DataError(f"there is a single category, {category!r}; at least 2 are needed", name)
