"""Spark as an engine."""

from __future__ import annotations

import uuid
from collections.abc import Callable, Sequence
from typing import TYPE_CHECKING, Any

from ._engines import Engine, engine_failed, translate
from ._errors import DataError
from ._features import require
from ._shapes import quote_name

if TYPE_CHECKING:
    import pyarrow as pa

_FIRST_VERSION = 4
"""That hands on Arrow tables."""


def is_spark_frame(data: Any) -> bool:
    """Of a session here, or of one on a server."""
    return type(data).__module__.startswith("pyspark.sql.") and type(data).__name__ == "DataFrame"


class SparkEngine(Engine):
    """A frame, under a name of its own for as long as the engine is open."""

    name = "Spark"
    # Each job leaves cores idle while it starts and ends.
    workers = 4

    def __init__(self, frame: Any) -> None:
        self._frame = frame
        self._session = frame.sparkSession
        if int(self._session.version.partition(".")[0]) < _FIRST_VERSION:
            raise DataError(f"Spark {self._session.version} can't hand on Arrow tables, as {_FIRST_VERSION}.0 can")
        # A session here does not find by its own tags what becomes an Arrow table, and a server knows no other ones.
        if type(frame).__module__.startswith("pyspark.sql.connect."):
            self._tagging = self._session.addTag, self._session.removeTag
            self._cancel = self._session.interruptTag
            self._tracker = None
        else:
            context = self._session.sparkContext
            self._tracker = context.statusTracker()
            self._tagging = context.addJobTag, context.removeJobTag
            self._cancel = context.cancelJobsWithTag
        # The tag of all jobs as well, by which they are ended.
        self._view = f"mcbinning_{uuid.uuid4().hex}"
        frame.createOrReplaceTempView(self._view)

    def query(self, sql: str) -> pa.RecordBatchReader:
        query = translate(sql, "spark", self._view)
        add, remove = self._tagging
        add(self._view)  # to the jobs of this thread
        try:
            return self._session.sql(query).toArrow().to_reader()
        except Exception as error:  # Spark's own ones, and those of the bridge to Java
            if _is_interrupt(error):
                raise KeyboardInterrupt from error
            raise engine_failed(self.name, _find_cause(str(error))) from error
        finally:
            remove(self._view)

    def check_columns(self, names: Sequence[str]) -> None:
        refuse_collations(self._frame, names)

    def microseconds(self, column: str) -> str:
        name = quote_name(column)
        if self._frame.schema[column].dataType.typeName() != "timestamp_ntz":
            return f"UNIX_MICROS({name})"
        # Made of its parts, as a cast would take it for a time of the session's zone.
        parts = [
            f"HOUR({name}) * 3600e6",
            f"MINUTE({name}) * 60e6",
            f"CAST(EXTRACT(SECOND FROM {name}) * 1000000 AS DOUBLE)",  # of decimals: no double has all fractions
        ]
        return f"(UNIX_DATE(CAST({name} AS DATE)) * 86400e6 + {' + '.join(parts)})"

    def for_thread(self, work: Callable[[Any], Any]) -> Callable[[Any], Any]:
        # Job group, pool and tags. Each call has a copy of its own, which tags are added to.
        adopt = require("pyspark.util", "Spark frames", "spark").inheritable_thread_target(self._session)
        return adopt(work) if callable(adopt) else work  # where all threads are one to Java there is none to adopt

    def get_progress(self) -> float | None:
        """Of the stages that run in the session, by their tasks. A server does not tell of them."""
        if self._tracker is None:
            return None
        stages = [self._tracker.getStageInfo(stage) for stage in self._tracker.getActiveStageIds()]
        tasks = sum(stage.numTasks for stage in stages if stage)
        return sum(stage.numCompletedTasks for stage in stages if stage) / tasks if tasks else None

    def cancel(self) -> None:
        self._cancel(self._view)

    def close(self) -> None:
        self._session.catalog.dropTempView(self._view)


def refuse_collations(frame: Any, names: Sequence[str]) -> None:
    """\\raise DataError if one of these columns has texts that differ and are taken for one."""
    for field in frame.schema.fields:
        collation = getattr(field.dataType, "collation", "UTF8_BINARY")
        if field.name in names and collation != "UTF8_BINARY":
            raise DataError(
                f"its collation {collation} takes different texts for one: cast it to STRING COLLATE UTF8_BINARY",
                field.name,
            )


def _is_interrupt(error: BaseException | None) -> bool:
    """At Ctrl-C Spark ends its jobs, and the failure of these hides the interrupt."""
    return error is not None and (isinstance(error, KeyboardInterrupt) or _is_interrupt(error.__context__))


def _find_cause(message: str) -> str:
    """The line of Java's page that tells what went wrong."""
    lines = message.strip().splitlines() or [""]
    causes = [line.partition("Caused by: ")[2] for line in lines if "Caused by: " in line]
    return (causes or lines)[-1 if causes else 0].strip()
