"""Engines: what runs queries where the data are, and gives their results as Arrow."""

from __future__ import annotations

import threading
from collections.abc import Callable, Iterator, Sequence
from typing import TYPE_CHECKING, Any

from ._errors import StreamError
from ._features import require
from ._shapes import ROWS, quote_name
from ._sources import Source, columns_of, open_batches, open_stream

if TYPE_CHECKING:
    import pyarrow as pa


class Engine:
    """A table in an engine. A subclass says how a query is run."""

    name: str
    """For the user."""
    workers = 1
    """How many queries it runs at a time with a gain."""
    is_parsed_anew = False
    """Each query reads the rows from a text."""

    def query(self, sql: str) -> pa.RecordBatchReader:
        """Runs a query on `ROWS`, in DuckDB's words. \\raise StreamError if the engine fails."""
        raise NotImplementedError

    def microseconds(self, column: str) -> str | None:
        """SQL for a column of timestamps as whole microseconds since 1970; None where the engine has no such thing."""
        return None

    def check_columns(self, names: Sequence[str]) -> None:
        """\raise DataError if the engine compares values of these columns otherwise than the library."""

    def get_progress(self) -> float | None:
        """The share of the running query that is done, from 0 to 1, where the engine tells it."""
        return None

    def for_thread(self, work: Callable[[Any], Any]) -> Callable[[Any], Any]:
        """The work, to be done in a thread to which belongs whatever the user has set for this one."""
        return work

    def cancel(self) -> None:
        """Ends the queries that run, in whatever thread."""

    def close(self) -> None:
        """Takes away what was made in the engine."""

    def __enter__(self) -> Engine:
        return self

    def __exit__(self, kind: type[BaseException] | None, *_: object) -> None:
        if kind is not None:
            self.cancel()
        self.close()


class CountedQueries:
    """An engine's queries, and how many there were."""

    def __init__(self, engine: Engine) -> None:
        self.engine = engine
        self.number = 0
        self._lock = threading.Lock()

    def stream(self, sql: str) -> pa.RecordBatchReader:
        with self._lock:
            self.number += 1
        return self.engine.query(sql)

    def table(self, sql: str) -> pa.Table:
        return self.stream(sql).read_all()

    def row(self, sql: str) -> dict[str, Any]:
        """The only row of a result. A sum over no rows is 0."""
        row: dict[str, Any] = self.table(sql).to_pylist()[0]
        return {name: 0 if value is None else value for name, value in row.items()}


def engine_source(open_engine: Callable[[], Engine], name: str | None) -> Source:
    """A table that is reduced in its engine. Where rows are asked for, as by `transform`, they come as the result of a
    query."""

    def open_columns(names: Sequence[str] | None) -> Any:
        columns = "*" if names is None else ", ".join(map(quote_name, names))
        engine = open_engine()
        reader = engine.query(f"SELECT {columns} FROM {ROWS}")
        return open_batches(reader.schema, _closing(engine, reader))

    return Source(
        open_columns,
        False,
        name=name,
        describe=lambda: columns_of(open_stream(read_schema(open_engine).empty_table())),
        open_engine=open_engine,
        is_reduced=True,
    )


def read_schema(open_engine: Callable[[], Engine]) -> pa.Schema:
    with open_engine() as engine:
        return engine.query(f"SELECT * FROM {ROWS} LIMIT 0").schema


def _closing(engine: Engine, reader: pa.RecordBatchReader) -> Iterator[pa.RecordBatch]:
    with engine:
        yield from reader


def translate(sql: str, dialect: str, table: str) -> str:
    """The query in an engine's words. `table` stands for `ROWS`, as it is."""
    sqlglot = require("sqlglot", "queries in other dialects", "sql")
    from ._sql import tell_nan

    tree = tell_nan(sqlglot.parse_one(sql, read="duckdb"), dialect)
    # No other word of a query can hold this one.
    placeholder = f"{ROWS}7f1a9c5e3b"
    for node in tree.find_all(sqlglot.exp.Table):
        if node.name == ROWS:
            node.set("this", sqlglot.exp.to_identifier(placeholder))
    return str(tree.sql(dialect=dialect)).replace(placeholder, table)


class QueryEngine(Engine):
    """An engine of the user's."""

    def __init__(self, run: Callable[[str], Any], dialect: str, table: str) -> None:
        self.name = dialect
        self._run = run
        self._dialect = dialect
        self._table = table

    def query(self, sql: str) -> pa.RecordBatchReader:
        import pyarrow as pa

        found = self._run(translate(sql, self._dialect, self._table))
        if isinstance(found, pa.RecordBatchReader):
            return found
        if not hasattr(found, "__arrow_c_stream__"):
            raise TypeError(f"run must return an object with __arrow_c_stream__, not a {type(found).__name__}")
        return pa.RecordBatchReader.from_stream(found)


def query_source(run: Callable[[str], Any], dialect: str, table: str) -> Source:
    """Opens a table of any engine that answers queries with Arrow: the engine reduces it, and its rows stay there.

    Parameters
    ----------
    run : callable
        Takes a query as a text, and returns its result as an object with the Arrow stream protocol: an Arrow table or
        reader, say, as ADBC, ibis and the clients of many warehouses give it. What it raises comes through.
    dialect : str
        Of the queries; one of sqlglot's, such as "trino", "bigquery" or "snowflake".
    table : str
        The table, as it stands behind FROM in that dialect; a query in parentheses with an alias is one, too.

    Returns
    -------
    Source
        Data for `supervised_bins`, `equal_frequency_bins` and `transform`. Each figure is that of a run over all rows,
        to the last bit, where the engine computes with IEEE doubles and compares texts byte by byte.

    Raises
    ------
    ValueError
        There is no such dialect.

    Examples
    --------
    >>> import duckdb
    >>> import mcbinning as mb
    >>> warehouse = duckdb.connect()
    >>> _ = warehouse.execute("CREATE TABLE people AS SELECT range AS income FROM range(100)")
    >>> source = mb.query_source(lambda sql: warehouse.sql(sql), dialect="duckdb", table="people")
    >>> mb.equal_frequency_bins(source, n_bins=4)["income"].cut_points.tolist()
    [24.5, 49.5, 74.5]
    """
    sqlglot = require("sqlglot", "queries in other dialects", "sql")
    sqlglot.Dialect.get_or_raise(dialect)
    return engine_source(lambda: QueryEngine(run, dialect, table), table)


def engine_failed(name: str, message: str) -> StreamError:
    return StreamError(f"{name} failed: {message}", None)
