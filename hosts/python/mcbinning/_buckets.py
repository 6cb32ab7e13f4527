"""Fewer groups for an attribute that is cut at equal frequencies: its values are told one by one only where such a cut
may fall.

The library's walk along the values takes a cut next to where the cumulated weight meets i/n of the total. Values are
dealt out into buckets that rise with them. All values of a bucket that lies strictly between two such points can be
told as one of them: its weight is exact, and no cut falls inside. A bucket with such a point, or next to one, is dealt
out again until it is small, and its values are then told as they are.
"""

from __future__ import annotations

import math
from collections.abc import Callable
from dataclasses import dataclass
from typing import TYPE_CHECKING, Any

import numpy as np
import numpy.typing as npt
import pyarrow as pa
import pyarrow.compute as pc

from . import _shapes
from ._shapes import Deal, Piece
from ._values import Codes, Floats

if TYPE_CHECKING:
    from ._engines import CountedQueries

_BUCKETS = 1 << 20
"""Of one deal, over all categories."""
_FEWEST_PIECES = 16
"""Of a bucket that is dealt out again, however many of them there are."""
_FEW_ROWS = 1 << 22
"""Buckets that hold no more are small enough for their values to be told."""
_MOST_DEALS = 8
"""Two or three are enough for data that are not made to need more."""
_SLACK = 1e-12
"""Of the total: far more than what the walk calls equal, and than what the rounding of i/n does."""

Encode = Callable[[pa.ChunkedArray], Floats]
"""Gives the codes of a column of categories, with NaN for a missing one."""


class TooManyNearTargets(Exception):
    """More values lie near the cuts than may be told."""


@dataclass(frozen=True)
class Dealt:
    groups: pa.Table
    """Values, categories if there is a target, and weights."""
    n_distinct: int
    """Of all values that count."""
    n_untold: int
    """How many of these are told as others."""


