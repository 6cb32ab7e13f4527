"""Where the records come from: any table, stream or file, as one kind of thing."""

from __future__ import annotations

import errno
import glob
import os
from collections.abc import Callable, Mapping, Sequence
from dataclasses import dataclass
from functools import cached_property
from typing import Any

import numpy as np

from . import _core
from ._errors import DataError, StreamError

_FILE_FUNCTIONS = {
    ".parquet": "read_parquet",
    ".json": "read_json",
    ".jsonl": "read_json",
    ".ndjson": "read_json",
}

_ROWS_AT_ONCE = 2048


@dataclass(frozen=True)
class Column:
    name: str
    kind: str
    """`"float"`, `"integer"`, `"decimal"`, `"boolean"`, `"date"`, `"timestamp"`, `"text"` or `"null"`."""
    time_zone: str
    is_usable: bool


@dataclass(frozen=True)
class Source:
    """Data to read."""

    open: Callable[[Sequence[str] | None], _core.Table]
    """Begins to read the named columns, or all; what it gives may have further ones."""
    is_once: bool
    """It gives the same table each time, which can be read once."""
    name: str | None = None
    rows: int | None = None
    """How many there are, where that is known."""
    peek: Callable[[], _core.Table] | None = None
    """Gives a table of the same columns, where that is cheaper than to begin to read."""

    @cached_property
    def columns(self) -> tuple[Column, ...]:
        return columns_of(self.peek() if self.peek else self.open(None))


def check_names(source: Source, names: Sequence[str]) -> None:
    """Each is that of one column."""
    known = [column.name for column in source.columns]
    for name in names:
        if name not in known:
            raise DataError("there is no such column", name)
        if known.count(name) > 1:
            raise DataError("there are several columns of this name", name)


def columns_of(table: _core.Table) -> tuple[Column, ...]:
    return tuple(Column(*fields) for fields in table.columns)


def open_source(
    data: Any, missing_text: Sequence[str] = (), missing_texts: Mapping[str, Sequence[str]] | None = None
) -> Source:
    """Any object with the Arrow stream protocol, or a path that DuckDB reads. In a text file each of `missing_text`
    stands for a missing value, as an empty field does; and so does each of `missing_texts`, by the name of the column,
    in a column of numbers."""
    if isinstance(data, (str, os.PathLike)):
        return _open_path(os.fspath(data), missing_text, missing_texts or {})
    kind = type(data)
    module = kind.__module__.partition(".")[0]
    if module in ("duckdb", "_duckdb") and hasattr(data, "project"):
        return _open_relation(data)
    if module == "pandas" and hasattr(data, "columns"):
        return _open_pandas(data)
    if module == "polars" and hasattr(data, "select") and hasattr(data, "__arrow_c_stream__"):
        return Source(lambda names: _stream(data if names is None else data.select(names)), False, rows=len(data))
    if module == "pyarrow":
        return _open_pyarrow(data)
    if hasattr(data, "__arrow_c_stream__"):
        return _once(_stream(data))
    raise TypeError(f"{kind.__name__} is neither a path nor an object with __arrow_c_stream__")


def _stream(data: Any) -> _core.Table:
    return _core.Table.from_stream(data.__arrow_c_stream__())


def _once(table: _core.Table) -> Source:
    return Source(lambda names: table, True)


def _quote(name: str) -> str:
    return '"' + name.replace('"', '""') + '"'


def _quote_all(names: Sequence[str]) -> str:
    return ", ".join(map(_quote, names))


def _open_relation(relation: Any, name: str | None = None) -> Source:
    return Source(
        lambda names: _read(relation if names is None else relation.project(_quote_all(names))),
        False,
        name=name,
        peek=lambda: _stream(relation.limit(0)),
    )


def _read(relation: Any) -> _core.Table:
    """In small batches: DuckDB holds several, and those of wide tables are large."""
    import duckdb

    begin = getattr(relation, "to_arrow_reader", None) or relation.fetch_record_batch
    try:
        reader = begin(_ROWS_AT_ONCE)
    except duckdb.Error as error:
        raise StreamError(str(error), 0) from error  # some versions look far ahead for the first batch
    return _stream(reader)


