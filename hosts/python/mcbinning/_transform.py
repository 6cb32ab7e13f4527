"""The bins of new data."""

from __future__ import annotations

import warnings
from collections.abc import Callable, Iterator, Sequence
from typing import TYPE_CHECKING, Any

import numpy as np
import pyarrow as pa

from . import _core
from ._errors import DataError, warning_of
from ._files import Reading
from ._opening import open_source
from ._sources import Source, check_names, columns_of
from ._spark import is_spark_frame
from ._types import Encoding, MemoryLimit, Unseen

if TYPE_CHECKING:
    from ._bins import AttributeBins, Variable
    from ._result import BinningResult

_ROWS_AT_ONCE = 1 << 17
_KINDS = {"number": pa.int32(), "label": pa.utf8(), "woe": pa.float64(), "rate": pa.float64()}


def transform(
    result: BinningResult,
    name_columns: Callable[[list[str], str], list[tuple[int, str]]],
    data: Any,
    encode: Encoding,
    unseen: Unseen,
    memory_limit: MemoryLimit | None,
) -> Any:
    """`name_columns` takes the names of the data's columns and the encoding, and gives the index of the result and the
    name of each column of bins."""
    if unseen not in ("error", "missing"):
        raise ValueError(f"unseen must be 'error' or 'missing', not {unseen!r}")
    variables = {found.attribute: found.variable for found in result.bins if found.n_bins}
    texts = {name: variable.missing_texts for name, variable in variables.items() if variable.missing_texts}
    source = open_source(data, Reading(result.missing_text, texts, memory_limit))
    named = name_columns([column.name for column in source.columns], encode)
    for found in result.bins:
        if not found.n_bins:
            warnings.warn(warning_of(found.attribute, found.status), stacklevel=3)
    if is_spark_frame(data):
        from ._sparkbins import add_bins

        return add_bins(data, source, result, named, encode, unseen)
    feed = open_values(source, list(variables.values()), result.missing_text, unseen)
    schema = pa.schema([(name, _KINDS[encode]) for _, name in named])
    chosen = [(result.bins[index], list(variables).index(result.bins[index].attribute)) for index, _ in named]
    batches = _batches(feed, chosen, schema, encode)
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
    feed = _core.Feed(table)
    for variable in variables:
        add_variable(feed, table, variable, variable.name, missing_text, unseen)
    return feed


def add_variable(
    feed: _core.Feed, table: _core.Table, variable: Variable, name: str, missing_text: Sequence[str], unseen: str
) -> None:
    """Adds a field with the values of a variable, which are in the table's column of this name."""
    columns = columns_of(table)
    position = [column.name for column in columns].index(name)
    use = "weight" if variable.role == "weight" else "category" if variable.is_categorical else "attribute"
    index = feed.add_field(name, use, column=position, rounding=variable.rounding or "none")
    values = list(variable.missing_values)
    if columns[position].kind == "text":
        feed.declare_missing(index, [], None, [*map(str, values), *missing_text])
    else:
        feed.declare_missing(index, _as_numbers(values, variable), variable.missing_interval, [])
    if variable.categories is not None:
        feed.set_categories(index, _as_in_column(list(variable.categories), variable, columns[position].kind), unseen)
    if variable.rare_code is not None:
        feed.set_unseen_code(index, variable.rare_code)


def _as_in_column(categories: list[Any], variable: Variable, kind: str) -> list[Any]:
    if kind != "text":
        return _as_numbers(categories, variable)
    if variable.kind != "text":
        raise DataError("the column holds texts, but its categories are numbers", variable.name)
    return categories


def _as_numbers(values: list[Any], variable: Variable) -> list[float]:
    """Of a column of numbers whose categories come from a text file, which has texts alone."""
    try:
        return [float(value) for value in values]
    except ValueError as error:
        raise DataError(f"the column holds no texts, but its categories are texts: {error}", variable.name) from error


def _batches(
    feed: _core.Feed, chosen: Sequence[tuple[AttributeBins, int]], schema: pa.Schema, encode: Encoding
) -> Iterator[pa.RecordBatch]:
    """`chosen` are bins, and the position of their attribute in the feed."""
    codes = [found.codes(encode) for found, _ in chosen]
    while True:
        columns = feed.read(_ROWS_AT_ONCE)
        if not columns or len(columns[0]) == 0:
            return
        arrays = []
        for (found, position), by_bin in zip(chosen, codes):
            bins = found.bin_numbers(columns[position])
            if encode in ("woe", "rate"):
                arrays.append(pa.array(by_bin[bins]))
                continue
            array = pa.array(bins.astype(np.int32), mask=bins > len(found.cut_points))
            arrays.append(pa.array(found.labels, pa.utf8()).take(array) if encode == "label" else array)
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
