"""Which columns take part in a run, and as what."""

from __future__ import annotations

from collections.abc import Callable, Iterable, Mapping, Sequence
from dataclasses import dataclass, field, replace
from typing import Any

import numpy as np

from . import _core, _values
from ._errors import DataError
from ._sources import Column, Source, check_names, name_of
from ._types import CategoryOrder, Missing, Rounding, WeightScale


def names_to_bin(source: Source, attributes: Any, others: Sequence[str | None], has_target: bool) -> list[str]:
    """Those that the user named, or all columns but the `others` that can be measured or, with a target, may be
    categories."""
    if attributes is not None:
        is_one = isinstance(attributes, str) or not isinstance(attributes, Iterable)
        return list(dict.fromkeys(map(name_of, [attributes] if is_one else attributes)))
    left_out = columns_left_out(source, others, has_target)
    names = [column.name for column in source.columns if column.name not in others and column.name not in left_out]
    refuse_nothing(names, left_out)
    return names


def columns_left_out(source: Source, others: Sequence[str | None], has_target: bool) -> dict[str, str]:
    """By name: what a column holds that is binned only if it is named, or not at all."""
    return {
        column.name: column.kind
        for column in source.columns
        if column.name not in others and ((column.kind == "text" and not has_target) or not column.is_usable)
    }


def refuse_nothing(kept: Sequence[Any], left_out: Mapping[str, str]) -> None:
    """\\raise DataError if no column is left to bin."""
    if not kept:
        named = ", ".join(f"{name!r} ({kind})" for name, kind in left_out.items())
        named = f"; left out are {named}" if named else ""
        raise DataError(f"there is nothing to bin: no column can be an attribute{named}")


def texts_of(source: Source, others: Sequence[str | None]) -> frozenset[str]:
    """The columns of text but the `others`."""
    return frozenset(column.name for column in source.columns if column.kind == "text" and column.name not in others)


def name_orders(category_order: CategoryOrder) -> CategoryOrder:
    """As it was asked for, by the names of the columns."""
    if isinstance(category_order, str):
        if category_order not in ("rate", "text"):
            raise ValueError(f"category_order must be 'rate', 'text' or a dict by column, not {category_order!r}")
        return category_order
    return {name_of(column): list(map(str, categories)) for column, categories in category_order.items()}


def named_in(category_order: CategoryOrder) -> list[str]:
    """The columns whose order of categories was given."""
    return [] if isinstance(category_order, str) else list(map(name_of, category_order))


def check_order(name: str, order: Sequence[Any], categories: Sequence[Any]) -> None:
    """The order that was given names each category of the column once."""
    if len(set(order)) < len(order):
        raise DataError("the order of the categories names one of them twice", name)
    lacking = [category for category in categories if category not in order]
    if lacking:
        raise DataError(f"the order of the categories lacks {lacking[0]!r}", name)


