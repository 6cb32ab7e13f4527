"""The bins of new data."""

from __future__ import annotations

from collections.abc import Iterator, Sequence
from typing import Any

import numpy as np
import pyarrow as pa

from . import _core
from ._errors import DataError
from ._result import AttributeBins, BinningResult, Variable
from ._files import Reading
from ._opening import open_source
from ._sources import Source, check_names, columns_of
from ._types import MemoryLimit, Unseen

_ROWS_AT_ONCE = 1 << 17


def transform(
    result: BinningResult, data: Any, labels: bool, unseen: Unseen, memory_limit: MemoryLimit | None
) -> Any:
    if unseen not in ("error", "missing"):
        raise ValueError(f"unseen must be 'error' or 'missing', not {unseen!r}")
    chosen = _one_for_each_attribute(result.bins)
    texts = {found.attribute: found.variable.missing_texts for found in chosen if found.variable.missing_texts}
    source = open_source(data, Reading(result.missing_text, texts, memory_limit))
    feed = open_values(source, [found.variable for found in chosen], result.missing_text, unseen)
    schema = pa.schema([(found.attribute, pa.utf8() if labels else pa.int32()) for found in chosen])
    batches = _batches(feed, chosen, schema, labels)
    if source.rows is None:
        return pa.RecordBatchReader.from_batches(schema, batches)
    return _like(data, pa.Table.from_batches(batches, schema))


def open_values(
    source: Source, variables: Sequence[Variable], missing_text: Sequence[str], unseen: Unseen
) -> _core.Feed:
    """A feed of the variables' values as numbers and codes; what is declared missing is NaN in what it reads."""
    names = [variable.name for variable in variables]
    check_names(source, names)
    table = source.open(names)
    columns = columns_of(table)
    places = [column.name for column in columns]
    feed = _core.Feed(table)
    for index, variable in enumerate(variables):
        place = places.index(variable.name)
        feed.add_variable(variable.name, "category" if variable.is_categorical else "attribute", column=place)
        values = list(variable.missing_values)
        if columns[place].kind == "text":
            feed.declare_missing(index, [], None, [*map(str, values), *missing_text])
        else:
            feed.declare_missing(index, _as_numbers(values, variable), variable.missing_interval, [])
        if variable.categories is not None:
            categories = list(variable.categories)
            feed.set_categories(
                index, categories if columns[place].kind == "text" else _as_numbers(categories, variable), unseen
            )
    return feed


def _as_numbers(values: list[Any], variable: Variable) -> list[float]:
    """Of a column of numbers whose categories come from a text file, which has texts alone."""
    try:
        return [float(value) for value in values]
    except ValueError as error:
        raise DataError(f"the column holds no texts, but its categories are texts: {error}", variable.name) from error


def _one_for_each_attribute(bins: Sequence[AttributeBins]) -> list[AttributeBins]:
    chosen = {found.attribute: found for found in bins if not found.status.is_error}
    if len(chosen) < sum(not found.status.is_error for found in bins):
        raise ValueError("there are bins of one attribute against several targets: transform a result of one target")
    return list(chosen.values())


def _batches(
    feed: _core.Feed, chosen: Sequence[AttributeBins], schema: pa.Schema, labels: bool
) -> Iterator[pa.RecordBatch]:
    while True:
        columns = feed.read(_ROWS_AT_ONCE)
        if not columns or len(columns[0]) == 0:
            return
        arrays = []
        for found, values in zip(chosen, columns):
            bins = found.bin_numbers(values).astype(np.int32)
            array = pa.array(bins, mask=bins > len(found.cut_points))
            arrays.append(pa.array(found.labels, pa.utf8()).take(array) if labels else array)
        yield pa.RecordBatch.from_arrays(arrays, schema=schema)


def _like(data: Any, table: pa.Table) -> Any:
    """The table as the kind of thing that `data` is."""
    module = type(data).__module__.partition(".")[0]
    if module == "pandas":
        frame = table.to_pandas(types_mapper=_nullable)
        frame.index = data.index
        return frame
    if module == "polars":
        import polars

        return polars.from_arrow(table)
    return table


def _nullable(kind: pa.DataType) -> Any:
    import pandas as pd

    return pd.Int32Dtype() if pa.types.is_integer(kind) else None
