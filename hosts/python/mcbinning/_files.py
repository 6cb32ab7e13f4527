"""Files: those that DuckDB reads, batch by batch, and Arrow's own."""

from __future__ import annotations

import contextlib
import errno
import glob
import numbers
import os
import re
from collections.abc import Callable, Iterator, Mapping, Sequence
from dataclasses import dataclass, field, replace
from typing import TYPE_CHECKING, Any, Literal

from . import _core
from ._errors import DataError, StreamError
from ._features import require
from ._shapes import quote_name, quote_text
from ._sources import Source, columns_of, open_batches, open_stream
from ._types import MemoryLimit

if TYPE_CHECKING:
    from ._engines import Engine

_FILE_FUNCTIONS = {
    ".parquet": "read_parquet",
    ".json": "read_json",
    ".jsonl": "read_json",
    ".ndjson": "read_json",
}

_IPC_SUFFIXES = (".arrow", ".arrows", ".feather", ".ipc")

_UNITS = {"": 1} | {
    prefix + unit: base**power
    for power, prefix in enumerate(["", "k", "m", "g", "t"])
    for unit, base in [("b", 1000), ("ib", 1024)]
    if prefix or unit == "b"
}

_ROWS_AT_ONCE = 2048


def open_relation(relation: Any, name: str | None = None, explain: Callable[[str], str] | None = None) -> Source:
    """A query of DuckDB's."""
    return Source(
        lambda names: _guard(lambda: _read(relation, names, explain), explain),
        False,
        name=name,
        describe=lambda: columns_of(_guard(lambda: open_stream(relation.limit(0)), explain)),
        open_engine=lambda: _reduce(relation),
    )


def _read(relation: Any, names: Sequence[str] | None, explain: Callable[[str], str] | None) -> _core.Table:
    """In small batches: DuckDB holds several, and those of wide tables are large."""
    chosen = relation if names is None else relation.project(", ".join(map(quote_name, names)))
    begin = getattr(chosen, "to_arrow_reader", None) or chosen.fetch_record_batch
    return open_stream(begin(_ROWS_AT_ONCE), explain)


def _guard(start: Callable[[], _core.Table], explain: Callable[[str], str] | None) -> _core.Table:
    """Starts a query, with its failures as those of a stream: some versions look far ahead for the first batch."""
    duckdb = require("duckdb", "files", "files")

    try:
        return start()
    except duckdb.Error as error:
        raise StreamError(explain(str(error)) if explain else str(error), 0) from error


@dataclass(frozen=True)
class Reading:
    """How files are read."""

    missing_text: Sequence[str] = ()
    """In a text file each of them stands for a missing value, as an empty field does."""
    missing_texts: Mapping[str, Sequence[str]] = field(default_factory=dict)
    """And so does each of these, by the name of the column, in a column of numbers."""
    memory_limit: MemoryLimit | None = None
    threads: int | None = None
    """Of an engine that reduces them; None: one for each core that the process may use."""
    temp_dir: str | os.PathLike[str] | None = None
    """Of such an engine."""


def open_paths(paths: Sequence[str], reading: Reading) -> Source:
    """Files of one form, which may be patterns, one behind the other."""
    limit = None if reading.memory_limit is None else parse_memory(reading.memory_limit)
    name = paths[0] if len(paths) == 1 else f"{paths[0]} and {len(paths) - 1} more"
    files = [file for path in paths for file in _find(path)]
    forms = {_ipc_form(file) for file in files} or {None}
    if forms == {None}:
        return _open_with_duckdb(paths, name, reading, limit)
    if len(forms) > 1:
        raise DataError(f"{name} can't be read: the files are of different forms")
    return _open_ipc(files, name, limit)


def parse_memory(limit: MemoryLimit) -> int:
    """The number of bytes of a limit such as "512MB"."""
    if isinstance(limit, numbers.Integral) and not isinstance(limit, bool) and limit > 0:
        return int(limit)
    found = re.fullmatch(r"\s*(\d+(?:\.\d+)?)\s*([a-z]*)\s*", limit.lower()) if isinstance(limit, str) else None
    number_of_bytes = int(float(found[1]) * _UNITS.get(found[2], 0)) if found else 0
    if number_of_bytes <= 0:
        raise ValueError(f"memory_limit must be a number of bytes or a text such as '512MB' or '2GiB', not {limit!r}")
    return number_of_bytes


def _find(path: str) -> list[str]:
    """The files of the pattern, as far as they are on this machine. \\raise FileNotFoundError if there is none."""
    if "://" in path:
        return []
    files = [path] if os.path.exists(path) else sorted(glob.glob(os.path.expanduser(path), recursive=True))
    if not files:
        raise FileNotFoundError(errno.ENOENT, os.strerror(errno.ENOENT), path)
    return files


def _open_with_duckdb(paths: Sequence[str], name: str, reading: Reading, limit: int | None) -> Source:
    duckdb = require("duckdb", "files", "files")

    suffixes = {_suffix(path) for path in paths}
    functions = {_FILE_FUNCTIONS.get(suffix, "read_csv") for suffix in suffixes}
    if len(functions) > 1:
        raise DataError(f"{name} can't be read: the files are of different forms: {', '.join(sorted(suffixes))}")
    function = functions.pop()
    explain = _explain(limit)
    is_text = function == "read_csv"
    options = {"na_values": ["", *reading.missing_text]} if reading.missing_text and is_text else {}
    files = paths[0] if len(paths) == 1 else list(paths)

    def relate(connection: Any) -> Any:
        # A method, as a query with parameters is run at once and kept whole by older versions.
        read = getattr(connection, function)
        relation = read(files, **options)
        typed = {column: "VARCHAR" for column in relation.columns if column in reading.missing_texts}
        if typed and is_text:
            relation = _blank_texts(read(files, dtype=typed, **options), reading.missing_texts)
        return relation

    try:
        source = open_relation(
            relate(_connect(limit, is_local=not any("://" in path for path in paths))), name, explain
        )
    except duckdb.Error as error:
        raise DataError(f"{name} can't be read: {explain(str(error))}") from error
    return replace(
        source, open_engine=lambda: _reduce_files(relate, function != "read_parquet", reading, limit, explain)
    )


