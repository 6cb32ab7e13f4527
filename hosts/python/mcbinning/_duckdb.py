"""DuckDB as an engine: its relations, and the files that it reads."""

from __future__ import annotations

import os
import tempfile
from collections.abc import Callable, Iterator
from contextlib import contextmanager
from typing import Any

import pyarrow as pa

from ._engines import Engine, engine_failed
from ._shapes import ROWS, quote_name, quote_text

_ROWS_AT_ONCE = 1 << 17


class DuckEngine(Engine):
    """A relation of the user's."""

    name = "DuckDB"

    def __init__(self, relation: Any, explain: Callable[[str], str] = str) -> None:
        """`explain` makes a message one for the user."""
        self._relation = relation
        self._explain = explain

    def query(self, sql: str) -> pa.RecordBatchReader:
        with self._telling():
            found = self._relation.query(ROWS, sql)
            begin = getattr(found, "to_arrow_reader", None) or found.fetch_record_batch
            reader = begin(_ROWS_AT_ONCE)
            return pa.RecordBatchReader.from_batches(reader.schema, self._iterate(reader))

    def _iterate(self, reader: pa.RecordBatchReader) -> Iterator[pa.RecordBatch]:
        with self._telling():
            yield from reader

    @contextmanager
    def _telling(self) -> Iterator[None]:
        """What DuckDB raises, in the package's terms. Ctrl-C interrupts its query, and it says no more than that."""
        import duckdb

        try:
            yield
        except (duckdb.Error, pa.ArrowException, OSError, RuntimeError) as error:
            if isinstance(error, duckdb.InterruptException) or "interrupted" in str(error).lower():
                raise KeyboardInterrupt from error
            raise engine_failed(self.name, self._explain(str(error))) from error

    def microseconds(self, column: str) -> str:
        return f"EPOCH_US({quote_name(column)})"


class FileEngine(DuckEngine):
    """Files, on a connection of their own, which takes the memory that it may take and then goes on with files."""

    def __init__(
        self,
        relate: Callable[[Any], Any],
        is_parsed: bool,
        threads: int | None,
        memory_limit: int | None,
        temp_dir: str | os.PathLike[str] | None,
        explain: Callable[[str], str],
    ) -> None:
        """`relate` makes the relation of a connection."""
        import duckdb

        self._directory = tempfile.TemporaryDirectory(prefix="mcbinning-", dir=temp_dir)
        self._connection = duckdb.connect(config={"threads": threads or len(os.sched_getaffinity(0))})
        settings = {
            "enable_progress_bar": "false",
            "preserve_insertion_order": "false",  # which groups have none of, and it would take memory
            "temp_directory": quote_text(self._directory.name),
        }
        if memory_limit is not None:
            settings["memory_limit"] = f"'{memory_limit}B'"
        for setting, value in settings.items():
            self._connection.execute(f"SET {setting} = {value}")
        self.is_parsed_anew = is_parsed
        super().__init__(relate(self._connection), explain)

    def get_progress(self) -> float | None:
        percent = self._connection.query_progress()
        return percent / 100.0 if percent >= 0.0 else None

    def cancel(self) -> None:
        self._connection.interrupt()

    def close(self) -> None:
        self._connection.close()
        self._directory.cleanup()
