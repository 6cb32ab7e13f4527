"""What queries need to know of a table before they look at attributes: its weights, and its numbers."""

from __future__ import annotations

import math
from dataclasses import dataclass, replace
from typing import Any

import pyarrow as pa

from . import _core, _shapes
from ._engines import CountedQueries, Engine
from ._errors import DataError
from ._shapes import Weights

EXACT_DIGITS = 15
"""A decimal of so many digits has a double of its own, which all engines find."""


@dataclass(frozen=True)
class Tally:
    """What is known of all rows before the first attribute is looked at."""

    records: int
    without_weight: int | None
    total: float
    """Of all weights."""
    weights: Weights
    """On their grid."""
    step: float | None
    """That of the grid, if a weight has moved."""


def tally_weights(weights: Weights, queries: CountedQueries) -> Tally:
    """Checks the weights and puts them on the grid that a run over the rows has."""
    if weights.column is None:
        records = int(queries.row(_shapes.check_weights(weights))["records"])
        return Tally(records, None, float(records), weights, None)
    found = queries.row(_shapes.check_weights(weights))
    for fault, words in (("nan", "NaN"), ("negative", "negative"), ("infinite", "infinite")):
        if found[fault]:
            number = int(found[fault])
            raise DataError(f"{number} weights are {words}" if number > 1 else f"one weight is {words}", weights.column)
    on_grid, sums = _sum_on_grid(weights, found, queries)
    if weights.is_scaled and found["positive"]:
        weights = replace(weights, scale=int(found["positive"]) / float(sums["total"]))
        on_grid, sums = _sum_on_grid(weights, found, queries)
    if not math.isfinite(sums["total"]):
        raise DataError("the weights sum to more than any number", weights.column)
    counts = int(found["records"]), int(found["without_weight"])
    if not sums["moved"]:
        return Tally(*counts, float(sums["total"]), weights, None)
    assert on_grid.grid is not None
    return Tally(*counts, float(sums["total"]), on_grid, math.prod(on_grid.grid))


def _sum_on_grid(weights: Weights, found: dict[str, Any], queries: CountedQueries) -> tuple[Weights, dict[str, Any]]:
    """The weights, of which `check_weights` has told, on their grid, and what `sum_weights` tells of them."""
    if not found["positive"]:
        return weights, queries.row(_shapes.sum_weights(weights))
    grid = _core.grid_factors(int(found["positive"]), float(found["largest"]) * weights.scale)
    on_grid = replace(weights, grid=grid)
    return on_grid, queries.row(_shapes.sum_weights(on_grid))


def number_of(attribute: str, schema: pa.Schema, engine: Engine) -> str | None:
    """SQL for the values of a column as doubles; None if engines may differ in them."""
    kind = schema.field(attribute).type
    if pa.types.is_timestamp(kind):
        ticks = engine.microseconds(attribute)
        return None if ticks is None else f"CAST({ticks} AS DOUBLE)"
    is_exact = pa.types.is_integer(kind) or pa.types.is_floating(kind)
    if pa.types.is_decimal(kind):
        is_exact = kind.precision <= EXACT_DIGITS
    return _shapes.as_double(attribute) if is_exact else None
