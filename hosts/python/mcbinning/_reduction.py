"""Bins of a table that stays in its engine.

The engine sums the weights of each pair's values and categories, and the library bins these sums as weighted records.
As the weights lie on the grid that a run over the rows has, every sum of them is exact, on however many machines it is
made, and so is every figure.
"""

from __future__ import annotations

import math
import threading
import time
from collections.abc import Callable, Iterator, Sequence
from concurrent.futures import ThreadPoolExecutor
from contextlib import contextmanager
from dataclasses import dataclass, replace
from functools import partial
from typing import Any

import numpy as np
import pyarrow as pa
import pyarrow.compute as pc

from . import _core, _shapes
from ._buckets import TooManyNearTargets, deal_out
from ._choice import choose_engine
from ._engines import CountedQueries, Engine
from ._errors import DataError, StreamError
from ._plan import Plan
from ._progress import Progress, Report, reporting
from ._rows import bin_rows
from ._settings import Reducing, RunSettings
from ._shapes import Deal, Weights
from ._sources import open_batches, open_stream
from ._tallies import EXACT_DIGITS, Tally, number_of, tally_weights

_SECONDS_BETWEEN_REPORTS = 0.2
_FEW_GROUPS = 1 << 22
"""So many, of some 100 MB, are told one by one even where that need not be."""
_MOST_TO_LIST = 1 << 10
"""So many values tell that there are too many categories, even if some hundreds of them are declared missing."""


class TooManyGroups(Exception):
    """A group-by gives more groups than may be taken."""


def bin_reduced(plan: Plan, settings: RunSettings, reducing: Reducing, progress: Progress) -> tuple[Plan, _core.Bins]:
    """As the run over all rows, but for what it tells of the reduction. That run itself, where it is to choose and the
    engine would be dearer."""
    assert plan.source.open_engine is not None
    names = list(plan.names)
    with (
        plan.source.open_engine() as engine,
        reporting(progress, names, len(plan.pairs), plan.source.rows, False) as report,
        _reporting_progress(engine, report),
    ):
        queries = CountedQueries(engine)
        reason = ""
        if reducing.reduce == "auto" and not plan.source.is_reduced:
            is_chosen, reason = choose_engine(queries, [attribute for attribute, _ in plan.pairs])
            if not is_chosen:
                plan, feed = plan.open_feed(settings.temp_dir)
                names[:] = plan.names
                bins = bin_rows(plan, feed, settings, report)
                bins.reduction = _core.Reduction("", reason, queries.number, True, [])
                return plan, bins
        engine.check_columns(plan.names)
        tally = _tally(plan, queries)
        reducer = _Reducer(plan, queries, tally, settings, reducing)
        plan = reducer.plan
        names[:] = plan.names
        bins = reducer.describe()
        bins.records = tally.records
        bins.records_without_weight = tally.without_weight
        bins.set_weight_grid(tally.step)
        groups = []
        for (attribute, target), part in zip(plan.pairs, _map(engine, reducer.bin_pair, plan.pairs)):
            index = plan.names.index(attribute)
            bins.add_part(part.bins, index, -1 if target is None else plan.names.index(target), part.n_distinct)
            groups += [part.groups] * len(part.bins.results)
            if report is not None:
                report("attributes", index)
        is_exact = reducing.distinct == "exact"
        bins.reduction = _core.Reduction(engine.name, reason, queries.number, is_exact, groups)
        return plan, bins


def _map(engine: Engine, work: Callable[[Any], Any], items: Sequence[Any]) -> Iterator[Any]:
    """In their order. What fails, or interrupts, ends all that is running."""
    if engine.workers == 1 or len(items) == 1:
        yield from map(work, items)
        return
    with ThreadPoolExecutor(engine.workers) as pool:
        futures = [pool.submit(engine.for_thread(work), item) for item in items]
        try:
            for future in futures:
                yield future.result()
        except BaseException:
            pool.shutdown(wait=False, cancel_futures=True)
            while not all(future.done() for future in futures):
                engine.cancel()  # again and again, as a thread may have been between two queries
                time.sleep(_SECONDS_BETWEEN_REPORTS)
            raise