def deal_out(
    queries: CountedQueries,
    deal: Deal,
    encode: Encode,
    n_bins: int,
    num_categories: int,
    max_groups: int,
    is_exact: bool,
) -> Dealt:
    """The groups of which the library makes the bins that it makes of all values. `is_exact` tells whether the values
    are counted exactly."""
    most_buckets = max(1, _BUCKETS // num_categories)
    extremes = queries.table(deal.find_extremes())
    dealt = _deal_first(deal, extremes, most_buckets)
    parents = None
    parts = [_tell_extremes(extremes)]
    num_joined = 0
    for deals_left in reversed(range(_MOST_DEALS)):
        buckets = _read_buckets(queries.table(_shapes.sum_buckets(dealt)), encode, parents)
        is_kept = buckets.lie_near(n_bins)
        parts.append(buckets.join(~is_kept))
        num_joined += int(np.count_nonzero(~is_kept & (buckets.weight > 0.0)))
        is_wide = is_kept & (buckets.low < buckets.high)
        if buckets.rows[is_wide].sum() <= min(_FEW_ROWS, max_groups) or deals_left == 0:
            break
        num_pieces = max(_FEWEST_PIECES, most_buckets // int(np.count_nonzero(is_kept)))
        pieces, parents = buckets.cut_up(is_kept, num_pieces)
        dealt = _shapes.deal_again(dealt, pieces)
    told = queries.table(_shapes.sum_values(dealt, buckets.ids[is_kept[buckets.of_id]].tolist(), max_groups + 1))
    if told.num_rows > max_groups:
        raise TooManyNearTargets
    parts += [_restore_zeros(told), _tell_missing(queries.table(deal.sum_missing()), told.schema.field("value_").type)]
    n_distinct = int(queries.row(deal.count_values(is_exact))["n"])
    columns = ["value_", *(["category_"] if deal.target is not None else []), "weight_"]
    groups = pa.concat_tables([part.select(columns) for part in parts], promote_options="permissive")
    return Dealt(groups, n_distinct, n_distinct - _count_values(told, encode) - num_joined)


@dataclass(frozen=True)
class _Parents:
    """The buckets of one deal that are dealt out again, by their position."""

    before: Floats
    """The weight in front of each."""
    num_numbers: int
    """How many numbers there are for the buckets of each."""
    total: float
    """The weight of all rows that count, in these buckets or not."""


@dataclass(frozen=True)
class _Buckets:
    """The buckets of one deal, in the order of their values."""

    sums: pa.Table
    """By number and category."""
    of_row: Codes
    """The bucket of each row of the sums."""
    ids: npt.NDArray[np.int64]
    """All numbers."""
    of_id: Codes
    """The bucket of each."""
    low: Floats
    high: Floats
    rows: Floats
    weight: Floats
    """Of the rows that count."""
    before: Floats
    """The weight of the rows that count and lie in front."""
    total: float
    """The weight of all that count."""

    def lie_near(self, n_bins: int) -> npt.NDArray[np.bool_]:
        """Whether a cut may fall into the bucket or next to it, or an outer value lies in it."""
        after = self.before + self.weight
        needs = np.arange(1, n_bins) / n_bins * self.total
        slack = _SLACK * self.total
        first = np.searchsorted(needs, self.before - slack, side="left")
        last = np.searchsorted(needs, after + slack, side="right")
        is_outer = (self.weight > 0.0) & ((self.before == 0.0) | (after == self.total))
        near: npt.NDArray[np.bool_] = (first < last) | is_outer
        return near

    def join(self, is_joined: npt.NDArray[np.bool_]) -> pa.Table:
        """The sums of some buckets, with one value for each of them."""
        order = np.lexsort([_numbers(self.sums["low_"]), self.of_row])
        firsts = order[np.searchsorted(self.of_row[order], np.arange(len(self.low)))]
        rows = np.flatnonzero(is_joined[self.of_row])
        values = self.sums["value_"].take(pa.array(firsts[self.of_row[rows]]))
        return self.sums.take(pa.array(rows)).set_column(self.sums.schema.get_field_index("value_"), "value_", values)

    def cut_up(self, is_kept: npt.NDArray[np.bool_], num_pieces: int) -> tuple[list[Piece], _Parents]:
        """Some buckets, each in so many pieces of equal width."""
        positions = np.flatnonzero(is_kept)
        pieces = []
        for parent, position in enumerate(positions.tolist()):
            # An infinity has a bucket of its own, which stays as it is.
            ends = np.clip([self.low[position], self.high[position]], -_shapes.LARGEST, _shapes.LARGEST)
            low, high = ends.tolist()
            scale = min(num_pieces / (high - low), _shapes.LARGEST) if low < high else 0.0
            pieces += [
                Piece(number, parent * (num_pieces + 1), low, high, scale)
                for number in self.ids[self.of_id == position].tolist()
            ]
        return pieces, _Parents(self.before[positions], num_pieces + 1, self.total)


def _deal_first(deal: Deal, extremes: pa.Table, most_buckets: int) -> str:
    least, most = (extremes[name][0].as_py() for name in ("least_", "most_"))
    num_pieces = max(1, most_buckets // 2)
    log_of_least = math.log(least) if least else 0.0
    width = math.log(most) - log_of_least if least else 0.0
    has_zeros = pa.types.is_floating(extremes.schema.field("value_").type)
    return deal.deal_by_logarithm(log_of_least, num_pieces / width if width > 0.0 else 0.0, num_pieces, has_zeros)


def _read_buckets(sums: pa.Table, encode: Encode, parents: _Parents | None) -> _Buckets:
    """Neighbours whose values overlap, since an engine's logarithm fell by a last digit where it should rise, become
    one bucket."""
    ids, index = np.unique(sums["bucket_"].to_numpy().astype(np.int64), return_inverse=True)
    low = _reduce(np.minimum, index, _numbers(sums["low_"]), len(ids))
    high = _reduce(np.maximum, index, _numbers(sums["high_"]), len(ids))
    is_apart = low[1:] > np.maximum.accumulate(high)[:-1]
    of_id = np.concatenate([[0], np.cumsum(is_apart)])[: len(ids)].astype(np.intp)
    firsts = np.unique(of_id, return_index=True)[1]
    num_buckets = len(firsts)
    is_counted = ~np.isnan(encode(sums["category_"]))
    weight = _sum(of_id[index], np.where(is_counted, _numbers(sums["weight_"]), 0.0), num_buckets)
    before = np.cumsum(weight) - weight
    total = float(weight.sum())
    if parents is not None:
        parent = ids[firsts] // parents.num_numbers
        first_of_parent = np.searchsorted(parent, parent)
        before += parents.before[parent] - before[first_of_parent]
        total = parents.total
    return _Buckets(
        sums,
        of_id[index],
        ids,
        of_id,
        _reduce(np.minimum, of_id, low, num_buckets),
        _reduce(np.maximum, of_id, high, num_buckets),
        _sum(of_id[index], _numbers(sums["rows_"]), num_buckets),
        weight,
        before,
        total,
    )


def _sum(index: Codes, values: Floats, size: int) -> Floats:
    """The sum of the values of each index."""
    sums: Any = np.bincount(index, values, size)
    return np.asarray(sums, dtype=np.float64)


def _reduce(operation: np.ufunc, index: Codes, values: Floats, size: int) -> Floats:
    """The least or the largest of the values of each index."""
    found = np.full(size, math.inf if operation is np.minimum else -math.inf)
    operation.at(found, index, values)
    return found


def _numbers(column: pa.ChunkedArray) -> Floats:
    """Whole numbers below 2^53, or doubles."""
    numbers: Floats = column.cast(pa.float64()).to_numpy()
    return numbers


def _tell_extremes(extremes: pa.Table) -> pa.Table:
    """The finite extremes of all rows, also of those that do not count: with no weight, as cuts next to an infinity are
    told by them."""
    kind = extremes.schema.field("value_").type
    values = pa.chunked_array([*extremes["value_"].chunks, *extremes["highest_"].chunks], kind)
    return pa.table({"value_": values, "category_": pa.nulls(len(values)), "weight_": np.zeros(len(values))})


def _tell_missing(sums: pa.Table, kind: pa.DataType) -> pa.Table:
    return sums.append_column("value_", pa.nulls(sums.num_rows, kind))


def _restore_zeros(told: pa.Table) -> pa.Table:
    values = told["value_"]
    if pa.types.is_floating(values.type):
        values = pc.if_else(told["zero_"], pa.scalar(-0.0, values.type), values)
    return told.set_column(told.schema.get_field_index("value_"), "value_", values)


def _count_values(told: pa.Table, encode: Encode) -> int:
    """How many different values count."""
    counts = ~np.isnan(encode(told["category_"])) & (_numbers(told["weight_"]) > 0.0)
    values = told["value_"].filter(pa.array(counts))
    if pa.types.is_timestamp(values.type):
        values = values.cast(pa.int64())
    return len(np.unique(values.cast(pa.float64(), safe=False).to_numpy()))
