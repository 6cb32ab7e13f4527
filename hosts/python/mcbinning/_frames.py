"""Data in memory, or that Python code makes: pandas, polars, pyarrow."""

from __future__ import annotations

from collections.abc import Iterator, Sequence
from typing import Any

import numpy as np

from . import _core
from ._errors import DataError
from ._sources import Column, Source, columns_of, once, open_batches, open_stream

_ROWS_AT_ONCE = 1 << 14


def open_pandas(frame: Any) -> Source:
    import pyarrow as pa

    all_names = [str(name) for name in frame.columns]

    def open_columns(names: Sequence[str] | None) -> _core.Table:
        positions = range(len(all_names)) if names is None else [all_names.index(name) for name in names]
        arrays = [_convert(frame.iloc[:, i], all_names[i]) for i in positions]
        return open_stream(pa.Table.from_arrays(arrays, names=[all_names[i] for i in positions]))

    def describe() -> Sequence[Column]:
        return [_describe_pandas(frame.iloc[:, i], name) for i, name in enumerate(all_names)]

    return Source(open_columns, False, rows=len(frame), describe=describe)


def _describe_pandas(column: Any, name: str) -> Column:
    import pyarrow as pa

    # Only the values tell what a column of objects holds; of all others the type does.
    is_of_objects = column.dtype == np.dtype(object)
    try:
        array = _convert(column if is_of_objects else column.iloc[:0], name)
    except DataError:
        return Column(name, "objects of several types" if is_of_objects else str(column.dtype), is_usable=False)
    return columns_of(open_stream(pa.Table.from_arrays([array], names=[name])))[0]


def _convert(column: Any, name: str) -> Any:
    """As an Arrow array. None and NA become nulls; a NaN among plain floats stays one, and these aren't copied."""
    import pandas as pd
    import pyarrow as pa

    if isinstance(column.dtype, pd.PeriodDtype):
        column = column.dt.to_timestamp()
    elif isinstance(column.dtype, pd.SparseDtype):
        column = column.sparse.to_dense()
    is_plain_float = isinstance(column.dtype, np.dtype) and column.dtype.kind == "f"
    try:
        return _measure(pa.array(column, from_pandas=not is_plain_float))
    except (pa.ArrowInvalid, pa.ArrowTypeError, pa.ArrowNotImplementedError) as error:
        raise DataError(" ".join(map(str, error.args)), name) from error


def _measure(array: Any) -> Any:
    """Without the order of a categorical, where that is the one of its values, which are numbers or dates: these are
    measured then, and keep their order."""
    import pyarrow as pa

    chunks = array.chunks if isinstance(array, pa.ChunkedArray) else [array]
    if not pa.types.is_dictionary(array.type) or not array.type.ordered or not all(map(_is_ascending, chunks)):
        return array
    plain = pa.dictionary(array.type.index_type, array.type.value_type)
    return pa.chunked_array(
        [pa.DictionaryArray.from_arrays(chunk.indices, chunk.dictionary) for chunk in chunks], type=plain
    )


def _is_ascending(array: Any) -> bool:
    import pyarrow as pa
    import pyarrow.compute as pc

    kind = array.type.value_type
    is_measured = pa.types.is_integer(kind) or pa.types.is_floating(kind) or pa.types.is_temporal(kind)
    values = array.dictionary
    return is_measured and bool(pc.all(pc.less(values[:-1], values[1:]), min_count=0).as_py())


def open_polars(frame: Any) -> Source:
    return Source(
        lambda names: open_stream(frame if names is None else frame.select(names)),
        False,
        rows=len(frame),
        describe=lambda: columns_of(open_stream(frame.clear())),
    )


def open_polars_lazy(frame: Any) -> Source:
    """Reads the results of a query as they come."""
    import polars

    schema = frame.collect_schema()
    empty = polars.DataFrame(schema=schema)

    def open_columns(names: Sequence[str] | None) -> _core.Table:
        chosen = schema.names() if names is None else list(names)
        batches = _collect(frame.select(chosen))
        return open_batches(empty.select(chosen).to_arrow().schema, batches)

    return Source(open_columns, False, describe=lambda: columns_of(open_stream(empty)))


def _collect(query: Any) -> Iterator[Any]:
    if not hasattr(query, "collect_batches"):  # older versions keep the whole result
        yield from query.collect().to_arrow().to_batches()
        return
    for part in query.collect_batches(chunk_size=_ROWS_AT_ONCE, maintain_order=True):
        yield from part.to_arrow().to_batches()


def open_pyarrow(data: Any) -> Source:
    import pyarrow as pa

    if isinstance(data, pa.RecordBatch):
        data = pa.Table.from_batches([data])
    if isinstance(data, pa.Table):
        return _open_table(data)
    if hasattr(data, "scanner"):  # a dataset
        return Source(lambda names: _open_reader(data.scanner(columns=names).to_reader()), False)
    if hasattr(data, "to_reader"):  # a scanner
        data = data.to_reader()
    if isinstance(data, pa.RecordBatchReader):
        return once(_open_reader(data))
    raise TypeError(f"{type(data).__name__} is not a table")


def _open_table(table: Any) -> Source:
    for i, field in enumerate(table.schema):
        measured = _measure(table.column(i))
        if measured is not table.column(i):
            table = table.set_column(i, field.name, measured)
    return Source(
        lambda names: open_stream(table if names is None else table.select(names)),
        False,
        rows=table.num_rows,
        describe=lambda: columns_of(open_stream(table.schema.empty_table())),
    )


def _open_reader(reader: Any) -> _core.Table:
    return open_batches(reader.schema, iter(reader))