def _reduce(relation: Any) -> Engine:
    from ._duckdb import DuckEngine

    return DuckEngine(relation)


def _reduce_files(
    relate: Callable[[Any], Any], is_parsed: bool, reading: Reading, limit: int | None, explain: Callable[[str], str]
) -> Engine:
    from ._duckdb import FileEngine

    return FileEngine(relate, is_parsed, reading.threads, limit, reading.temp_dir, explain)


def _blank_texts(relation: Any, missing_texts: Mapping[str, Sequence[str]]) -> Any:
    """Makes numbers of the columns with missing texts, which have been read as texts: DuckDB itself knows such texts
    only for all columns."""

    def select(name: str) -> str:
        column = quote_name(name)
        texts = ", ".join(map(quote_text, missing_texts.get(name, ())))
        number = f"CAST(CASE WHEN trim({column}) IN ({texts}) THEN NULL ELSE {column} END AS DOUBLE) AS {column}"
        return number if texts else column

    return relation.project(", ".join(map(select, relation.columns)))


def _suffix(path: str) -> str:
    return os.path.splitext(path.removesuffix(".gz").removesuffix(".zst").lower())[1]


def _connect(limit: int | None, is_local: bool) -> Any:
    """A connection that takes as little memory as the files allow."""
    duckdb = require("duckdb", "files", "files")

    # The library works on one thread, and each further one of DuckDB's would hold batches in memory for it.
    connection = duckdb.connect(config={"threads": 1})
    settings = {"enable_progress_bar": "false", "enable_external_file_cache": "false", "temp_directory": "''"}
    if is_local:
        # It would hold whole row groups in memory, where a page of each column is enough; from afar it saves much time.
        settings["disable_parquet_prefetching"] = "true"
    if limit is not None:
        settings["memory_limit"] = f"'{limit}B'"
    for setting, value in settings.items():
        # An older version doesn't have the setting, nor what it turns off.
        with contextlib.suppress(duckdb.CatalogException):
            connection.execute(f"SET {setting} = {value}")
    return connection


def _explain(limit: int | None) -> Callable[[str], str]:
    def explain(message: str) -> str:
        if "Out of Memory" not in message:
            return message
        first = message.splitlines()[0]
        if limit is None:
            return f"the machine's memory is too small for one batch of the file ({first})"
        return f"memory_limit is too small for one batch of the file: {limit} bytes ({first})"

    return explain


def _ipc_form(path: str) -> Literal["file", "stream"] | None:
    """Which of Arrow's two forms the file has, by its content; None if its content and its name speak for neither."""
    start = b""
    if os.path.isfile(path):
        with open(path, "rb") as file:
            start = file.read(8)
    if start == b"ARROW1\0\0":
        return "file"
    if start[:4] == b"\xff\xff\xff\xff":
        return "stream"
    if _suffix(path) in _IPC_SUFFIXES and os.path.isfile(path):
        raise DataError(f"{path} can't be read: it is no Arrow IPC file or stream")
    return None


def _open_ipc(files: Sequence[str], name: str, limit: int | None) -> Source:
    schemas = [_read_ipc_schema(file) for file in files]
    for file, schema in zip(files, schemas):
        if not schema.equals(schemas[0]):
            raise DataError(f"{name} can't be read: {file} has other columns than {files[0]}")

    def open_columns(names: Sequence[str] | None) -> _core.Table:
        fields = [i for i, column in enumerate(schemas[0].names) if names is None or column in names]
        import pyarrow as pa

        return open_batches(pa.schema([schemas[0].field(i) for i in fields]), _iterate_ipc(files, fields, limit))

    return Source(open_columns, False, name=name, describe=lambda: columns_of(open_stream(schemas[0].empty_table())))


def _read_ipc_schema(path: str) -> Any:
    import pyarrow as pa

    try:
        with _open_ipc_reader(path, None) as reader:
            return reader.schema
    except (pa.ArrowException, OSError) as error:
        raise DataError(f"{path} can't be read: {error}") from error


def _open_ipc_reader(path: str, fields: list[int] | None) -> Any:
    import pyarrow as pa

    options = pa.ipc.IpcReadOptions(use_threads=False, included_fields=fields)
    is_file = _ipc_form(path) == "file"
    return (pa.ipc.open_file if is_file else pa.ipc.open_stream)(pa.OSFile(path), options=options)


def _iterate_ipc(files: Sequence[str], fields: list[int], limit: int | None) -> Iterator[Any]:
    import pyarrow as pa

    rows = 0
    for file in files:
        try:
            with _open_ipc_reader(file, fields) as reader:
                for batch in _batches_of(reader):
                    if limit is not None and batch.nbytes > limit:
                        raise StreamError(_explain(limit)(f"Out of Memory: a batch takes {batch.nbytes} bytes"), rows)
                    yield batch
                    rows += batch.num_rows
        except (pa.ArrowException, OSError) as error:
            raise StreamError(f"{file}: {error}", rows) from error


def _batches_of(reader: Any) -> Iterator[Any]:
    if hasattr(reader, "num_record_batches"):
        return (reader.get_batch(i) for i in range(reader.num_record_batches))
    return iter(reader)