def check_categories(name: str, categories: Sequence[Any]) -> None:
    """The column has two categories at least."""
    if len(categories) == 0:
        raise DataError("no row has a category: the data are empty, or all is missing", name)
    if len(categories) == 1:
        raise DataError(f"there is a single category, {categories[0]!r}; at least 2 are needed", name)


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
    optional: frozenset[str] = frozenset()
    """Columns of text that nobody has named. They are binned if they can be."""
    category_order: CategoryOrder = "rate"
    weight_scale: WeightScale | None = None
    rare: float = 0.0
    """Categories that have no order of their own, and less than this share of the weight, have a code together."""
    left_out: Mapping[str, str] = field(default_factory=dict)
    """By name: why a column is not binned."""

    def __post_init__(self) -> None:
        orders = () if isinstance(self.category_order, str) else self.category_order
        check_names(self.source, [*self.names, *self.missing, *orders])
        if not self.pairs:
            raise DataError("there is nothing to bin: no attribute is named")
        for attribute, target in self.pairs:
            if attribute == target:
                raise DataError("the column can't be attribute and target at once", attribute)
            if self.weight is not None and self.weight in (attribute, target):
                raise DataError("the weight can't be attribute or target, too", self.weight)
        if isinstance(self.category_order, str):
            return
        for name in self.category_order:
            if self.column(name).kind != "text":
                raise DataError("only the categories of a column of text can be given an order", name)

    @property
    def targets(self) -> list[str]:
        return list(dict.fromkeys(target for _, target in self.pairs if target is not None))

    @property
    def names(self) -> list[str]:
        """Of the variables, in the order of the columns."""
        taking_part = {self.weight, *self.targets, *(attribute for attribute, _ in self.pairs)}
        in_order = [column.name for column in self.source.columns if column.name in taking_part]
        return in_order + sorted(name for name in taking_part if name is not None and name not in in_order)

    def open_feed(self, directory: str, is_read_again: bool = False) -> tuple[Plan, _core.Feed]:
        """The plan without the optional columns that can't be binned, and a feed of its columns that knows all
        categories and what the weights are like. Records that come only once are kept for it if they are needed twice,
        or are to be read again."""
        categorical = self.categorical
        to_learn = categorical if self.weight is None else [*categorical, self.weight]
        if not to_learn and not (is_read_again and self.source.is_once):
            return self, self._feed_columns(self.names)
        if self.source.is_once:
            feed = self._feed_columns(self.names)
            feed.spool(directory)
            if self.is_scaled:
                feed.scale_weights()
            plan = self.settle({name: feed.describe_unusable(self.names.index(name)) for name in self.optional})
            self._drop(feed, plan)
            for name in plan.categorical:
                plan.check_categories(name, feed.categories(plan.names.index(name)))
            codes = plan.count_categories(lambda: feed, plan.names)
            kept = plan.settle(plan.find_all_rare(codes))
            plan._drop(feed, kept)
            plan = kept
        else:
            known = self._feed_columns(to_learn)
            known.learn()
            scale = self._find_scale(known.weights()) if self.is_scaled else 1.0
            plan = self.settle({name: known.describe_unusable(categorical.index(name)) for name in self.optional})
            categories = {name: known.categories(categorical.index(name)) for name in plan.categorical}

            def feed_columns(names: list[str]) -> _core.Feed:
                feed = plan._feed_columns(names)
                feed.set_weights(known.weights(), scale)
                for name, found in categories.items():
                    if name in names:
                        feed.set_categories(names.index(name), found)
                return feed

            for name, found in categories.items():
                plan.check_categories(name, found)
            counted = plan.categorical if self.weight is None else [*plan.categorical, self.weight]
            codes = plan.count_categories(lambda: feed_columns(counted), counted)
            plan = plan.settle(plan.find_all_rare(codes))
            feed = feed_columns(plan.names)
        plan.set_codes(feed, plan.names, codes)
        return plan, feed

    @property
    def is_scaled(self) -> bool:
        return self.weight is not None and self.weight_scale is not None

    def _find_scale(self, weights: tuple[int, float]) -> float:
        assert self.weight is not None
        feed = self._feed_columns([self.weight])
        feed.set_weights(weights)
        return feed.scale_weights()

    def _drop(self, feed: _core.Feed, kept: Plan) -> None:
        """Leaves out of a feed of the plan's columns what another plan lacks."""
        for name in reversed(self.names):
            if name not in kept.names:
                feed.drop(self.names.index(name))

    def settle(self, unusable: Mapping[str, str]) -> Plan:
        """Without the optional columns of which a reason tells that they can't be binned."""
        left_out = {**self.left_out, **{name: f"text: {why}" for name, why in unusable.items() if why}}
        kept = [(attribute, target) for attribute, target in self.pairs if attribute not in left_out]
        refuse_nothing(kept, left_out)
        return replace(self, pairs=kept, left_out=left_out)

    @property
    def unordered(self) -> dict[str, str | None]:
        """By name of an attribute whose categories have no order of their own: the target of its first pair. A column
        that is a target, too, keeps the order that it has as such."""
        first: dict[str, str | None] = {}
        for attribute, target in self.pairs:
            first.setdefault(attribute, target)
        declared = () if isinstance(self.category_order, str) else self.category_order
        return {
            name: target
            for name, target in first.items()
            if name in self.categorical
            and name not in self.targets
            and name not in declared
            and self.column(name).kind == "text"
            and not self.column(name).is_ordered
        }

    def count_categories(
        self, open_counted: Callable[[], _core.Feed], names: Sequence[str]
    ) -> dict[str, _core.CategoryCodes]:
        """By name of an attribute whose categories are to be ordered by the rates of a target: their codes.
        `open_counted` gives a feed of the columns `names`, which knows their categories."""
        to_count = self.unordered
        if not to_count or not (self.is_by_rate or self.rare > 0.0):
            return {}
        pairs = [
            (names.index(name), None if target is None else names.index(target)) for name, target in to_count.items()
        ]
        return dict(zip(to_count, open_counted().count_categories(pairs, rare=self.rare, by_rate=self.is_by_rate)))

    @property
    def is_by_rate(self) -> bool:
        return self.category_order != "text" and bool(self.targets)

    def find_all_rare(self, codes: Mapping[str, _core.CategoryCodes]) -> dict[str, str]:
        """The optional columns of which the codes leave a single category, with the reason. Others are an error."""
        alone = [name for name, found in codes.items() if len(found.names) < 2]
        for name in alone:
            if name not in self.optional:
                self.check_categories(name, codes[name].names)
        return {name: "rare categories alone" for name in alone}

    def set_codes(self, feed: _core.Feed, names: Sequence[str], codes: Mapping[str, _core.CategoryCodes]) -> None:
        """Tells the feed of the columns `names` in which order the categories have their codes."""
        for name, found in codes.items():
            if name in names:
                target = (self.unordered[name] or "") if self.is_by_rate else ""
                kind = "rate" if self.is_by_rate else "text"
                feed.set_codes(names.index(name), found, rare=self.rare, order=kind, target=target)
        for index, name in enumerate(names):
            column = self.column(name) if name in self.categorical else None
            if column is not None and column.is_ordered and column.kind == "text":
                feed.set_codes(index, _core.CategoryCodes(list(map(str, feed.categories(index)))), order="declared")
        if isinstance(self.category_order, str):
            return
        for name, order in self.category_order.items():
            if name in names:
                check_order(name, order, feed.categories(names.index(name)))
                feed.set_codes(names.index(name), _core.CategoryCodes(list(order)), order="declared")

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
            feed.add_field(
                name,
                self._use(name),
                column=positions.index(name),
                rounding=self.rounding,
                scaled=self.is_scaled and name == self.weight,
                optional=name in self.optional,
            )
            values, interval = self.missing_of(name)
            is_text = self.column(name).kind == "text"
            feed.declare_missing(index, [] if is_text else list(values), interval, list(values) if is_text else [])
        return feed

    def check_categories(self, name: str, categories: list[Any]) -> None:
        kind = self.column(name).kind
        if kind != "text" and len(categories) == 1:
            categories = [_values.decode(categories[0], kind)]
        check_categories(name, categories)