@contextmanager
def _reporting_progress(engine: Engine, report: Report | None) -> Iterator[None]:
    """Tells of the engine's own progress, in percent, as long as it tells of it."""
    if report is None:
        yield
        return
    is_done = threading.Event()
    failures: list[BaseException] = []

    def watch() -> None:
        try:
            while not is_done.wait(_SECONDS_BETWEEN_REPORTS):
                share = engine.get_progress()
                if share is not None:
                    report("query", int(100 * share))
        except BaseException as failure:
            failures.append(failure)
            engine.cancel()

    watcher = threading.Thread(target=watch, daemon=True)
    watcher.start()
    try:
        yield
    finally:
        is_done.set()
        watcher.join()
        if failures:  # what the engine made of being cancelled tells less
            raise failures[0]


def _tally(plan: Plan, queries: CountedQueries) -> Tally:
    if plan.weight is None:
        return tally_weights(Weights(None), queries)
    return tally_weights(Weights(plan.weight, plan.rounding, *plan.missing_of(plan.weight), plan.is_scaled), queries)


@dataclass(frozen=True)
class _Part:
    """What was found of one pair."""

    bins: _core.Bins
    groups: int
    n_distinct: int | None = None
    """Where the library was given fewer values than there are."""


class _Reducer:
    """Reduces and bins the pairs of a plan."""

    def __init__(
        self, plan: Plan, queries: CountedQueries, tally: Tally, settings: RunSettings, reducing: Reducing
    ) -> None:
        self._plan = plan
        self._queries = queries
        self._tally = tally
        self._settings = settings
        self._reducing = reducing
        self._schema = queries.stream(f"SELECT * FROM {_shapes.ROWS} LIMIT 0").schema
        self._refuse_wide_decimals(plan.weight)
        self._category_values = {name: self._list_values(name) for name in plan.categorical}
        unusable = {name: self._describe_unusable(name) for name in plan.optional}
        self.plan = self._plan = plan.settle(unusable)
        self._categories = {name: self._learn(name) for name in self.plan.categorical}
        self._codes: dict[str, _core.CategoryCodes] = {}
        codes = self._order_categories()
        self.plan = self._plan = self._plan.settle(self._plan.find_all_rare(codes))
        self._codes = codes

    def describe(self) -> _core.Bins:
        """The bins before any is found."""
        plan = self._plan
        feed = plan.make_feed(plan.names, open_stream(self._schema.empty_table()))
        self._set_categories(feed, plan.names)
        return feed.describe(
            has_targets=bool(plan.targets),
            target=None if plan.target is None else plan.names.index(plan.target),
            **self._settings.keywords,
            data_name=plan.source.name,
        )

    def bin_pair(self, pair: tuple[str, str | None]) -> _Part:
        attribute, target = pair
        try:
            part = self._bin_groups(attribute, target)
        except DataError as error:
            if error.row is None:
                raise
            raise _changed(f"column {error.column!r}: {error.message}") from error  # in a group, which has no row
        for found in part.bins.results:
            if found.status[1] != "error" and found.weight_with_missing != self._tally.total:
                sums = f"{found.weight_with_missing!r}, and not to {self._tally.total!r} as all weights"
                raise _changed(f"the weights of {attribute!r} sum to {sums}")
        return part

    def _bin_groups(self, attribute: str, target: str | None) -> _Part:
        can_join = self._can_join(attribute, target)
        if not (can_join and self._has_many_values(attribute)):
            try:
                return self._bin_values(attribute, target)
            except TooManyGroups:
                if not can_join:
                    raise DataError(self._explain_groups(target), attribute) from None
        return self._bin_buckets(attribute, target)

    def _bin_values(self, attribute: str, target: str | None) -> _Part:
        """With a group for each value."""
        feed, groups = self._open_groups(attribute, target)
        bins = self._bin(feed, target, self._settings)
        return _Part(bins, groups.number)

    def _open_counted(self, attribute: str, target: str | None) -> _core.Feed:
        return self._open_groups(attribute, target)[0]

    def _open_groups(self, attribute: str, target: str | None) -> tuple[_core.Feed, _Groups]:
        has_zeros = pa.types.is_floating(self._schema.field(attribute).type)
        limit = self._reducing.max_groups
        sql = _shapes.group_pair(attribute, target, self._tally.weights, has_zeros, limit + 1)
        groups = _Groups(self._queries.stream(sql), limit, has_zeros)
        return self._make_feed(groups.rename(attribute, target), groups, attribute, target), groups

    def _bin_buckets(self, attribute: str, target: str | None) -> _Part:
        """With a group for each value near a cut, and one for all values between two cuts."""
        settings, reducing = self._settings, self._reducing
        number = self._number_of(attribute)
        assert number is not None
        missing = self._plan.missing_of(attribute)
        deal = Deal(attribute, number, target, self._tally.weights, *missing, self._invalid_values(target))
        num_categories = len(self._categories[target]) if target is not None else 1
        try:
            dealt = deal_out(
                self._queries,
                deal,
                lambda column: self._encode(target, column),
                settings.n_bins,
                num_categories,
                reducing.max_groups,
                reducing.distinct == "exact",
            )
        except TooManyNearTargets:
            raise DataError(
                f"more than max_groups={reducing.max_groups} values lie next to the borders of {settings.n_bins} bins "
                "of equal frequency: allow more groups, or bin with a smaller n_bins",
                attribute,
            ) from None
        if target is not None and settings.max_distinct is not None and dealt.n_distinct <= settings.max_distinct:
            raise DataError(self._explain_groups(target), attribute)
        names = [attribute] if target is None else [attribute, target]
        groups = dealt.groups.rename_columns([*names, ""])
        feed = self._make_feed(groups.schema, iter(groups.to_batches()), attribute, target)
        bins = self._bin(feed, target, replace(settings, max_distinct=None if target is None else 1))
        n_distinct = [max((found.n_distinct or 0) + dealt.n_untold, 0) for found in bins.results]
        return _Part(bins, groups.num_rows, *n_distinct)

    def _bin(self, feed: _core.Feed, target: str | None, settings: RunSettings) -> _core.Bins:
        targets = None if target is None else [1]
        return feed.bin([0], targets, **settings.keywords, temp_dir=settings.temp_dir, progress=None)

    def _make_feed(
        self, schema: pa.Schema, batches: Iterator[pa.RecordBatch], attribute: str, target: str | None
    ) -> _core.Feed:
        """Of groups: the value, the category if there is a target, the weight."""
        names = [attribute] if target is None else [attribute, target]
        feed = self._plan.make_feed(names, open_batches(schema, batches))
        feed.add_field("", "weight", column=len(names))
        feed.set_weights((1, self._tally.total))  # whose grid has all sums of weights that make up the total
        self._set_categories(feed, names)
        return feed

    def _set_categories(self, feed: _core.Feed, names: Sequence[str]) -> None:
        """Tells a feed of the columns `names` their categories and codes."""
        for index, name in enumerate(names):
            if name in self._categories:
                feed.set_categories(index, self._categories[name])
        self._plan.set_codes(feed, names, self._codes)

    def _list_values(self, name: str) -> pa.Table:
        """The values of a column, and how many rows have each. Of one that may have too many to be binned, only so many
        as tell that."""
        limit = _MOST_TO_LIST if name in self._plan.optional else self._reducing.max_groups
        found = self._queries.table(_shapes.list_values(name, limit + 1))
        if found.num_rows > limit and name not in self._plan.optional:
            raise DataError(f"there are more than max_groups={limit} categories", name)
        return found.combine_chunks()

    def _describe_unusable(self, name: str) -> str:
        """Why an optional column can't be binned."""
        values = self._category_values[name]
        missing, _ = self._plan.missing_of(name)
        valid = [(value, rows) for value, rows in zip(*(values[i].to_pylist() for i in range(2))) if value is not None]
        counts = {value: rows for value, rows in valid if value not in missing}
        return _core.describe_unusable(list(counts), sum(counts.values()))

    def _order_categories(self) -> dict[str, _core.CategoryCodes]:
        """The codes of the attributes whose categories are ordered by the rates of a target: a query for each tells
        the weights."""
        codes: dict[str, _core.CategoryCodes] = {}
        for name, target in self._plan.unordered.items():
            names = [name] if target is None else [name, target]
            try:
                codes |= replace(self._plan, pairs=[(name, target)]).count_categories(
                    partial(self._open_counted, name, target), names
                )
            except TooManyGroups:
                raise DataError(self._explain_groups(target), name) from None
        return codes

    def _learn(self, name: str) -> list[Any]:
        """The categories in the library's order: an engine's own may be another."""
        feed = self._plan.make_feed([name], open_stream(pa.table({name: self._category_values[name]["value_"]})))
        try:
            feed.learn()
        except DataError as error:
            raise DataError(error.message, name) from None  # the row is one of the list
        categories = feed.categories(0)
        self._plan.check_categories(name, categories)
        return categories

    def _encode(self, target: str | None, column: pa.ChunkedArray) -> np.ndarray[Any, Any]:
        """The codes of a column of categories; NaN for a missing one."""
        if target is None:
            return np.zeros(len(column))
        feed = self._plan.make_feed([target], open_stream(pa.table({target: column})))
        feed.set_categories(0, self._categories[target])
        return np.concatenate([*_read_codes(feed), np.zeros(0)])

    def _invalid_values(self, target: str | None) -> list[Any]:
        """The target's values that are declared missing, as they stand in its column."""
        if target is None:
            return []
        values = self._category_values[target]["value_"].combine_chunks()
        is_invalid = np.isnan(self._encode(target, pa.chunked_array([values])))
        return [value for value in values.filter(pa.array(is_invalid)).to_pylist() if value is not None]

    def _can_join(self, attribute: str, target: str | None) -> bool:
        """Whether values may be told as one, where they lie in one bin of equal frequency."""
        is_walked = target is None or self._settings.max_distinct is not None
        return is_walked and attribute not in self._categories and self._number_of(attribute) is not None

    def _number_of(self, attribute: str) -> str | None:
        return number_of(attribute, self._schema, self._queries.engine)

    def _has_many_values(self, attribute: str) -> bool:
        """Whether there will be too many groups, as far as an estimate tells."""
        if self._tally.records <= self._few_groups:
            return False
        estimate = self._queries.row(_shapes.count_values_roughly(attribute))["n"]
        return bool(estimate > self._few_groups)

    @property
    def _few_groups(self) -> int:
        """So many are always told one by one, where that is allowed."""
        return min(_FEW_GROUPS, self._reducing.max_groups)

    def _refuse_wide_decimals(self, weight: str | None) -> None:
        kind = None if weight is None else self._schema.field(weight).type
        if kind is not None and pa.types.is_decimal(kind) and kind.precision > EXACT_DIGITS:
            raise DataError(
                f"weights of more than {EXACT_DIGITS} digits are rounded by each engine in its own way: cast the "
                "column to doubles in the engine",
                weight,
            )

    def _explain_groups(self, target: str | None) -> str:
        limit = self._reducing.max_groups
        values = "values" if target is None else "pairs of value and category"
        advice = f"allow more by max_groups, which take about {_size(24 * 2 * limit)} here"
        if target is not None:
            advice = f"pre-bin it by max_distinct, below its number of values, or {advice}"
        return f"there are more than max_groups={limit} {values}: {advice}"