def _open_path(path: str, missing_text: Sequence[str], missing_texts: Mapping[str, Sequence[str]]) -> Source:
    import duckdb

    stem = path.removesuffix(".gz").removesuffix(".zst").lower()
    function = _FILE_FUNCTIONS.get(os.path.splitext(stem)[1], "read_csv")
    # The library works on one thread, and each further one of DuckDB's would hold batches in memory for it. The limit
    # is above all one on its cache, which could grow to the size of the file.
    connection = duckdb.connect(config={"threads": 1, "memory_limit": "128MB"})
    connection.execute("SET enable_progress_bar = false")
    options = {"na_values": ["", *missing_text]} if missing_text and function == "read_csv" else {}
    try:
        # A method, as a query with parameters is run at once and kept whole by older versions.
        read = getattr(connection, function)
        relation = read(path, **options)
        typed = {name: "VARCHAR" for name in relation.columns if name in missing_texts}
        if typed and function == "read_csv":
            relation = _blank_texts(read(path, dtype=typed, **options), missing_texts)
    except duckdb.Error as error:
        if "://" not in path and not glob.glob(os.path.expanduser(path), recursive=True):
            raise FileNotFoundError(errno.ENOENT, os.strerror(errno.ENOENT), path) from None
        raise DataError(f"{path} can't be read: {error}") from error
    return _open_relation(relation, path)


def _blank_texts(relation: Any, missing_texts: Mapping[str, Sequence[str]]) -> Any:
    """Makes numbers of the columns with missing texts, which have been read as texts: DuckDB itself knows such texts only
    for all columns."""

    def select(name: str) -> str:
        column = _quote(name)
        texts = ", ".join("'" + text.replace("'", "''") + "'" for text in missing_texts.get(name, ()))
        number = f"CAST(CASE WHEN trim({column}) IN ({texts}) THEN NULL ELSE {column} END AS DOUBLE) AS {column}"
        return number if texts else column

    return relation.project(", ".join(map(select, relation.columns)))


def _open_pandas(frame: Any) -> Source:
    import pyarrow as pa

    all_names = [str(name) for name in frame.columns]

    def open_columns(names: Sequence[str] | None) -> _core.Table:
        places = range(len(all_names)) if names is None else [all_names.index(name) for name in names]
        chosen = [all_names[place] for place in places]
        return _stream(pa.Table.from_arrays([_convert(frame.iloc[:, i], all_names[i]) for i in places], names=chosen))

    return Source(open_columns, False, rows=len(frame))


def _convert(column: Any, name: str) -> Any:
    """As an Arrow array. None and NA become nulls; a NaN among plain floats stays one, and these aren't copied."""
    import pyarrow as pa

    is_plain_float = isinstance(column.dtype, np.dtype) and column.dtype.kind == "f"
    try:
        return pa.array(column, from_pandas=not is_plain_float)
    except (pa.ArrowInvalid, pa.ArrowTypeError, pa.ArrowNotImplementedError) as error:
        raise DataError(" ".join(map(str, error.args)), name) from error


def _open_pyarrow(data: Any) -> Source:
    import pyarrow as pa

    if isinstance(data, pa.RecordBatch):
        data = pa.Table.from_batches([data])
    if isinstance(data, pa.Table):
        return Source(lambda names: _stream(data if names is None else data.select(names)), False, rows=data.num_rows)
    if hasattr(data, "scanner"):  # a dataset
        return Source(lambda names: _iterate(data.scanner(columns=names).to_reader()), False)
    if hasattr(data, "to_reader"):  # a scanner
        data = data.to_reader()
    if isinstance(data, pa.RecordBatchReader):
        return _once(_iterate(data))
    raise TypeError(f"{type(data).__name__} is not a table")


def _iterate(reader: Any) -> _core.Table:
    """What Python code behind the reader raises comes through as it is; a stream would keep its text alone."""
    return _core.Table.from_iterator(reader.schema.__arrow_c_schema__(), iter(reader))
