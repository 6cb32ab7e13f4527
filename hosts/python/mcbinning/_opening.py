"""Finds out what the user's data are."""

from __future__ import annotations

import os
from typing import Any

from ._engines import engine_source
from ._files import Reading, open_paths, open_relation
from ._frames import open_pandas, open_polars, open_polars_lazy, open_pyarrow
from ._sources import Source, once, open_stream
from ._spark import SparkEngine, is_spark_frame

_PLAIN = Reading()


def open_source(data: Any, reading: Reading = _PLAIN) -> Source:
    """Any object with the Arrow stream protocol, a polars LazyFrame, a path or several."""
    if isinstance(data, Source):
        return data
    if is_path(data):
        return open_paths([os.fspath(data)], reading)
    if isinstance(data, (list, tuple)) and data and all(map(is_path, data)):
        return open_paths([os.fspath(path) for path in data], reading)
    if reading.memory_limit is not None:
        raise ValueError(f"memory_limit bounds the reading of files, and a {type(data).__name__} is none")
    if reading.threads is not None:
        raise ValueError(f"threads are those of DuckDB, where it reads files, and a {type(data).__name__} is none")
    module = type(data).__module__.partition(".")[0]
    if module in ("duckdb", "_duckdb") and hasattr(data, "project"):
        return open_relation(data)
    if is_spark_frame(data):
        return engine_source(lambda: SparkEngine(data), None)
    if module == "pandas" and hasattr(data, "columns"):
        return open_pandas(data)
    if is_lazy_frame(data):
        return open_polars_lazy(data)
    if module == "polars" and hasattr(data, "select") and hasattr(data, "__arrow_c_stream__"):
        return open_polars(data)
    if module == "pyarrow":
        return open_pyarrow(data)
    if hasattr(data, "__arrow_c_stream__"):
        return once(open_stream(data))
    raise TypeError(
        f"{type(data).__name__} is neither a path, nor a list of paths, nor an object with __arrow_c_stream__"
    )


def is_path(data: Any) -> bool:
    return isinstance(data, (str, os.PathLike))


def is_lazy_frame(data: Any) -> bool:
    return type(data).__module__.partition(".")[0] == "polars" and type(data).__name__ == "LazyFrame"


def is_table(data: Any) -> bool:
    """Whether the data are columns with names and types, of which some may be no numbers."""
    return hasattr(data, "__arrow_c_stream__") or is_lazy_frame(data)
