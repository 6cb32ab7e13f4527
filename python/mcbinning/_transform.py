"""The bins of new data."""

from __future__ import annotations

from collections.abc import Iterator, Sequence
from typing import Any

import numpy as np
import pyarrow as pa

from . import _core
from ._errors import DataError
from ._result import AttributeBins, BinningResult, Variable
from ._sources import Source, columns_of, open_source

_ROWS_AT_ONCE = 1 << 17


def transform(result: BinningResult, data: Any, labels: bool) -> Any:
    chosen = _one_for_each_attribute(result.bins)
    source = open_source(data)
    feed = open_values(source, [found.variable for found in chosen])
    schema = pa.schema([(found.attribute, pa.utf8() if labels else pa.int32()) for found in chosen])
    batches = _batches(feed, chosen, schema, labels)
    if source.rows is None:
        return pa.RecordBatchReader.from_batches(schema, batches)
    return _like(data, pa.Table.from_batches(batches, schema))


def open_values(source: Source, variables: Sequence[Variable]) -> _core.Feed:
    """A feed of the variables' values as numbers and codes; what is declared missing is NaN in what it reads."""
    names = [variable.name for variable in variables]
    known = {column.name for column in source.columns}
    for name in names:
        if name not in known:
            raise DataError("there is no such column", name)
    table = source.open(names)
    places = [column.name for column in columns_of(table)]
    feed = _core.Feed(table)
    for index, variable in enumerate(variables):
        use = "category" if variable.is_categorical else "attribute"
        feed.add_variable(variable.name, use, column=places.index(variable.name))
        is_text = variable.kind == "text"
        values = list(variable.missing_values)
        feed.declare_missing(index, [] if is_text else values, variable.missing_interval, values if is_text else [])
        if variable.categories is not None:
            feed.set_categories(index, list(variable.categories))
    return feed


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
