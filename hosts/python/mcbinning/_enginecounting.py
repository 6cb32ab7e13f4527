"""Records that an engine counts in bins that are there already."""

from __future__ import annotations

from collections.abc import Sequence
from typing import TYPE_CHECKING, Any

import pyarrow as pa

from . import _core, _shapes
from ._bins import Variable
from ._engines import CountedQueries
from ._errors import DataError
from ._shapes import Deal, Weights
from ._sources import Source, open_stream
from ._tallies import Tally, number_of, tally_weights
from ._transform import add_variable

if TYPE_CHECKING:
    from ._bins import AttributeBins
    from ._result import BinningResult

_MOST_VALUES = 20_000_000


def count_in_engine(
    result: BinningResult,
    source: Source,
    counted: Sequence[tuple[int, int, int | None]],
    columns: Sequence[tuple[Variable, str]],
) -> _core.Evaluation:
    """Counts the results, each of which is told with the indices of its column and its target's. The engine sums the
    weights of each bin and category; where it may read numbers otherwise than the library, those of each value."""
    assert source.open_engine is not None
    weight = next(((variable, name) for variable, name in columns if variable.role == "weight"), None)
    with source.open_engine() as engine:
        engine.check_columns([name for _, name in columns])
        queries = CountedQueries(engine)
        schema = queries.stream(f"SELECT * FROM {_shapes.ROWS} LIMIT 0").schema
        tally = tally_weights(_weights_of(weight), queries)
        counter = _Counter(result, queries, schema, tally)
        parts, unseen = [], {}
        for index, attribute, target in counted:
            part = counter.count(index, columns[attribute], None if target is None else columns[target])
            parts.append(part)
            unseen[target] = part.weight_of_unseen_targets
        name, step = source.name, tally.step
        total = sum(unseen.values())
        return _core.Evaluation.join(result._core, parts, name, tally.records, tally.without_weight, step, total)


def _weights_of(weight: tuple[Variable, str] | None) -> Weights:
    if weight is None:
        return Weights(None)
    variable, name = weight
    rounding: Any = variable.rounding or "none"
    return Weights(
        name, rounding, variable.missing_values, variable.missing_interval, variable.weight_scale is not None
    )


class _Counter:
    def __init__(self, result: BinningResult, queries: CountedQueries, schema: pa.Schema, tally: Tally) -> None:
        self._result = result
        self._queries = queries
        self._schema = schema
        self._tally = tally

    def count(
        self, index: int, attribute: tuple[Variable, str], target: tuple[Variable, str] | None
    ) -> _core.Evaluation:
        found = self._result.bins[index]
        column = attribute[1]
        number = None if found.variable.is_categorical else number_of(column, self._schema, self._queries.engine)
        category = None if target is None else target[1]
        groups = (
            self._sum_values(column, category)
            if number is None
            else self._sum_bins(found, Deal(column, number, category, self._tally.weights, *_missing_of(found), ()))
        )
        feed = _core.Feed(open_stream(groups))
        table = open_stream(groups.schema.empty_table())
        for variable, name in [attribute, target] if target is not None else [attribute]:
            add_variable(feed, table, variable, name, self._result.missing_text, "kept")
        feed.add_field("", "weight", column=groups.num_columns - 1)
        feed.set_weights((1, self._tally.total))  # whose grid has all sums of weights that make up the total
        fields = (index, 0, None if target is None else 1)
        return feed.count(self._result._core, [fields], None, are_groups=number is not None)

    def _sum_values(self, attribute: str, target: str | None) -> pa.Table:
        """A row for each value and category."""
        sql = _shapes.group_pair(attribute, target, self._tally.weights, False, _MOST_VALUES + 1)
        groups = self._queries.table(sql)
        if groups.num_rows > _MOST_VALUES:
            raise DataError(f"there are more than {_MOST_VALUES} values", attribute)
        names = [attribute] if target is None else [attribute, target]
        return groups.rename_columns([*names, ""])

    def _sum_bins(self, found: AttributeBins, deal: Deal) -> pa.Table:
        """A row for each group with its least value, and one that weighs nothing with its largest."""
        extremes = found.minimum, found.maximum
        groups = self._queries.table(deal.count_bins(found.cut_points.tolist(), found.closed, extremes))
        weights = groups["weight_"].cast(pa.float64())
        parts = []
        for value, weight in (("low_", weights), ("high_", pa.array([0.0] * groups.num_rows, pa.float64()))):
            columns = {deal.attribute: groups[value]}
            if deal.target is not None:
                columns[deal.target] = groups["category_"]
            parts.append(pa.table({**columns, "": weight}))
        return pa.concat_tables(parts)


def _missing_of(found: AttributeBins) -> tuple[tuple[float, ...], tuple[float, float] | None]:
    return tuple(map(float, found.variable.missing_values)), found.variable.missing_interval