def _read_codes(feed: _core.Feed) -> Iterator[np.ndarray[Any, Any]]:
    """Those of its only column; NaN for a missing one."""
    while len(part := feed.read(1 << 17)[0]) > 0:
        yield part


def _changed(sign: str) -> StreamError:
    return StreamError(f"{sign}: the table was changed while it was read. Bin a snapshot of it")


def _size(number_of_bytes: int) -> str:
    power = max(0, min(3, int(math.log(max(number_of_bytes, 1), 1000))))
    return f"{number_of_bytes / 1000**power:.0f} {['bytes', 'kB', 'MB', 'GB'][power]}"


class _Groups:
    """The batches of a group-by, with the negative zeros in their column, as long as they are not too many."""

    def __init__(self, reader: pa.RecordBatchReader, limit: int, has_zeros: bool) -> None:
        self._reader = reader
        self._limit = limit
        self._has_zeros = has_zeros
        self.number = 0

    def rename(self, attribute: str, target: str | None) -> pa.Schema:
        """The schema, with these names."""
        fields = [field for field in self._reader.schema if field.name != "zero_"]
        names = [attribute] if target is None else [attribute, target]
        return pa.schema([field.with_name(name) for field, name in zip(fields, [*names, ""])])

    def __iter__(self) -> Iterator[pa.RecordBatch]:
        return self

    def __next__(self) -> pa.RecordBatch:
        batch = next(self._reader)
        self.number += batch.num_rows
        if self.number > self._limit:
            raise TooManyGroups
        return restore_zeros(batch) if self._has_zeros else batch


def restore_zeros(batch: pa.RecordBatch) -> pa.RecordBatch:
    """Without the column that tells of a zero's sign."""
    values, is_negative, *others = batch.columns
    zero = pa.scalar(-0.0, values.type)
    names = [name for name in batch.schema.names if name != "zero_"]
    return pa.RecordBatch.from_arrays([pc.if_else(is_negative, zero, values), *others], names=names)
